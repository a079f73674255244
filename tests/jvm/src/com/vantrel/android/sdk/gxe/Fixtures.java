package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.text.Layout;
import android.widget.TextView;
import java.lang.reflect.Field;

/** Shared set-up for the bridge tests: fonts, views, one-line layouts, handles and ink boxes. */
final class Fixtures {
    static final String SANS = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
    static final String SERIF = "/usr/share/fonts/truetype/dejavu/DejaVuSerif.ttf";
    /** U+2588 FULL BLOCK: one solid rectangle of ink, so covered pixels are known without the font's outlines. */
    static final String BLOCK = "\u2588";

    private Fixtures() {}

    static TextView view(int width, int height) {
        TextView view = new TextView();
        view.setSize(width, height);
        view.setMaxLines(10);
        return view;
    }

    static Paint paint(float size) {
        Paint paint = new Paint();
        paint.setTextSize(size);
        return paint;
    }

    /** One line holding all of `text`, its baseline at `baseline`, left edge at `left`. */
    static Layout line(CharSequence text, int baseline, int ascent, int descent, float left, float width) {
        return new Layout(text, 1000, new Layout.Line(0, text.length(), text.length(), baseline + ascent,
                baseline, baseline + descent, ascent, descent, left, width));
    }

    /** A text in DejaVu Sans with paint, view and one line of `text` set. */
    static GxText text(String text, TextView view, float size, int baseline) {
        GxText t = new GxText();
        jvmtest.Check.isTrue(t.GxText_SetFont(SANS), "SetFont");
        jvmtest.Check.isTrue(t.GxText_SetPaint(paint(size)), "SetPaint");
        jvmtest.Check.isTrue(t.GxText_SetView(view), "SetView");
        jvmtest.Check.isTrue(t.GxText_SetLayout(line(text, baseline, -(int) size, (int) (size / 4), 0f,
                size * text.length())), "SetLayout");
        return t;
    }

    static int handleOf(GxText text) {
        try {
            return handleField().getInt(text);
        } catch (IllegalAccessException e) {
            throw new AssertionError(e);
        }
    }

    static void setHandle(GxText text, int handle) {
        try {
            handleField().setInt(text, handle);
        } catch (IllegalAccessException e) {
            throw new AssertionError(e);
        }
    }

    private static Field handleField() {
        try {
            Field f = GxText.class.getDeclaredField("mHandle");
            f.setAccessible(true);
            return f;
        } catch (NoSuchFieldException e) {
            throw new AssertionError(e);
        }
    }

    /** {left, top, right, bottom} (right and bottom exclusive) of the pixels with any alpha, or null. */
    static int[] inkBox(int[] pixels, int width, int height) {
        int left = width, top = height, right = 0, bottom = 0;
        for (int y = 0; y < height; y++) {
            for (int x = 0; x < width; x++) {
                if ((pixels[y * width + x] >>> 24) != 0) {
                    left = Math.min(left, x);
                    top = Math.min(top, y);
                    right = Math.max(right, x + 1);
                    bottom = Math.max(bottom, y + 1);
                }
            }
        }
        return right == 0 ? null : new int[] {left, top, right, bottom};
    }

    static int[] inkBox(GxText.Picture p) {
        return inkBox(p.getPixels(), p.getWidth(), p.getHeight());
    }

    /** The pixels of the view's own area of a picture (the effect margins cut off), row by row. */
    static int[] viewPixels(GxText.Picture p, int viewWidth, int viewHeight) {
        int[] pixels = new int[viewWidth * viewHeight];
        for (int y = 0; y < viewHeight; y++) {
            for (int x = 0; x < viewWidth; x++) {
                pixels[y * viewWidth + x] = p.getPixel(x + p.getLeft(), y + p.getTop());
            }
        }
        return pixels;
    }

    /**
     * Where a 20-pixel BLOCK drawn with its pen at (0, 0) puts ink: {left, top, right, bottom}, measured once
     * from a plain render with the baseline at 30. Placement tests compare against it, so they check where
     * lines go, not how the rasteriser covers a glyph.
     */
    static synchronized int[] blockInk() {
        if (blockInk == null) {
            try (GxText t = text(BLOCK, view(60, 50), 20f, 30)) {
                int[] box = inkBox(t.render());
                jvmtest.Check.notNull(box, "calibration ink");
                blockInk = new int[] {box[0], box[1] - 30, box[2], box[3] - 30};
            }
        }
        return blockInk.clone();
    }

    private static int[] blockInk;

    /** The ink box expected for a 20-pixel BLOCK with its pen at (x, baseline). */
    static int[] blockAt(int x, int baseline) {
        int[] ink = blockInk();
        return new int[] {ink[0] + x, ink[1] + baseline, ink[2] + x, ink[3] + baseline};
    }

    /** Whether any pixel of rows top..bottom-1 has alpha. */
    static boolean inkInRows(GxText.Picture p, int top, int bottom) {
        for (int y = Math.max(0, top); y < Math.min(p.getHeight(), bottom); y++) {
            for (int x = 0; x < p.getWidth(); x++) {
                if ((p.getPixel(x, y) >>> 24) != 0) {
                    return true;
                }
            }
        }
        return false;
    }

    /** Whether no native text has this handle (any more). */
    static boolean isReleased(int handle) {
        GxText probe = new GxText();
        setHandle(probe, handle);
        try {
            return errorAfter(() -> probe.GxText_SetLine(1)) == com.vantrel.android.sdk.gxe.util.GxError.NOT_BOUND;
        } finally {
            setHandle(probe, -1);
            probe.close();
        }
    }

    /** Collects garbage until the native text of `handle` is released; fails after a few seconds. */
    static void awaitRelease(int handle) {
        for (int round = 0; round < 400; round++) {
            if (isReleased(handle)) {
                return;
            }
            System.gc();
            try {
                Thread.sleep(10);
            } catch (InterruptedException e) {
                throw new AssertionError(e);
            }
        }
        throw new AssertionError("native text " + handle + " was never released");
    }

    /** What a call left on a fresh thread: its result, and the thread's reason and error code after it. */
    static final class Outcome {
        Object result;
        String reason;
        int code;

        /** Checks that the call failed with `expected` as its result, a reason saying `words` and `code`. */
        void failed(Object expected, String words, int expectedCode, String what) {
            jvmtest.Check.equal(expected, result, what + " result");
            jvmtest.Check.isTrue(reason != null && reason.contains(words),
                    what + ": reason \"" + reason + "\" does not say \"" + words + "\"");
            jvmtest.Check.equal(expectedCode, code, what + " error code");
        }
    }

    static Outcome onFreshThread(java.util.function.Supplier<Object> call) {
        Outcome outcome = new Outcome();
        outcome.code = errorAfter(() -> {
            outcome.result = call.get();
            outcome.reason = com.vantrel.android.sdk.gxe.util.GxError.getLastReason();
        });
        return outcome;
    }

    /** Runs the action on a new thread and returns that thread's error code afterwards. */
    static int errorAfter(Runnable action) {
        int[] code = {-1};
        Throwable[] thrown = {null};
        Thread thread = new Thread(() -> {
            try {
                action.run();
                code[0] = com.vantrel.android.sdk.gxe.util.GxError.getLastError();
            } catch (Throwable t) {
                thrown[0] = t;
            }
        });
        thread.start();
        try {
            thread.join();
        } catch (InterruptedException e) {
            throw new AssertionError(e);
        }
        if (thrown[0] instanceof RuntimeException) {
            throw (RuntimeException) thrown[0];
        }
        if (thrown[0] != null) {
            throw new AssertionError(thrown[0]);
        }
        return code[0];
    }
}
