package com.vantrel.android.sdk.gxe.effect;

/**
 * Parameters of a bevel: glyphs that look raised, their edges sloping inward (inner bevel) or a collar
 * sloping away outside them (outer bevel).
 *
 * <pre>{@code
 * text.addBevel(new Bevel().size(6).depth(4).angle(120).altitude(30)
 *         .highlight(0xFFFFFF, 0.8f).shadow(0x000000, 0.6f));
 * }</pre>
 *
 * <p>See {@link Relief} for the parameters the bevel shares with the emboss.
 */
public final class Bevel extends Relief<Bevel> {
    /** Where the slopes lie against the glyph edges. */
    public enum Style {
        /** Inside the glyphs. */
        INNER(1),
        /** A collar outside the glyphs. */
        OUTER(0);

        private final int value;

        Style(int value) {
            this.value = value;
        }

        /** The number the library knows the style by. */
        public int value() {
            return value;
        }
    }

    private Style style = Style.INNER;

    /** Inner (the default) or outer bevel. */
    public Bevel style(Style style) {
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
    Bevel self() {
        return this;
    }
}
