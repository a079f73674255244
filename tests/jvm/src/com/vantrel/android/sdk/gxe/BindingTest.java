package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.text.Layout;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.List;
import java.util.function.Supplier;
import jvmtest.Check;
import jvmtest.LogTap;
import jvmtest.Test;

/** Java objects and their native texts: binding through mHandle, release, and the error code. */
public class BindingTest {
    /** A new object bound to a native text; its handle. */
    private static int bound(GxText text) {
        Check.isTrue(text.GxText_SetLine(1), "bind");
        return Fixtures.handleOf(text);
    }

    @Test
    public void firstCallMakesOneNativeTextAndStoresItsHandle() {
        GxText text = new GxText();
        Check.equal(-1, Fixtures.handleOf(text), "handle before any call");
        List<String> first = LogTap.capture(() -> Check.isTrue(text.GxText_SetLine(2), "SetLine"));
        int handle = Fixtures.handleOf(text);
        Check.isTrue(handle >= 1, "handle " + handle);
        Check.isTrue(LogTap.contains(first, 'D', "GxText_JNI", "GetBoundTextObject - hande = 0"), "made: " + first);

        List<String> second = LogTap.capture(() -> Check.isTrue(text.GxText_SetLine(3), "SetLine"));
        Check.equal(handle, Fixtures.handleOf(text), "handle after a second call");
        Check.equal(0, LogTap.count(second, "D/GxText_JNI: GetBoundTextObject"), "made again: " + second);
        text.close();
    }

    @Test
    public void finaliserAsFirstCallMakesNothing() {
        GxText before = new GxText();
        int last = bound(before);
        GxText text = new GxText();
        text.GxText_finalize();
        Check.equal(-1, Fixtures.handleOf(text), "handle after the finaliser");
        GxText after = new GxText();
        Check.equal(last + 1, bound(after), "no handle was taken");
        before.close();
        after.close();
        text.close();
    }

    @Test
    public void finaliserReleasesTheNativeText() {
        GxText text = new GxText();
        int handle = bound(text);
        List<String> log = LogTap.capture(text::GxText_finalize);
        Check.isTrue(LogTap.contains(log, 'D', "GxText_JNI", "finalize : RH " + handle), "finalize log " + log);
        Check.isTrue(LogTap.count(log, "D/GxTextObject: ~GxTextObject(") == 1, "deleted: " + log);
        Check.equal(handle, Fixtures.handleOf(text), "mHandle is left as it was");
        // Finalising again finds nothing and says nothing.
        List<String> again = LogTap.capture(text::GxText_finalize);
        Check.equal(0, LogTap.count(again, "D/GxText_JNI: finalize"), "second finalize " + again);
        Check.equal(GxError.NONE, Fixtures.errorAfter(text::GxText_finalize), "finalize sets no error");
    }

    /** Runs a native on a fresh thread: its result, and that the thread's error code became 19. */
    private static Object failsUnbound(String what, Supplier<?> call) {
        Object[] result = {null};
        int code = Fixtures.errorAfter(() -> result[0] = call.get());
        Check.equal(GxError.NOT_BOUND, code, what + " error code");
        return result[0];
    }

