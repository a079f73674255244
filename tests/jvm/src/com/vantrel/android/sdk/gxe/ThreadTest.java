package com.vantrel.android.sdk.gxe;

import android.text.FontConfig;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.font.FontManager;
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

/**
 * Many texts made, rendered and released on several threads at once, with a long font configuration whose
 * families mostly load when a text first needs their script, while other threads render. A process of its
 * own: the configuration is taken once per process.
 */
public class ThreadTest {
    private static final int THREADS = 8;
    private static final int TEXTS_PER_THREAD = 30;
    private static final String[] LOCALES = {
        "und-Arab", "und-Grek", "und-Cyrl", "und-Hebr", "und-Thai", "und-Deva", "ja", "ko", "zh-Hans", "zh-Hant"};
    /** Texts whose scripts need the families of the locales above. */
    private static final String[] SCRIPTS = {
        "\u0633\u0644\u0627\u0645", "\u03B1\u03B2\u03B3", "\u0434\u043E\u043C", "\u05E9\u05DC\u05D5\u05DD",
        "\u0E2A\u0E27\u0E31", "\u0928\u092E\u0938", "\u304B\u306A", "\uD55C\uAE00", "\u6F22\u5B57"};

    /** A default family and three families of three fonts for each locale: 31 in all. */
    private static FontConfig longConfiguration() {
        String[][] sets = {
            {"DejaVuSans.ttf", "DejaVuSans-Bold.ttf", "DejaVuSans-ExtraLight.ttf"},
            {"DejaVuSerif.ttf", "DejaVuSerif-Bold.ttf", "DejaVuSerifCondensed.ttf"},
            {"DejaVuSansMono.ttf", "DejaVuSansMono-Bold.ttf", "DejaVuSansCondensed.ttf"}};
        List<FontConfig.Family> families = new ArrayList<>();
        families.add(new FontConfig.Family("sans-serif", null, font("DejaVuSans.ttf", 400),
                font("DejaVuSans-Bold.ttf", 700), font("DejaVuSerif.ttf", 500)));
        for (String locale : LOCALES) {
            for (String[] set : sets) {
                families.add(new FontConfig.Family(null, locale, font(set[0], 400), font(set[1], 700),
                        font(set[2], 300)));
            }
        }
        return new FontConfig(families.toArray(new FontConfig.Family[0]));
    }

    private static FontConfig.Font font(String file, int weight) {
        return new FontConfig.Font("/usr/share/fonts/truetype/dejavu/" + file, weight, false, null);
    }

    private static GxText strokedBlock(String font) {
        GxText text = new GxText();
        Check.isTrue(text.setFont(font) && text.setPaint(Fixtures.paint(20f)) && text.setView(Fixtures.view(40, 40))
                && text.setLayout(Fixtures.line(Fixtures.BLOCK, 28, -20, 5, 2f)), "set-up with " + font);
        Check.equal(0, text.addStroke(new Stroke().size(2).color(0xFF0000)), "stroke");
        return text;
    }

    @Test
    public void textsOnManyThreadsRenderAlikeAndAreAllReleased() throws Exception {
        Check.isTrue(FontManager.setFontConfig(longConfiguration()), "configuration");
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
            int seed = t;
            threads.add(new Thread(() -> {
                try {
                    start.await();
                    // Fonts are added while other threads render.
                    Check.isTrue(FontManager.insertFontData(ownFont, sans.clone()), "insert");
                    for (int i = 0; i < TEXTS_PER_THREAD; i++) {
                        GxText text = strokedBlock(i % 2 == 0 ? ownFont : Fixtures.SANS);
                        Check.isTrue(Arrays.equals(reference, text.render().getPixels()), "picture differs");
                        // A script the text's font lacks: its families load on first need.
                        String script = SCRIPTS[(i + seed) % SCRIPTS.length];
                        Check.isTrue(text.setLayout(Fixtures.line(script, 28, -20, 5, 2f))
                                && text.render() != null, "a picture of " + script);
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
