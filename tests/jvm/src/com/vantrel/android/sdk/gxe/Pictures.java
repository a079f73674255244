package com.vantrel.android.sdk.gxe;

import com.vantrel.android.sdk.gxe.effect.Bevel;
import com.vantrel.android.sdk.gxe.effect.Emboss;
import com.vantrel.android.sdk.gxe.effect.Glow;
import com.vantrel.android.sdk.gxe.effect.LinearGradient;
import com.vantrel.android.sdk.gxe.effect.Pattern;
import com.vantrel.android.sdk.gxe.effect.RadialGradient;
import com.vantrel.android.sdk.gxe.effect.Shadow;
import com.vantrel.android.sdk.gxe.effect.Stroke;
import com.vantrel.android.sdk.gxe.font.SystemFonts;
import com.vantrel.android.sdk.gxe.util.GxError;
import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.util.ArrayList;
import java.util.List;
import java.util.function.Consumer;
import javax.imageio.ImageIO;

/**
 * Writes pictures of the Java builder API to a folder, to be looked at: the same effects in the engine's
 * exact mode and in layer style, and one picture per effect kind, each alone and stacked into one sheet
 * (modes.png, kinds.png), and words of other scripts from the system's font families (system-fonts.png).
 * Run by CTest (jvm_pictures) into the build tree.
 */
public final class Pictures {
    private static final String WORD = "Glimmer";
    private static final String BOLD = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";
    private static final int SIZE = 96;
    private static final int BLUE = 0xFF2050A0;

    private static final List<BufferedImage> sheet = new ArrayList<>();

    private Pictures() {}

    public static void main(String[] args) throws IOException {
        File folder = new File(args[0]);
        if (!folder.isDirectory() && !folder.mkdirs()) {
            throw new IOException("cannot make " + folder);
        }
        Consumer<GxText> insideStroke = t -> t.addStroke(
                new Stroke().size(6).color(0xFFD000).position(Stroke.Position.INSIDE));
        Consumer<GxText> stroke = t -> t.addStroke(new Stroke().size(4).color(0xD7263D));
        Consumer<GxText> shadow = t -> t.addOuterShadow(new Shadow().angle(90).distance(8).size(4).opacity(0.8f));
        for (boolean exact : new boolean[] {true, false}) {
            String mode = exact ? "exact" : "layer-style";
            write(folder, "inside-stroke-" + mode, exact, insideStroke);
            write(folder, "stroke-then-shadow-" + mode, exact, t -> { stroke.accept(t); shadow.accept(t); });
            write(folder, "shadow-then-stroke-" + mode, exact, t -> { shadow.accept(t); stroke.accept(t); });
            write(folder, "fill-opacity-0-" + mode, exact, t -> {
                t.addStroke(new Stroke().size(3).color(0xD7263D));
                t.addOuterGlow(new Glow().size(10).color(0xFFC040).opacity(0.9f));
                t.setFillOpacity(0f);
            });
        }
        writeSheet(folder, "modes");
        int[] checker = new int[64];
        for (int i = 0; i < 64; i++) {
            checker[i] = ((i / 8 + i % 8) / 4) % 2 == 0 ? 0xFFF0C020 : 0xFF2050A0;
        }
        write(folder, "kind-inner-glow", false, t -> t.addInnerGlow(new Glow().size(8).color(0xFFFF80).opacity(1f)));
        write(folder, "kind-outer-glow-ramp", false, t -> t.addOuterGlow(new Glow().size(14)
                .stop(0xFF2000, 1f, 0f).stop(0xFFE000, 1f, 1f)));
        write(folder, "kind-radial-gradient", false, t -> t.addRadialGradient(new RadialGradient()
                .stop(0xFFFFFF, 1f, 0f).stop(0x3060C0, 1f, 1f)));
        write(folder, "kind-linear-gradient", false, t -> t.addLinearGradient(new LinearGradient().angle(90)
                .stop(0xFF4060, 1f, 0f).stop(0x4020C0, 1f, 1f)));
        write(folder, "kind-pattern", false, t -> t.addPattern(new Pattern().tile(checker, 8, 8).scale(2)));
        write(folder, "kind-bevel-inner", false, t -> t.addBevel(new Bevel().size(6).depth(4)));
        write(folder, "kind-bevel-outer", false, t -> t.addBevel(new Bevel().size(6).style(Bevel.Style.OUTER)));
        write(folder, "kind-emboss", false, t -> t.addEmboss(new Emboss().size(5).style(Emboss.Style.TWO_SIDED)));
        write(folder, "kind-inner-shadow", false, t -> t.addInnerShadow(new Shadow().angle(120).distance(5)
                .size(4).opacity(0.9f)));
        write(folder, "kind-everything", false, t -> {
            t.addEmboss(new Emboss().size(3));
            t.addInnerShadow(new Shadow().distance(3).size(3));
            t.addLinearGradient(new LinearGradient().stop(0xFFE070, 1f, 0f).stop(0xE06010, 1f, 1f));
            t.addStroke(new Stroke().size(4).color(0x301000));
            t.addOuterGlow(new Glow().size(10).color(0xFFD060));
            t.addOuterShadow(new Shadow().angle(90).distance(8).size(6));
        });
        writeSheet(folder, "kinds");

        // Other scripts from the system's families, as a plain JVM gets them.
        if (!SystemFonts.install()) {
            throw new IOException("no system fonts: " + GxError.getLastReason());
        }
        write(folder, "system-fonts", false, t -> {
            t.addStroke(new Stroke().size(2).color(0xFFFFFF));
            t.addOuterShadow(new Shadow().angle(90).distance(4).size(3));
        }, "Glimmer \u6F22\u5B57\u304B\u306A \uD55C\uAE00 \u0928\u092E\u0938\u094D\u0924\u0947 \u0E2A\u0E27\u0E31\u0E2A\u0E14\u0E35", 48,
                900);
        sheet.clear();
    }

