package android.graphics;

import android.os.LocaleList;

/** Test stand-in: the text attributes of a paint that the library reads, as public fields. */
public class Paint {
    public static final int ANTI_ALIAS_FLAG = 0x01;
    public static final int FAKE_BOLD_TEXT_FLAG = 0x20;

    // The natives read an alignment by its name(), which the older one lacks.
    public enum Align { LEFT, CENTER, RIGHT } // older: absent
    // older: public static final class Align { public static final Align LEFT = new Align(), CENTER = new Align(), RIGHT = new Align(); }

    public float textSize = 12f, textScaleX = 1f, textSkewX, letterSpacing;
    public boolean elegantTextHeight;
    public int flags = ANTI_ALIAS_FLAG, color = 0xFF000000;
    public String fontFeatureSettings;
    public LocaleList textLocales;
    public Align textAlign = Align.LEFT;

    public Paint() {}

    public Paint(float textSize) { this.textSize = textSize; }

    public float getTextSize() { return textSize; }
    public float getTextScaleX() { return textScaleX; }
    public float getTextSkewX() { return textSkewX; }
    public float getLetterSpacing() { return letterSpacing; }
    public boolean isElegantTextHeight() { return elegantTextHeight; }
    public int getFlags() { return flags; }
    public boolean isFakeBoldText() { return (flags & FAKE_BOLD_TEXT_FLAG) != 0; }
    public String getFontFeatureSettings() { return fontFeatureSettings; }
    public LocaleList getTextLocales() { return textLocales; }
    public Align getTextAlign() { return textAlign; }
    public int getColor() { return color; } // older: absent
}
