package android.text.style;

/** Test stand-in: a span that paints the text's background. */
public class BackgroundColorSpan {
    private final int color;

    public BackgroundColorSpan(int color) { this.color = color; }

    public int getBackgroundColor() { return color; }
}