    /** The pictures written since the last sheet, one under the other. */
    private static void writeSheet(File folder, String name) throws IOException {
        int width = 0;
        int height = 0;
        for (BufferedImage image : sheet) {
            width = Math.max(width, image.getWidth());
            height += image.getHeight() + 4;
        }
        BufferedImage all = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
        java.awt.Graphics g = all.getGraphics();
        g.setColor(java.awt.Color.WHITE);
        g.fillRect(0, 0, width, height);
        int y = 0;
        for (BufferedImage image : sheet) {
            g.drawImage(image, 0, y, null);
            y += image.getHeight() + 4;
        }
        ImageIO.write(all, "png", new File(folder, name + ".png"));
        sheet.clear();
    }

    private static void write(File folder, String name, boolean exact, Consumer<GxText> effects) throws IOException {
        write(folder, name, exact, effects, WORD, SIZE, 520);
    }

    /** Renders the words with the effects over a light grey ground and writes NAME.png. */
    private static void write(File folder, String name, boolean exact, Consumer<GxText> effects, String words,
            int size, int width) throws IOException {
        int height = size * 4 / 3 + 2;
        try (GxText text = Fixtures.text(words, Fixtures.view(width, height), size, size * 100 / 96)) {
            android.widget.TextView view = Fixtures.view(width, height);
            view.setTextColor(BLUE);
            text.setView(view);
            text.setFont(BOLD);
            text.setExactMode(exact);
            effects.accept(text);
            GxText.Picture p = text.render();
            BufferedImage image = new BufferedImage(p.getWidth(), p.getHeight(), BufferedImage.TYPE_INT_RGB);
            for (int y = 0; y < p.getHeight(); y++) {
                for (int x = 0; x < p.getWidth(); x++) {
                    image.setRGB(x, y, over(p.getPixel(x, y), 0xFFE8E8E8));
                }
            }
            ImageIO.write(image, "png", new File(folder, name + ".png"));
            sheet.add(image);
        }
    }

    /** Straight-alpha `top` over opaque `ground`. */
    private static int over(int top, int ground) {
        int a = top >>> 24;
        int rgb = 0;
        for (int shift = 0; shift < 24; shift += 8) {
            int t = (top >> shift) & 0xFF;
            int g = (ground >> shift) & 0xFF;
            rgb |= ((t * a + g * (255 - a) + 127) / 255) << shift;
        }
        return 0xFF000000 | rgb;
    }
}
