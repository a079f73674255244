package com.vantrel.android.sdk.gxe;

import android.content.res.AssetManager;
import android.graphics.Paint;
import android.text.*;
import android.text.style.BackgroundColorSpan;
import android.widget.TextView;
import com.vantrel.android.sdk.gxe.effect.*;
import com.vantrel.android.sdk.gxe.font.FontManager;
import com.vantrel.android.sdk.gxe.util.*;
import java.nio.file.*;
import java.util.*;
import java.util.function.*;
import java.util.stream.Collectors;
import jvmtest.Check;
import jvmtest.LogTap;

/**
 * The natives and the builder API on one process's library: loading, Java objects bound to native texts,
 * the state the natives read from the framework classes, fonts, effects, layer style and exact mode.
 */
public class BridgeTest {
    /** The log of the process's one load: this class runs first. */
    private static final List<String> LOAD_LOG = LogTap.capture(NativeLibrary::load);

    public void loadRegistersErrorFontAndTextClassesInOrder() {
        List<String> bridge = LOAD_LOG.stream().filter(line -> line.matches("^./(GxText_Common_JNI|GxError_JNI|"
                + "Init_GxFontManager_JNI|GxText_JNI): .*")).collect(Collectors.toList());
        Check.equal(Arrays.asList("D/GxText_Common_JNI: GxText_JNI_OnLoad", "D/GxError_JNI: Init .. Done",
                "D/Init_GxFontManager_JNI: Init_GxFontManager_JNI", "D/GxText_JNI: JNI_OnLoad .. Done",
                "D/GxText_Common_JNI: GxText_JNI_OnLoad .... done"), bridge, "load log");
    }

    public void theFirstCallBindsATextAndTheFinaliserReleasesIt() throws Exception {
        GxText text = new GxText();
        List<String> log = LogTap.capture(() -> {
            text.GxText_SetLine(2);
            text.GxText_SetLine(3);
            text.GxText_finalize();
            text.GxText_finalize();
        });
        int handle = Fixtures.handle().getInt(text); // kept by the finaliser
        Check.isTrue(handle >= 1 && LogTap.count(log, "D/GxText_JNI: GetBoundTextObject - hande = 0") == 1
                && LogTap.count(log, "D/GxText_JNI: finalize : RH " + handle) == 1
                && LogTap.count(log, "D/GxTextObject: ~GxTextObject(") == 1, "bound and released once: " + log);
        GxText unbound = new GxText();
        unbound.GxText_finalize();
        unbound.GxText_ClearAllTextEffect();
        Check.equal(-1, Fixtures.handle().getInt(unbound), "handle after a finaliser and clearing as first calls");
        // close() releases once, and the object refuses calls afterwards.
        unbound.addStroke(new Stroke());
        handle = Fixtures.handle().getInt(unbound);
        log = LogTap.capture(() -> {
            unbound.close();
            unbound.close();
        });
        Check.equal(1L, LogTap.count(log, "D/GxText_JNI: finalize : RH " + handle), "closed twice: " + log);
        Check.raises(IllegalStateException.class, unbound::render, "render after close");
    }

    /** Runs the native on a fresh thread: it must return `expected` and leave the thread's code at 19. */
    private static String unbound(String what, Object expected, Supplier<Object> call) {
        Object[] out = {"nothing", null};
        Check.equal(GxError.NOT_BOUND, Fixtures.errorAfter(() -> {
            out[0] = call.get();
            out[1] = GxError.getLastReason();
        }), what + ": error code");
        Check.equal(expected, out[0], what + " of a released text");
        return (String) out[1];
    }

