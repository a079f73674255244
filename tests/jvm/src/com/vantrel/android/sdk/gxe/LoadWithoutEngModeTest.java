package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.util.GxError;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;
import java.util.List;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/**
 * Loading with an error class that lacks isBuildTypeEngMode (run with such a class first on the class
 * path): the error class's step fails, its NoSuchMethodError is swallowed and the other classes are
 * registered.
 */
public class LoadWithoutEngModeTest {
    private static final List<String> LOAD_LOG = LogTap.capture(NativeLibrary::load);

    @Test
    public void loadingGoesOnWithoutTheErrorNative() {
        Check.isTrue(LogTap.contains(LOAD_LOG, 'E', "GxText_Common_JNI", "GxError Onload Fail!"), "log " + LOAD_LOG);
        Check.isTrue(LogTap.contains(LOAD_LOG, 'D', "Init_GxFontManager_JNI", "Init_GxFontManager_JNI"), "font manager");
        Check.isTrue(LogTap.contains(LOAD_LOG, 'D', "GxText_JNI", "JNI_OnLoad .. Done"), "text");
        Check.isTrue(LogTap.contains(LOAD_LOG, 'D', "GxText_Common_JNI", "GxText_JNI_OnLoad .... done"), "done");
        Check.raises(UnsatisfiedLinkError.class, GxError::getLastError, "the error native is not registered");
        try (GxText text = new GxText()) {
            Check.isTrue(text.GxText_SetLine(1), "text natives are registered");
        }
    }
}
