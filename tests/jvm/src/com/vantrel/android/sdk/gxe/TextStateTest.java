package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.graphics.Paint;
import android.graphics.Typeface;
import android.text.FontConfig;
import android.text.Layout;
import android.text.SpannableString;
import android.text.style.BackgroundColorSpan;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.nio.file.Files;
import java.nio.file.Path;
import java.nio.file.Paths;
import java.util.Arrays;
import java.util.List;
import java.util.function.BiConsumer;
import java.util.function.Predicate;
import jvmtest.Check;
import jvmtest.LogTap;

/** Font, paint, view, line limit and layout reaching the native text, seen in what it renders. */
public class TextStateTest {
    public void linesShownAndTheirPlacesComeFromTheViewAndTheLineLimit() {
        // The view's width, height, padding (left, top, right, bottom), gravity and maxLines, the line limit;
        // the first and last line shown (-1: none), and how far their baselines move past the top padding.
        int[][] cases = {
            {80, 160, 0, 0, 0, 0, 0x33, 3, 0, 0, 2, 0},
            {80, 160, 0, 0, 0, 0, 0x33, 3, 1, 0, 0, 0}, // the limit wins over maxLines
            {80, 160, 0, 0, 0, 0, 0x33, 0, 0, -1, -1, 0}, // neither: no line
            {60, 50, 5, 7, 3, 2, 0x33, 1, 0, 0, 0, 0}, // padding; the left edge truncated
            {60, 100, 0, 4, 0, 6, 0x13, 1, 0, 0, 0, 32}, // centred: half the room left, (90 - 25) / 2
            {80, 100, 0, 0, 0, 3, 0x53, 9, 2, 3, 4, -48}, // bottom: the last lines, the last on the padding
        };
        // Five lines of one BLOCK each, 30 pixels apart, the n-th line's left edge at 12 n + 0.9.
        float[][] lines = new float[5][];
        for (int i = 0; i < 5; i++) {
            lines[i] = new float[] {i, i + 1, 20 + 30 * i, -20, 5, 12f * i + 0.9f, 12f};
        }
        int[] ink = Fixtures.blockInk(); // of a BLOCK with its pen at (0, 40): these check lines, not the rasteriser
        for (int[] c : cases) {
            try (GxText text = Fixtures.text(Fixtures.SANS, "", c[0], c[1], 20f)) {
                TextView view = Fixtures.view(c[0], c[1]);
                view.paddingLeft = c[2];
                view.paddingTop = c[3];
                view.paddingRight = c[4];
                view.paddingBottom = c[5];
                view.gravity = c[6];
                view.maxLines = c[7];
                Check.isTrue(text.GxText_SetView(view) && text.GxText_SetLine(c[8])
                        && text.GxText_SetLayout(new Layout(Fixtures.BLOCK.repeat(5), lines)), "set-up");
                GxText.Picture p = text.render();
                String what = "view and limit " + Arrays.toString(Arrays.copyOf(c, 9));
                Check.equal(new int[] {c[0], c[1]}, new int[] {p.getWidth(), p.getHeight()}, what + ": picture size");
                int[] expected = c[9] < 0 ? null : new int[] {ink[0] + c[2] + 12 * c[9],
                    ink[1] - 20 + c[3] + 30 * c[9] + c[11], ink[2] + c[2] + 12 * c[10],
                    ink[3] - 20 + c[3] + 30 * c[10] + c[11]};
                Check.equal(Arrays.toString(expected), Arrays.toString(Fixtures.inkBox(p)), what + ": ink");
            }
        }
    }

    public void theColourIsTheViewsAndTheBackgroundTheLastSpans() {
        TextView view = Fixtures.view(60, 50);
        view.textColor = 0xFF2040C0;
        Paint paint = Fixtures.paint(20f);
        paint.color = 0xFFFF0000;
        SpannableString spanned = new SpannableString(Fixtures.BLOCK);
        spanned.setSpan(new BackgroundColorSpan(0xFF00FF00), 0, 1, 0);
        spanned.setSpan(new BackgroundColorSpan(0xFFFFD000), 0, 1, 0);
        try (GxText text = Fixtures.block()) {
            Check.isTrue(text.GxText_SetPaint(paint) && text.GxText_SetView(view)
                    && text.GxText_SetLayout(Fixtures.line(spanned, 40, -38, 8, 0f)), "set-up");
            GxText.Picture p = text.render();
            Check.pixel(0xFF2040C0, p.getPixel(6, 30), "the glyph, over the box");
            Check.pixel(0xFFFFD000, p.getPixel(6, 4), "the box above the glyph");
            Check.pixel(0xFFFFD000, p.getPixel(6, 47), "the box below the glyph");
            Check.pixel(0, p.getPixel(50, 30), "beside the box");
        }
    }

