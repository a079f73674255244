package android.widget;

import android.graphics.Typeface;

/** Test stand-in: the view geometry and text attributes the library reads, as public fields. */
public class TextView {
    public int width, height;
    public int[] padding = new int[4]; // left, top, right, bottom
    public int gravity = 0x33; // TOP | START
    public int maxLines = Integer.MAX_VALUE;
    public int textColor = 0xFF000000;
    public Typeface typeface;

    public TextView() {}

    public TextView(int width, int height) {
        this.width = width;
        this.height = height;
    }

    public float getTextSize() { return 12f; }
    public int getCurrentTextColor() { return textColor; }
    public Typeface getTypeface() { return typeface; }
    public int getTextDirection() { return 0; }
    public int getLayoutDirection() { return 0; }
    public int getWidth() { return width; }
    public int getHeight() { return height; }
    public int getPaddingLeft() { return padding[0]; }
    public int getPaddingTop() { return padding[1]; }
    public int getPaddingRight() { return padding[2]; }
    public int getPaddingBottom() { return padding[3]; }
    public int getGravity() { return gravity; }
    public int getMaxLines() { return maxLines; } // older: absent
}
