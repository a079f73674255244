package android.widget;

import android.graphics.Typeface;

/** Test stand-in: the view geometry and text attributes the library reads, as settable fields. */
public class TextView {
    private float textSize = 12f;
    private int currentTextColor = 0xFF000000;
    private Typeface typeface;
    private int width;
    private int height;
    private int paddingLeft;
    private int paddingTop;
    private int paddingRight;
    private int paddingBottom;
    private int gravity = 0x33; // TOP | START
    private int maxLines = Integer.MAX_VALUE;

    public float getTextSize() { return textSize; }
    public int getCurrentTextColor() { return currentTextColor; }
    public void setTextColor(int color) { currentTextColor = color; }
    public Typeface getTypeface() { return typeface; }
    public void setTypeface(Typeface tf) { typeface = tf; }
    public int getTextDirection() { return 0; }
    public int getLayoutDirection() { return 0; }
    public int getWidth() { return width; }
    public int getHeight() { return height; }
    public void setSize(int w, int h) { width = w; height = h; }
    public int getPaddingLeft() { return paddingLeft; }
    public int getPaddingRight() { return paddingRight; }
    public int getPaddingTop() { return paddingTop; }
    public int getPaddingBottom() { return paddingBottom; }
    public void setPadding(int left, int top, int right, int bottom) {
        paddingLeft = left;
        paddingTop = top;
        paddingRight = right;
        paddingBottom = bottom;
    }
    public int getGravity() { return gravity; }
    public void setGravity(int g) { gravity = g; }
    public int getMaxLines() { return maxLines; } // older: absent
    public void setMaxLines(int n) { maxLines = n; }
}