    public void everyPaintAndViewSettingReachesTheGlyphs() {
        List<BiConsumer<Paint, TextView>> settings = Arrays.asList((p, v) -> p.textSize = 24f,
                (p, v) -> p.textScaleX = 1.5f, (p, v) -> p.textSkewX = -0.25f, (p, v) -> p.letterSpacing = 0.5f,
                (p, v) -> p.flags |= Paint.FAKE_BOLD_TEXT_FLAG, (p, v) -> p.flags = 0,
                (p, v) -> v.textColor = 0xFF808080, (p, v) -> v.typeface = Typeface.defaultFromStyle(Typeface.ITALIC));
        for (int i = 0; i < settings.size(); i++) {
            try (GxText text = Fixtures.text(Fixtures.SANS, "Hx", 100, 50, 20f)) {
                int[] plain = text.render().getPixels();
                Paint paint = Fixtures.paint(20f);
                TextView view = Fixtures.view(100, 50);
                settings.get(i).accept(paint, view);
                Check.isTrue(text.GxText_SetPaint(paint) && text.GxText_SetView(view)
                        && text.GxText_SetLayout(Fixtures.line("Hx", 40, -20, 5, 0f)), "set-up");
                int[] changed = text.render().getPixels();
                view.typeface = null; // a view without a typeface keeps the style it had
                Check.isTrue(text.GxText_SetView(view) && !Arrays.equals(plain, changed)
                        && Arrays.equals(changed, text.render().getPixels()), "setting " + i + " is not kept");
            }
        }
    }

    public void refusedArgumentsChangeNothing() throws Exception {
        try (GxText text = Fixtures.block()) {
            int[] before = text.render().getPixels();
            Layout broken = new Layout("x", new float[] {0, 1, 20, -20, 5, 0f, 12f}) {
                @Override
                public float getLineWidth(int line) {
                    throw new IllegalStateException("no widths today");
                }
            };
            String nul = Fixtures.BLOCK + "\u0000" + Fixtures.BLOCK;
            List<String> log = LogTap.capture(() -> Check.isTrue(!text.GxText_SetPaint(null)
                    && !text.GxText_SetView(null) && !text.GxText_SetLayout(null) && !text.GxText_SetLayout(broken)
                    && !text.GxText_SetLayout(Fixtures.line(nul, 40, -20, 5, 20f)), "refused"));
            String reason = GxError.getLastReason();
            Check.isTrue(reason != null && reason.contains("U+0000"), "reason for U+0000: " + reason);
            Check.isTrue(log.containsAll(Arrays.asList("E/GxText_JNI: GxText_SetPaint - paint is NULL",
                    "E/GxText_JNI: GxText_SetView - view is NULL", "E/GxText_JNI: GxText_SetLayout - Java exception",
                    "D/GxText_JNI: GxText_SetLayout - RH(" + Fixtures.handleOf(text) + ") null")), "log " + log);
            Check.equal(before, text.render().getPixels(), "the picture after refused calls");
            // A text of characters that are not UTF-16 pairs still makes the trip (U+0000 does not).
            Check.isTrue(text.GxText_SetLayout(Fixtures.line("\uD800x", 30, -20, 5, 0f)), "a lone surrogate");
        }
    }

    /** Whether the text draws its BLOCK where DejaVu Sans draws it. */
    private static boolean drawsBlock(GxText text) {
        return Arrays.equals(Fixtures.blockInk(), Fixtures.inkBox(text.render()));
    }

