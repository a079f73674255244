package android.widget;

import android.graphics.Typeface;

/** Test stand-in: the view geometry and text attributes the library reads, as public fields. */
public class TextView {
    public int width, height, paddingLeft, paddingTop, paddingRight, paddingBottom;
    public int gravity = 0x33; // TOP | START
    public int maxLines = Integer.MAX_VALUE;
    public int textColor = 0xFF000000;
    public Typeface typeface;

    public float getTextSize() { return 12f; }
    public int getCurrentTextColor() { return textColor; }
    public Typeface getTypeface() { return typeface; }
    public int getTextDirection() { return 0; }
    public int getLayoutDirection() { return 0; }
    public int getWidth() { return width; }
    public int getHeight() { return height; }
    public int getPaddingLeft() { return paddingLeft; }
    public int getPaddingRight() { return paddingRight; }
    public int getPaddingTop() { return paddingTop; }
    public int getPaddingBottom() { return paddingBottom; }
    public int getGravity() { return gravity; }
    public int getMaxLines() { return maxLines; } // older: absent
}
