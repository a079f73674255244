package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;
import java.util.Arrays;
import java.util.List;
import java.util.function.Supplier;
import java.util.stream.Collectors;
import jvmtest.Check;
import jvmtest.LogTap;

/** Loading, and Java objects bound to native texts: handles, release, the error code. Runs first. */
public class BindingTest {
    /** The log of the process's one load. */
    private static final List<String> LOAD_LOG = LogTap.capture(NativeLibrary::load);

    public void loadRegistersErrorFontAndTextClassesInOrder() {
        Check.equal(Arrays.asList("D/GxText_Common_JNI: GxText_JNI_OnLoad", "D/GxError_JNI: Init .. Done",
                "D/Init_GxFontManager_JNI: Init_GxFontManager_JNI", "D/GxText_JNI: JNI_OnLoad .. Done",
                "D/GxText_Common_JNI: GxText_JNI_OnLoad .... done"), LOAD_LOG.stream().filter(line -> line.matches(
                "^./(GxText_Common_JNI|GxError_JNI|Init_GxFontManager_JNI|GxText_JNI): .*")).collect(Collectors.toList()),
                "load log");
    }

    public void theFirstCallBindsATextAndTheFinaliserReleasesIt() throws Exception {
        GxText text = new GxText();
        List<String> first = LogTap.capture(() -> text.GxText_SetLine(2));
        int handle = Fixtures.handleOf(text);
        List<String> second = LogTap.capture(() -> text.GxText_SetLine(3));
        Check.isTrue(handle >= 1 && first.contains("D/GxText_JNI: GetBoundTextObject - hande = 0")
                && Fixtures.handleOf(text) == handle && LogTap.count(second, "D/GxText_JNI: GetBound") == 0, "bound once to " + handle + ": " + first + second);
        List<String> log = LogTap.capture(text::GxText_finalize);
        Check.isTrue(log.contains("D/GxText_JNI: finalize : RH " + handle) && Fixtures.handleOf(text) == handle
                && LogTap.count(log, "D/GxTextObject: ~GxTextObject(") == 1, "released, mHandle kept: " + log);
        Check.equal(0L, LogTap.count(LogTap.capture(text::GxText_finalize), "D/GxText_JNI: finalize"), "finalised again");
        Check.equal(GxError.NONE, Fixtures.errorAfter(text::GxText_finalize), "a second finaliser's error code");
        // Neither a finaliser nor clearing as the first call makes a native text.
        GxText unbound = new GxText();
        unbound.GxText_finalize();
        Check.equal(GxError.NONE, Fixtures.errorAfter(unbound::GxText_ClearAllTextEffect), "clearing a new text");
        Check.equal(-1, Fixtures.handleOf(unbound), "handle after a finaliser and clearing as first calls");
        Check.isTrue(unbound.GxText_SetLine(1) && Fixtures.handleOf(unbound) == handle + 1, "handles run on by one");
        unbound.close();
    }

    /** Runs the native on a fresh thread: it must return `expected` and leave the thread's code at 19. */
    private static void unbound(String what, Object expected, Supplier<Object> call) {
        Object[] result = {"nothing"};
        Check.equal(GxError.NOT_BOUND, Fixtures.errorAfter(() -> result[0] = call.get()), what + ": error code");
        Check.equal(expected, result[0], what + " of a released text");
    }

    public void everyNativeOfAReleasedTextFailsWithNotBound() {
        GxText text = new GxText();
        text.GxText_SetLine(1);
        text.GxText_finalize();
        unbound("SetView", false, () -> text.GxText_SetView(Fixtures.view(10, 10)));
        unbound("SetFont3", false, () -> text.GxText_SetFont3(new AssetManager("/"), "x"));
        unbound("AddStroke", -1, () -> text.GxText_AddStrokeTextEffect(1f, 0, 1f, 0, 1));
        unbound("AddBevel", -1, () -> text.GxText_AddBevelTextEffect(1, 3f, 5f, 1, 0, 0, 1f, 120f, 30f, 0, 1f, 0, 1f));
        unbound("LeftOffset", 0, text::GxText_GetEffectLeftOffset);
        unbound("Render", null, text::GxText_RenderTextEffect);
        unbound("ClearAll", null, () -> {
            text.GxText_ClearAllTextEffect();
            return null;
        });
        String[] reason = {null};
        Fixtures.errorAfter(() -> reason[0] = text.GxText_SetTextOpacity(1f) ? "set" : GxError.getLastReason());
        Check.isTrue(reason[0] != null && reason[0].contains("error 19"), "the reason of a released text: " + reason[0]);
        List<String> log = LogTap.capture(() -> Fixtures.errorAfter(() -> text.GxText_SetLine(1)));
        Check.equal(1L, LogTap.count(log, "E/GxText_JNI: @ Native Error 19 : "), "error line " + log);
        // The code outlives a finaliser that runs after it, and stays on its own thread.
        GxText other = new GxText();
        other.GxText_SetLine(1);
        Check.equal(GxError.NOT_BOUND, Fixtures.errorAfter(() -> {
            text.GxText_GetEffectTopOffset();
            other.GxText_finalize();
        }), "code after a finaliser ran");
        Check.equal(GxError.NONE, Fixtures.errorAfter(() -> {}), "another thread's code");
    }

    public void closeReleasesOnceAndAnUnclosedTextIsReleasedWhenUnreachable() throws Exception {
        GxText closed = new GxText();
        closed.addStroke(new Stroke());
        int handle = Fixtures.handleOf(closed);
        List<String> log = LogTap.capture(() -> {
            closed.close();
            closed.close();
        });
        Check.equal(1L, LogTap.count(log, "D/GxText_JNI: finalize : RH " + handle), "closed twice: " + log);
        Check.raises(IllegalStateException.class, closed::render, "render after close");
        GxText dropped = new GxText();
        dropped.addStroke(new Stroke());
        handle = Fixtures.handleOf(dropped);
        dropped = null;
        Fixtures.awaitRelease(handle);
    }
}