    public void everyNativeOfAReleasedTextFailsWithNotBound() {
        GxText text = new GxText();
        text.GxText_SetLine(1);
        text.GxText_finalize();
        unbound("SetView", false, () -> text.GxText_SetView(new TextView(10, 10)));
        unbound("AddStroke", -1, () -> text.GxText_AddStrokeTextEffect(1f, 0, 1f, 0, 1));
        unbound("Render", null, text::GxText_RenderTextEffect);
        unbound("ClearAll", null, () -> {
            text.GxText_ClearAllTextEffect();
            return null;
        });
        String[] reason = {null};
        List<String> log = LogTap.capture(() -> reason[0] = unbound("AddBevel", -1,
                () -> text.GxText_AddBevelTextEffect(1, 3f, 5f, 1, 0, 0, 1f, 120f, 30f, 0, 1f, 0, 1f)));
        Check.isTrue(reason[0].contains("error 19") && LogTap.count(log, "E/GxText_JNI: @ Native Error 19 : ") == 1,
                "the reason and the log line of a released text: " + reason[0] + ", " + log);
    }

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
                TextView view = new TextView(c[0], c[1]);
                view.padding = Arrays.copyOfRange(c, 2, 6);
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
        TextView view = new TextView(60, 50);
        view.textColor = 0xFF2040C0;
        Paint paint = new Paint(20f);
        paint.color = 0xFFFF0000; // not taken
        SpannableString spanned = new SpannableString(Fixtures.BLOCK);
        spanned.setSpan(new BackgroundColorSpan(0xFF00FF00), 0, 1, 0);
        spanned.setSpan(new BackgroundColorSpan(0xFFFFD000), 0, 1, 0);
        try (GxText text = Fixtures.text(Fixtures.SANS, "", 60, 50, 20f)) {
            Check.isTrue(text.GxText_SetPaint(paint) && text.GxText_SetView(view)
                    && text.GxText_SetLayout(Fixtures.line(spanned, 40, -38, 8)), "set-up");
            GxText.Picture p = text.render();
            Check.equal(new int[] {0xFF2040C0, 0xFFFFD000, 0xFFFFD000, 0}, new int[] {p.getPixel(6, 30),
                p.getPixel(6, 4), p.getPixel(6, 47), p.getPixel(50, 30)}, "the glyph, the box above and below, beside");
        }
    }

    public void refusedArgumentsChangeNothing() throws Exception {
        try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 50, 20f)) {
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
                    && !text.GxText_SetLayout(Fixtures.line(nul, 40, -20, 5)), "refused"));
            String reason = GxError.getLastReason();
            Check.isTrue(reason != null && reason.contains("U+0000"), "reason for U+0000: " + reason);
            Check.isTrue(log.containsAll(Arrays.asList("E/GxText_JNI: GxText_SetPaint - paint is NULL",
                    "E/GxText_JNI: GxText_SetView - view is NULL", "E/GxText_JNI: GxText_SetLayout - Java exception",
                    "D/GxText_JNI: GxText_SetLayout - RH(" + Fixtures.handle().getInt(text) + ") null")), "log " + log);
            Check.equal(before, text.render().getPixels(), "the picture after refused calls");
        }
    }

    /** Whether the text draws its BLOCK where DejaVu Sans draws it. */
    private static boolean drawsBlock(GxText text) {
        return Arrays.equals(Fixtures.blockInk(), Fixtures.inkBox(text.render()));
    }

    public void fontsThatCannotBeUsedSayWhyAndTheOthersDraw() throws Exception {
        AssetManager assets = new AssetManager("/usr/share/fonts/truetype");
        String text = "E/GxText_JNI: GxText_", manager = "E/Init_GxFontManager_JNI: GxFontManager_";
        try (GxText t = Fixtures.text(null, Fixtures.BLOCK, 60, 50, 20f)) {
            Fixtures.refused("null path", false, "no font path", text + "SetFont() - Fail to get fontFile string",
                    () -> t.setFont((String) null));
            Fixtures.refused("null assets", false, "no asset manager", text + "SetFont3() - assetManager is NULL",
                    () -> t.setFont((AssetManager) null, "x.ttf"));
            Fixtures.refused("missing asset", false, "missing.ttf: no such asset", text
                    + "SetFont3() - _ASSET_NOT_FOUND_", () -> t.setFont(assets, "missing.ttf"));
            Fixtures.refused("inserted without bytes", false, "no font bytes", manager
                    + "InsertFontData() - buffer is NULL", () -> FontManager.insertFontData("x", null));
            Check.isTrue(Fixtures.inkBox(t.render()) == null, "a text without a font draws nothing");
            // A call that works clears the reason.
            Check.isTrue(t.setFont(assets, "dejavu/DejaVuSans.ttf") && GxError.getLastReason() == null && drawsBlock(t),
                    "the asset font draws, and no reason is left");
        }
        // A name the font manager knows needs no asset.
        try (GxText t = Fixtures.text(null, Fixtures.BLOCK, 60, 50, 20f)) {
            Check.isTrue(FontManager.insertFontData("inserted", Files.readAllBytes(Paths.get(Fixtures.SANS)))
                    && FontManager.insertFontData("inserted", new byte[1])
                    && t.setFont(new AssetManager("/nonexistent"), "inserted") && drawsBlock(t),
                    "a font inserted by name (the first bytes kept) draws");
        }
    }

    public void effectIdsCountFromZeroAndBadArgumentsAreRefusedSilentlyWithAReason() {
        try (GxText t = new GxText(); GxText empty = new GxText()) {
            Check.equal(0, t.GxText_AddOuterShadowTextEffect(45f, 3f, 3f, 0, 1f), "shadow");
            Check.equal(1, t.GxText_AddStrokeTextEffect(2f, 0, 1f, 0, 1), "stroke");
            Check.equal(0, t.GxText_AddOuterShadowTextEffect(90f, 1f, 1f, 0, 1f), "shadow again");
            t.GxText_ClearAllTextEffect();
            Check.equal(new int[] {0, 0, 0, 0}, t.getEffectMargins(), "margins after clear");
            float[] two = {0f, 1f};
            Fixtures.refused("linear 2, 2, 1", -1, "2 colours, 2 opacities and 1 positions", null,
                    () -> t.GxText_AddLinearGradientTextEffect(0f, 1f, new int[2], two, new float[1], 1f));
            Fixtures.refused("glow 2, 1, 2", -1, "2 colours, 1 opacities", null,
                    () -> t.GxText_AddInnerGlowTextEffect(4f, 0, 1f, new int[2], new float[1], two));
            Fixtures.refused("no tile", -1, "no pixels", null, () -> t.GxText_AddPatternTextEffect(null, 1, 1, 1f, 1f));
            Fixtures.refused("tile too short", -1, "5 pixels are too few", null,
                    () -> t.GxText_AddPatternTextEffect(new int[5], 2, 3, 1f, 1f));
            float[] none = {};
            Check.equal(0, t.GxText_AddLinearGradientTextEffect(0f, 1f, new int[0], none, none, 1f),
                    "the first id after clear and refusals, for three empty stop arrays");
            Check.raises(IllegalArgumentException.class, () -> t.addPattern(new Pattern().tile(new int[3], 2, 2)),
                    "a tile of too few pixels");
            Check.equal(0, empty.render().getPixels().length, "a text with nothing set draws nothing");
        }
    }

    public void aShadowAtAngleZeroFallsLeftInAPictureWithItsMargins() {
        int[] glyph = Fixtures.blockInk();
        try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 50, 20f)) {
            Check.equal(new int[] {0, 0}, text.GxText_GetDrawingBitmapSize(), "size before a render");
            Check.equal(0, text.GxText_AddOuterShadowTextEffect(0f, 10f, 0f, 0x00FF00, 1f), "shadow");
            int[] m = text.getEffectMargins();
            Check.isTrue(m[0] >= 10 && m[0] > m[2], "left margin " + m[0] + ", right " + m[2]);
            int[] pixels = text.GxText_RenderTextEffect(); // adds the text's own layer, without margins
            int w = 60 + m[0] + m[2];
            Check.equal(new int[] {w, 50 + m[1] + m[3]}, text.GxText_GetDrawingBitmapSize(), "bitmap size");
            int row = ((glyph[1] + glyph[3]) / 2 + m[1]) * w + m[0];
            Check.equal(0xFF00FF00, pixels[row + glyph[0] - 5], "shadow");
            Check.equal(0xFF000000, pixels[row + glyph[0] + 5], "glyph over the shadow");
            Check.equal(0, pixels[row + glyph[2] + 2], "nothing on the right");
            GxText.Picture p = text.render();
            Check.equal(m, new int[] {p.getLeft(), p.getTop(), p.getRight(), p.getBottom()}, "picture margins");
        }
    }

    public void everyKindDrawsAndAtOpacityZeroLeavesThePlainText() {
        List<BiConsumer<GxText, Float>> kinds = Arrays.asList((t, o) -> t.addOuterShadow(new Shadow().opacity(o)),
                (t, o) -> t.addInnerShadow(new Shadow().color(0xFF0000).opacity(o)),
                (t, o) -> t.addOuterGlow(new Glow().opacity(o)), (t, o) -> t.addInnerGlow(new Glow().opacity(o)),
                (t, o) -> t.addOuterGlow(new Glow().stop(0xFF0000, 1f, 0f).stop(0x0000FF, 1f, 1f).opacity(o)),
                (t, o) -> t.addStroke(new Stroke().opacity(o)),
                (t, o) -> t.addLinearGradient(new LinearGradient().stop(0xFF0000, 1f, 0f).opacity(o)),
                (t, o) -> t.addRadialGradient(new RadialGradient().stop(0xFF0000, 1f, 0f).opacity(o)),
                (t, o) -> t.addPattern(new Pattern().tile(new int[] {0xFFFF0000, 0xFF0000FF}, 2, 1).opacity(o)),
                (t, o) -> t.addBevel(new Bevel().style(Bevel.Style.OUTER).opacity(o)),
                (t, o) -> t.addEmboss(new Emboss().opacity(o)));
        for (int i = 0; i < kinds.size(); i++) {
            try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 60, 40f)) {
                int[] plain = text.render().getPixels();
                String what = "effect " + i + " of the list";
                kinds.get(i).accept(text, 1f);
                Check.isTrue(!Arrays.equals(plain, Fixtures.viewPixels(text.render())), what + " drew nothing");
                kinds.get(i).accept(text, 0f);
                Check.equal(plain, Fixtures.viewPixels(text.render()), what + " at opacity 0 (plain text expected)");
            }
        }
        try (GxText text = Fixtures.text(Fixtures.SANS, Fixtures.BLOCK, 60, 60, 40f)) {
            text.addPattern(new Pattern().tile(new int[] {0xFFFF8000}, 1, 1)); // a tile's words are 0xAARRGGBB
            int c = text.render().getPixel(10, 38);
            Check.isTrue((c >>> 24) == 0xFF && (c >> 16 & 0xFF) > 0xF0 && Math.abs((c >> 8 & 0xFF) - 0x80) < 8
                    && (c & 0xFF) < 8, String.format("a one-pixel tile of FFFF8000 draws %08X", c));
            text.clearEffects();
            Check.isTrue(text.setFillOpacity(0f) && Fixtures.inkBox(text.render()) == null, "a fill of opacity 0");
        }
    }

    private static final Consumer<GxText> STROKE = t -> t.addStroke(new Stroke().size(3).color(0x2040C0));
    private static final Consumer<GxText> SHADOW =
            t -> t.addOuterShadow(new Shadow().angle(90).distance(6).size(2).color(0).opacity(1f));
    private static final Consumer<GxText> GLOW = t -> t.addInnerGlow(new Glow().size(4).color(0xFFFF00).opacity(1f));
    private static final Consumer<GxText> GRADIENT =
            t -> t.addLinearGradient(new LinearGradient().stop(0xFF0000, 1f, 0f).stop(0xFFFF00, 1f, 1f));

    /** The pixels of an "H" at 48 px in an 80 x 80 view, in either mode, these effects added in order. */
    @SafeVarargs
    private static int[] letterH(boolean exact, Consumer<GxText>... effects) {
        try (GxText text = Fixtures.text(Fixtures.SANS, "H", 80, 80, 48f)) {
            Check.isTrue(text.setExactMode(exact), "mode");
            for (Consumer<GxText> add : effects) {
                add.accept(text);
            }
            return text.render().getPixels();
        }
    }

    public void layerStyleStacksWhateverTheOrderOfAddingAndExactModeByIt() {
        int[] layered = letterH(false, STROKE, SHADOW, GLOW, GRADIENT);
        Check.equal(layered, letterH(false, GRADIENT, GLOW, SHADOW, STROKE), "layer style, another order");
        int[] exact = letterH(true, STROKE, SHADOW, GLOW);
        Check.isTrue(!Arrays.equals(exact, letterH(true, SHADOW, STROKE, GLOW)), "exact mode: by the order of adding");
        try (GxText text = Fixtures.text(Fixtures.SANS, "H", 80, 80, 48f)) {
            text.GxText_AddStrokeTextEffect(3f, 0x2040C0, 1f, 0, 1);
            text.GxText_AddOuterShadowTextEffect(90f, 6f, 2f, 0, 1f);
            text.GxText_AddInnerGlowTextEffect(4f, 0xFFFF00, 1f, null, null, null);
            Check.equal(exact, text.GxText_RenderTextEffect(), "exact mode is the natives' engine as it is");
        }
        int[] ink;
        try (GxText text = Fixtures.text(Fixtures.SANS, "H", 80, 80, 48f)) {
            ink = Fixtures.inkBox(text.render());
        }
        try (GxText text = Fixtures.text(Fixtures.SANS, "H", 80, 80, 48f)) {
            Arrays.asList(STROKE, SHADOW, GLOW).forEach(add -> add.accept(text));
            GxText.Picture p = text.render();
            // The outline lies over the shadow: below the H's foot, where both reach, the stroke's colour shows.
            Check.equal(0xFF2040C0, p.getPixel(p.getLeft() + ink[0] + 2, p.getTop() + 65), "stroke over shadow");
            Check.isTrue(text.setExactMode(true) && text.isExactMode(), "to exact after adding");
            Check.equal(exact, text.render().getPixels(), "switched to exact after adding");
        }
    }
}