    public void fontsThatCannotBeUsedSayWhyAndTheOthersDraw() throws Exception {
        Path root = Files.createTempDirectory("gxe-assets");
        Files.copy(Paths.get(Fixtures.SANS), root.resolve("Asset Sans.ttf"));
        AssetManager assets = new AssetManager(root.toString());
        byte[] sans = Files.readAllBytes(Paths.get(Fixtures.SANS));
        String text = "E/GxText_JNI: GxText_", manager = "E/Init_GxFontManager_JNI: GxFontManager_";
        try (GxText t = Fixtures.text(null, Fixtures.BLOCK, 60, 50, 20f)) {
            Fixtures.refused("null path", false, "no font path", text + "SetFont() - Fail to get fontFile string",
                    () -> t.setFont((String) null));
            Fixtures.refused("null name", false, "no font name", text + "SetFont2() - fontName is NULL",
                    () -> t.setFont(null, new byte[1]));
            Fixtures.refused("null bytes", false, "no font bytes", text + "SetFont2() - buffer is NULL",
                    () -> t.setFont("by-bytes", null));
            Fixtures.refused("garbage", false, "garbage: not a font", "E/GxFontManager: AddMinikinFont() - Fail to "
                    + "create typeface", () -> t.setFont("garbage", new byte[3]));
            Fixtures.refused("null assets", false, "no asset manager", text + "SetFont3() - assetManager is NULL",
                    () -> t.setFont((AssetManager) null, "x.ttf"));
            Fixtures.refused("null asset name", false, "no asset name", text + "SetFont3() - fontName is NULL",
                    () -> t.setFont(assets, null));
            Fixtures.refused("missing asset", false, "missing.ttf: no such asset", text
                    + "SetFont3() - _ASSET_NOT_FOUND_", () -> t.setFont(assets, "missing.ttf"));
            Fixtures.refused("inserted without name", false, "no font name", manager
                    + "InsertFontData() - fontName is NULL", () -> FontManager.insertFontData(null, new byte[1]));
            Fixtures.refused("inserted without bytes", false, "no font bytes", manager
                    + "InsertFontData() - buffer is NULL", () -> FontManager.insertFontData("x", null));
            Fixtures.refused("no configuration", false, "no font configuration", manager
                    + "SetFontConfig - jFontConfig is NULL", () -> FontManager.setFontConfig(null));
            Check.isTrue(Fixtures.inkBox(t.render()) == null, "a text without a font draws nothing");
            // A call that works clears the reason.
            Check.isTrue(t.setFont(assets, "Asset Sans.ttf") && GxError.getLastReason() == null && drawsBlock(t),
                    "the asset font draws, and no reason is left");
        } finally {
            Files.delete(root.resolve("Asset Sans.ttf"));
            Files.delete(root);
        }
        Check.isTrue(FontManager.insertFontData("inserted", sans), "inserted");
        Check.isTrue(FontManager.insertFontData("inserted", new byte[] {9}), "inserted again: the first is kept");
        List<Predicate<GxText>> ways = Arrays.asList(t -> t.setFont(Fixtures.SANS), t -> t.setFont("by-bytes", sans),
                t -> t.setFont("inserted"), t -> t.setFont(new AssetManager("/nonexistent"), "inserted"));
        for (int i = 0; i < ways.size(); i++) {
            try (GxText t = Fixtures.text(null, Fixtures.BLOCK, 60, 50, 20f)) {
                Check.isTrue(ways.get(i).test(t) && drawsBlock(t), "font " + i + " does not draw");
            }
        }
    }

    public void systemFamiliesAreTakenOncePerProcess() {
        FontConfig.Font upright = new FontConfig.Font(Fixtures.SANS, 400, false, null);
        FontConfig.Family laterNamed = new FontConfig.Family("serif", null, upright) {
            @Override
            public FontConfig.Font[] getFonts() {
                throw new IllegalStateException("the fonts of a later named family are read");
            }
        };
        Check.isTrue(FontManager.setFontConfig(new FontConfig(new FontConfig.Family("sans-serif", null,
                new FontConfig.Font(Fixtures.SANS.replace(".ttf", "-Oblique.ttf"), 400, true, null), upright), null,
                laterNamed, new FontConfig.Family(null, "und-Arab", new FontConfig.Font("/nonexistent.ttf", 400, false,
                null), null))), "the first configuration, without reading a later named family's fonts");
        try (GxText text = Fixtures.text(null, Fixtures.BLOCK, 60, 50, 20f)) {
            Check.isTrue(drawsBlock(text), "the named family's upright font draws");
        }
        Check.isTrue(FontManager.setFontConfig(null), "once set, a configuration is not even looked at");
    }
}
