package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.util.GxError;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/** Loading the library: registration of the three classes. Runs first, before anything loads the library. */
public class LoadTest {
    /** The log of the process's one load. */
    private static final List<String> LOAD_LOG = LogTap.capture(NativeLibrary::load);

    @Test
    public void loadRegistersErrorFontAndTextClassesInOrder() {
        List<String> bridge = new ArrayList<>();
        for (String line : LOAD_LOG) {
            if (line.matches("^./(GxText_Common_JNI|GxError_JNI|Init_GxFontManager_JNI|GxText_JNI): .*")) {
                bridge.add(line);
            }
        }
        Check.equal(Arrays.asList(
                "D/GxText_Common_JNI: GxText_JNI_OnLoad",
                "D/GxError_JNI: Init .. Done",
                "D/Init_GxFontManager_JNI: Init_GxFontManager_JNI",
                "D/GxText_JNI: JNI_OnLoad .. Done",
                "D/GxText_Common_JNI: GxText_JNI_OnLoad .... done"), bridge, "load log");
    }

    @Test
    public void errorNativeReadsTheCallingThreadsSlot() {
        Check.equal(GxError.NONE, Fixtures.errorAfter(() -> {}), "fresh thread");
        List<String> log = LogTap.capture(GxError::getLastError);
        Check.isTrue(LogTap.contains(log, 'D', "GxError_JNI", "Error_GetError"), "Error_GetError logs " + log);
    }
}
