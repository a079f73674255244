package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.lang.reflect.Field;
import java.util.List;
import java.util.concurrent.CompletableFuture;
import java.util.function.Supplier;
import jvmtest.*;

/** Shared set-up for the bridge tests: texts, one-line layouts, handles, ink boxes, calls on fresh threads. */
final class Fixtures {
    static final String SANS = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
    /** U+2588 FULL BLOCK: one solid rectangle of ink, so covered pixels are known without the font's outlines. */
    static final String BLOCK = "\u2588";

    private Fixtures() {}

    /** One line of all of `text`: baseline, ascent (negative) and descent, an em of width a character. */
    static Layout line(CharSequence text, int baseline, int ascent, int descent) {
        return new Layout(text, new float[] {0, text.length(), baseline, ascent, descent, 0f, -ascent * text.length()});
    }

    /** `text` in `font` (null: none) at `size` pixels in a `width` x `height` view, the baseline at 4/5. */
    static GxText text(String font, String text, int width, int height, float size) {
        GxText t = new GxText();
        Check.isTrue((font == null || t.GxText_SetFont(font)) && t.GxText_SetPaint(new Paint(size))
                && t.GxText_SetView(new TextView(width, height))
                && t.GxText_SetLayout(line(text, height * 4 / 5, -(int) size, (int) size / 4)), "set-up");
        return t;
    }

    /** Where a 20-pixel BLOCK in DejaVu Sans puts ink, with its baseline at 40 in a 60 x 50 view. */
    static int[] blockInk() {
        try (GxText text = text(SANS, BLOCK, 60, 50, 20f)) {
            return inkBox(text.render());
        }
    }

    /** {left, top, right, bottom} (right and bottom exclusive) of the view's pixels with any alpha, or null. */
    static int[] inkBox(GxText.Picture p) {
        int[] pixels = viewPixels(p);
        int width = p.getWidth() - p.getLeft() - p.getRight(), left = width, top = -1, right = 0, bottom = 0;
        for (int i = 0; i < pixels.length; i++) {
            if ((pixels[i] >>> 24) != 0) {
                left = Math.min(left, i % width);
                top = top < 0 ? i / width : top;
                right = Math.max(right, i % width + 1);
                bottom = i / width + 1;
            }
        }
        return top < 0 ? null : new int[] {left, top, right, bottom};
    }

    /** The pixels of the view's own area of a picture (the effect margins cut off), row by row. */
    static int[] viewPixels(GxText.Picture p) {
        int width = p.getWidth() - p.getLeft() - p.getRight();
        int[] pixels = new int[width * (p.getHeight() - p.getTop() - p.getBottom())];
        for (int i = 0; i < pixels.length; i++) {
            pixels[i] = p.getPixel(i % width + p.getLeft(), i / width + p.getTop());
        }
        return pixels;
    }

    /** The field the natives keep a text's handle in. */
    static Field handle() throws NoSuchFieldException {
        Field handle = GxText.class.getDeclaredField("mHandle");
        handle.setAccessible(true);
        return handle;
    }

    /** Collects garbage until no native text has this handle any more; fails after a few seconds. */
    static void awaitRelease(int handle) throws Exception {
        GxText probe = new GxText();
        handle().setInt(probe, handle);
        for (int round = 0; round < 400 && errorAfter(() -> probe.GxText_SetLine(1)) != GxError.NOT_BOUND; round++) {
            System.gc();
            Thread.sleep(10);
        }
        Check.equal(GxError.NOT_BOUND, errorAfter(() -> probe.GxText_SetLine(1)), "native text " + handle + " gone");
    }

    /**
     * Runs the call on a fresh thread: it must return `expected` with a reason saying `words`, no error code,
     * and the log line `line` (null: no error line at all).
     */
    static void refused(String what, Object expected, String words, String line, Supplier<Object> call) {
        Object[] out = new Object[2];
        int[] code = {-1};
        List<String> log = LogTap.capture(() -> code[0] = errorAfter(() -> {
            out[0] = call.get();
            out[1] = GxError.getLastReason();
        }));
        Check.equal(expected, out[0], what);
        Check.isTrue(out[1] != null && ((String) out[1]).contains(words), what + ": reason " + out[1]);
        Check.equal(GxError.NONE, code[0], what + ": error code");
        Check.isTrue(line == null ? LogTap.count(log, "E/") == 0 : log.contains(line), what + ": log " + log);
    }

    /** The error code a fresh thread has after running the action. */
    static int errorAfter(Runnable action) {
        return CompletableFuture.supplyAsync(() -> {
            action.run();
            return GxError.getLastError();
        }, task -> new Thread(task).start()).join();
    }
}
