package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of an emboss: glyphs that look pressed up out of the surface around them, their edges lit on
 * both sides.
 *
 * <pre>{@code
 * text.addEmboss(new Emboss().size(4).depth(3).style(Emboss.Style.TWO_SIDED));
 * }</pre>
 *
 * <p>See {@link Relief} for the parameters the emboss shares with the bevel.
 */
public final class Emboss extends Relief<Emboss> {
    /** How the surroundings are lit. */
    public enum Style {
        /** The surroundings lit as the glyphs. */
        PLAIN(0),
        /** The surroundings lit the opposite way. */
        TWO_SIDED(3);

        private final int value;

        Style(int value) {
            this.value = value;
        }

        /** The number the library knows the style by. */
        public int value() {
            return value;
        }
    }

    private Style style = Style.PLAIN;

    /** Plain (the default) or two-sided. */
    public Emboss style(Style style) {
        if (style == null) {
            throw new NullPointerException("style");
        }
        this.style = style;
        return this;
    }

    public Style getStyle() {
        return style;
    }

    @Override
    public int styleValue() {
        return style.value();
    }

    @Override
    Emboss self() {
        return this;
    }
}
