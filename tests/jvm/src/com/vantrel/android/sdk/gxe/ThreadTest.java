package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.font.FontManager;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Paths;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.HashSet;
import java.util.List;
import java.util.Set;
import java.util.concurrent.ConcurrentLinkedQueue;
import java.util.concurrent.CountDownLatch;
import jvmtest.Check;
import jvmtest.Test;

/** Many texts made, rendered and released on several threads at once. */
public class ThreadTest {
    private static final int THREADS = 4;
    private static final int TEXTS_PER_THREAD = 40;

    private static GxText strokedBlock(String font) {
        GxText text = new GxText();
        Check.isTrue(text.setFont(font), "font " + font);
        Check.isTrue(text.setPaint(Fixtures.paint(20f)), "paint");
        Check.isTrue(text.setView(Fixtures.view(40, 40)), "view");
        Check.isTrue(text.setLayout(Fixtures.line(Fixtures.BLOCK, 28, -20, 5, 2f, 12f)), "layout");
        Check.equal(0, text.addStroke(new Stroke().size(2).color(0xFF0000)), "stroke");
        return text;
    }

    @Test
    public void textsOnManyThreadsRenderAlikeAndAreAllReleased() throws Exception {
        int[] reference;
        try (GxText text = strokedBlock(Fixtures.SANS)) {
            reference = text.render().getPixels();
        }
        byte[] sans = Files.readAllBytes(Paths.get(Fixtures.SANS));

        ConcurrentLinkedQueue<Integer> handles = new ConcurrentLinkedQueue<>();
        ConcurrentLinkedQueue<Throwable> failures = new ConcurrentLinkedQueue<>();
        CountDownLatch start = new CountDownLatch(1);
        List<Thread> threads = new ArrayList<>();
        for (int t = 0; t < THREADS; t++) {
            String ownFont = "thread-font-" + t;
            threads.add(new Thread(() -> {
                try {
                    start.await();
                    // Fonts are added while other threads render.
                    Check.isTrue(FontManager.insertFontData(ownFont, sans.clone()), "insert");
                    for (int i = 0; i < TEXTS_PER_THREAD; i++) {
                        GxText text = strokedBlock(i % 2 == 0 ? ownFont : Fixtures.SANS);
                        int[] pixels = text.render().getPixels();
                        if (!Arrays.equals(reference, pixels)) {
                            throw new AssertionError("picture differs from the reference");
                        }
                        handles.add(Fixtures.handleOf(text));
                        if (i % 2 == 0) {
                            text.close();
                        }
                    }
                } catch (Throwable e) {
                    failures.add(e);
                }
            }));
        }
        threads.forEach(Thread::start);
        start.countDown();
        for (Thread thread : threads) {
            thread.join();
        }
        if (!failures.isEmpty()) {
            throw new AssertionError("a thread failed", failures.peek());
        }

        Set<Integer> distinct = new HashSet<>(handles);
        Check.equal(THREADS * TEXTS_PER_THREAD, distinct.size(), "distinct handles");

        // Every native text goes: closed ones at once, dropped ones once the collector found them.
        for (int handle : distinct) {
            Fixtures.awaitRelease(handle);
        }
    }
}
