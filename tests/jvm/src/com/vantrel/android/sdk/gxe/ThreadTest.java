package com.vantrel.android.sdk.gxe;

import android.graphics.Paint;
import android.text.FontConfig;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.font.FontManager;
import java.nio.file.*;
import java.util.*;
import java.util.concurrent.*;
import jvmtest.Check;

/**
 * Many texts made, rendered and released on eight threads at once, with a long font configuration whose
 * families mostly load when a text first needs their script, while other threads render. A process of its
 * own: the configuration is taken once per process.
 */
public class ThreadTest {
    private static final String[] LOCALES = {
        "und-Arab", "und-Grek", "und-Cyrl", "und-Hebr", "und-Thai", "und-Deva", "ja", "ko", "zh-Hans", "zh-Hant"};
    /** Texts whose scripts need the families of the locales above. */
    private static final String[] SCRIPTS = {
        "\u0633\u0644\u0627\u0645", "\u03B1\u03B2\u03B3", "\u0434\u043E\u043C", "\u05E9\u05DC\u05D5\u05DD",
        "\u0E2A\u0E27\u0E31", "\u0928\u092E\u0938", "\u304B\u306A", "\uD55C\uAE00", "\u6F22\u5B57"};

    private static FontConfig.Font font(String name, int weight) {
        return new FontConfig.Font("/usr/share/fonts/truetype/dejavu/DejaVu" + name + ".ttf", weight, false, null);
    }

    private static GxText strokedBlock(String font) {
        GxText text = new GxText();
        Check.isTrue(text.setFont(font) && text.setPaint(new Paint(20f)) && text.setView(new TextView(40, 40))
                && text.setLayout(Fixtures.line(Fixtures.BLOCK, 28, -20, 5))
                && text.addStroke(new Stroke().size(2).color(0xFF0000)) == 0, "set-up with " + font);
        return text;
    }

    public void textsOnManyThreadsRenderAlikeAndAreAllReleased() throws Exception {
        // A default family, a later named family (dropped before its fonts are read) and three families of
        // three fonts for each locale.
        List<FontConfig.Family> families = new ArrayList<>(Arrays.asList(new FontConfig.Family("sans-serif", null,
                font("Sans", 400), font("Sans-Bold", 700)), new FontConfig.Family("serif", null) {
                    @Override
                    public FontConfig.Font[] getFonts() {
                        throw new IllegalStateException("the fonts of a later named family are read");
                    }
                }));
        for (String locale : LOCALES) {
            for (String name : new String[] {"Sans", "Serif", "SansMono"}) {
                families.add(new FontConfig.Family(null, locale, font(name, 400), font(name + "-Bold", 700),
                        font(name.equals("Serif") ? "SerifCondensed" : "SansCondensed", 300)));
            }
        }
        Check.isTrue(FontManager.setFontConfig(new FontConfig(families.toArray(new FontConfig.Family[0]))),
                "the configuration");
        Check.isTrue(FontManager.setFontConfig(null), "once set, a configuration is not even looked at");
        int[] reference = strokedBlock(Fixtures.SANS).render().getPixels();
        byte[] sans = Files.readAllBytes(Paths.get(Fixtures.SANS));
        Set<Integer> handles = ConcurrentHashMap.newKeySet();
        List<Callable<Object>> threads = new ArrayList<>();
        for (int t = 0; t < 8; t++) {
            int seed = t;
            threads.add(() -> {
                // Fonts are added while other threads render.
                Check.isTrue(FontManager.insertFontData("thread-font-" + seed, sans.clone()), "insert");
                for (int i = 0; i < 30; i++) {
                    GxText text = strokedBlock(i % 2 == 0 ? "thread-font-" + seed : Fixtures.SANS);
                    Check.isTrue(Arrays.equals(reference, text.render().getPixels()), "picture differs");
                    // A script the text's font lacks: its families load on first need.
                    String script = SCRIPTS[(i + seed) % SCRIPTS.length];
                    Check.isTrue(text.setLayout(Fixtures.line(script, 28, -20, 5)) && text.render() != null,
                            "a picture of " + script);
                    handles.add(Fixtures.handle().getInt(text));
                    if (i % 2 == 0) {
                        text.close(); // the others are dropped
                    }
                }
                return null;
            });
        }
        ExecutorService pool = Executors.newFixedThreadPool(8);
        for (Future<Object> thread : pool.invokeAll(threads)) {
            thread.get(); // throws what the thread threw
        }
        pool.shutdown();
        Check.equal(8 * 30, handles.size(), "distinct handles");
        for (int handle : handles) {
            Fixtures.awaitRelease(handle);
        }
    }
}
