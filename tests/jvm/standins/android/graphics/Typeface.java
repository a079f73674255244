package android.graphics;

/** Test stand-in: a typeface is only its style bits here. */
public class Typeface {
    public static final int NORMAL = 0, BOLD = 1, ITALIC = 2, BOLD_ITALIC = 3;

    private final int style;

    private Typeface(int style) { this.style = style; }

    public static Typeface defaultFromStyle(int style) { return new Typeface(style); }

    public boolean isBold() { return (style & BOLD) != 0; }
    public boolean isItalic() { return (style & ITALIC) != 0; } // older: absent
}
