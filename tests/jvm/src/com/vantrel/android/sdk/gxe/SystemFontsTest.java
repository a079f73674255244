package com.vantrel.android.sdk.gxe;

import android.text.FontConfig;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.font.SystemFonts;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.util.Arrays;
import jvmtest.Check;
import jvmtest.Test;

/**
 * The system's font families handed over from Linux, in a process of its own (the library takes one set of
 * system families per process).
 */
public class SystemFontsTest {
    private static final String CJK = "\u6F22\u5B57\u304B\u306A\uD55C\uAE00";
    private static final String DEVANAGARI = "\u0928\u092E\u0938\u094D\u0924\u0947";

    /** The text drawn at 32 px in a 300 x 60 view, with `font` as its own (null: none). */
    private static int[] render(String s, String font) {
        try (GxText text = new GxText()) {
            if (font != null) {
                Check.isTrue(text.setFont(font), "font");
            }
            TextView view = Fixtures.view(300, 60);
            text.setPaint(Fixtures.paint(32f));
            text.setView(view);
            text.setLayout(Fixtures.line(s, 45, -32, 8, 0f, 300f));
            return text.render().getPixels();
        }
    }

    @Test
    public void familiesServeTextsWithoutAFontAndEveryScriptOncePerProcess() {
        // Before: a text without its own font has nothing to draw with, and DejaVu has no CJK or Devanagari
        // glyphs of its own (it draws its missing-glyph boxes).
        Check.isNull(Fixtures.inkBox(render("Hello", null), 300, 60), "no font yet");
        int[] cjkBoxes = render(CJK, Fixtures.SANS);
        int[] devanagariBoxes = render(DEVANAGARI, Fixtures.SANS);

        Fixtures.Outcome installed = Fixtures.onFreshThread(SystemFonts::install);
        Check.equal(true, installed.result, "install");
        Check.isNull(installed.reason, "reason");

        int[] hello = render("Hello", null);
        Check.notNull(Fixtures.inkBox(hello, 300, 60), "the default family draws");
        for (String[] script : new String[][] {{"CJK", CJK}, {"Devanagari", DEVANAGARI}}) {
            int[] drawn = render(script[1], Fixtures.SANS);
            Check.notNull(Fixtures.inkBox(drawn, 300, 60), script[0] + " ink");
            int[] boxes = script[0].equals("CJK") ? cjkBoxes : devanagariBoxes;
            Check.isTrue(!Arrays.equals(boxes, drawn), script[0] + " from a fallback family, not DejaVu's boxes");
            // Without a font of its own the text gets the same fallbacks.
            Check.notNull(Fixtures.inkBox(render(script[1], null), 300, 60), script[0] + " without a font");
        }

        // Taken once: neither a second install nor a configuration afterwards changes anything.
        Check.isTrue(SystemFonts.install(), "again");
        FontConfig serif = new FontConfig(new FontConfig.Family("sans-serif", null, 0,
                new FontConfig.Font(Fixtures.SERIF, 0, 400, false, null)));
        Check.isTrue(FontManager.setFontConfig(serif), "a configuration after");
        Check.equal(hello, render("Hello", null), "same default family");
        Check.equal(GxError.NONE, Fixtures.errorAfter(SystemFonts::install), "no error code");
    }
}