    @Test
    public void everyNativeOfAReleasedTextFailsWithNotBound() {
        GxText text = new GxText();
        bound(text);
        text.GxText_finalize();
        Layout layout = Fixtures.line(Fixtures.BLOCK, 30, -20, 5, 0f, 20f);
        float[] one = {1f};
        Check.equal(false, failsUnbound("SetPaint", () -> text.GxText_SetPaint(Fixtures.paint(20f))), "SetPaint");
        Check.equal(false, failsUnbound("SetView", () -> text.GxText_SetView(Fixtures.view(10, 10))), "SetView");
        Check.equal(false, failsUnbound("SetLine", () -> text.GxText_SetLine(1)), "SetLine");
        Check.equal(false, failsUnbound("SetLayout", () -> text.GxText_SetLayout(layout)), "SetLayout");
        Check.equal(false, failsUnbound("SetFont", () -> text.GxText_SetFont(Fixtures.SANS)), "SetFont");
        Check.equal(false, failsUnbound("SetFont2", () -> text.GxText_SetFont2("x", new byte[4])), "SetFont2");
        Check.equal(false, failsUnbound("SetFont3",
                () -> text.GxText_SetFont3(new AssetManager("/"), "x")), "SetFont3");
        Check.equal(-1, failsUnbound("AddOuterShadow",
                () -> text.GxText_AddOuterShadowTextEffect(0f, 1f, 1f, 0, 1f)), "AddOuterShadow");
        Check.equal(-1, failsUnbound("AddInnerShadow",
                () -> text.GxText_AddInnerShadowTextEffect(0f, 1f, 1f, 0, 1f)), "AddInnerShadow");
        Check.equal(-1, failsUnbound("AddOuterGlow", () -> text.GxText_AddOuterGlowTextEffect(1f, 0, 1f)),
                "AddOuterGlow");
        Check.equal(-1, failsUnbound("AddStroke", () -> text.GxText_AddStrokeTextEffect(1f, 0, 1f, 0, 1)),
                "AddStroke");
        Check.equal(-1, failsUnbound("AddLinearGradient",
                () -> text.GxText_AddLinearGradientTextEffect(0f, 1f, new int[1], one, one, 1f)),
                "AddLinearGradient");
        failsUnbound("ClearAll", () -> {
            text.GxText_ClearAllTextEffect();
            return null;
        });
        Check.equal(0, failsUnbound("LeftOffset", text::GxText_GetEffectLeftOffset), "LeftOffset");
        Check.equal(0, failsUnbound("TopOffset", text::GxText_GetEffectTopOffset), "TopOffset");
        Check.equal(0, failsUnbound("RightOffset", text::GxText_GetEffectRightOffset), "RightOffset");
        Check.equal(0, failsUnbound("BottomOffset", text::GxText_GetEffectBottomOffset), "BottomOffset");
        Check.isNull(failsUnbound("BitmapSize", text::GxText_GetDrawingBitmapSize), "BitmapSize");
        Check.isNull(failsUnbound("Render", text::GxText_RenderTextEffect), "Render");

        List<String> log = LogTap.capture(() -> text.GxText_SetLine(1));
        Check.equal(1, LogTap.count(log, "E/GxText_JNI: @ Native Error 19 : "), "error line " + log);
        text.close();
    }

    @Test
    public void errorCodeOutlivesTheFinaliserAndStaysOnItsThread() {
        GxText stale = new GxText();
        bound(stale);
        stale.GxText_finalize();
        GxText other = new GxText();
        bound(other);
        int code = Fixtures.errorAfter(() -> {
            Check.equal(0, stale.GxText_GetEffectTopOffset(), "offset");
            other.GxText_finalize();
        });
        Check.equal(GxError.NOT_BOUND, code, "code after the finaliser ran");
        Check.equal(GxError.NONE, Fixtures.errorAfter(() -> {}), "another thread's code");
        stale.close();
        other.close();
    }

    /** A text bound, rendered with a stroke and closed; its handle. */
    private static int closedText() {
        GxText text = new GxText();
        text.addStroke(new Stroke());
        int handle = Fixtures.handleOf(text);
        text.close();
        Check.isTrue(text.isClosed(), "closed");
        text.close();
        Check.equal(handle, Fixtures.handleOf(text), "handle");
        Check.raises(IllegalStateException.class, () -> text.setLineLimit(1), "closed text");
        Check.raises(IllegalStateException.class, text::render, "closed text");
        return handle;
    }

    /** A text bound and dropped without closing; its handle. */
    private static int droppedText() {
        GxText text = new GxText();
        text.addStroke(new Stroke());
        return Fixtures.handleOf(text);
    }

    @Test
    public void closeReleasesOnceAndAnUnclosedTextIsReleasedWhenUnreachable() {
        int[] handles = new int[2];
        List<String> log = LogTap.capture(() -> {
            handles[0] = closedText();
            handles[1] = droppedText();
            Fixtures.awaitRelease(handles[1]);
            Fixtures.awaitRelease(handles[0]);
        });
        Check.equal(1, LogTap.count(log, "D/GxText_JNI: finalize : RH " + handles[0]), "closed: " + log);
        Check.equal(1, LogTap.count(log, "D/GxText_JNI: finalize : RH " + handles[1]), "dropped: " + log);
    }
}
