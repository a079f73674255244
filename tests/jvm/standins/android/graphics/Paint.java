package android.graphics;

import android.os.LocaleList;

/** Test stand-in: the text attributes of a paint that the library reads, as plain settable fields. */
public class Paint {
    public static final int ANTI_ALIAS_FLAG = 0x01;
    public static final int FAKE_BOLD_TEXT_FLAG = 0x20;
    public static final int SUBPIXEL_TEXT_FLAG = 0x80;

    // The natives read an alignment by its name(), which the older one lacks.
    public enum Align { LEFT, CENTER, RIGHT } // older: absent
    // older: public static final class Align { public static final Align LEFT = new Align(), CENTER = new Align(), RIGHT = new Align(); }

    private float textScaleX = 1f;
    private float textSkewX = 0f;
    private float letterSpacing = 0f;
    private boolean elegantTextHeight;
    private int flags = ANTI_ALIAS_FLAG;
    private String fontFeatureSettings;
    private LocaleList textLocales;
    private Align textAlign = Align.LEFT;
    private int color = 0xFF000000;
    private float textSize = 12f;

    public float getTextScaleX() { return textScaleX; }
    public void setTextScaleX(float v) { textScaleX = v; }
    public float getTextSkewX() { return textSkewX; }
    public void setTextSkewX(float v) { textSkewX = v; }
    public float getLetterSpacing() { return letterSpacing; }
    public void setLetterSpacing(float v) { letterSpacing = v; }
    public boolean isElegantTextHeight() { return elegantTextHeight; }
    public void setElegantTextHeight(boolean v) { elegantTextHeight = v; }
    public int getFlags() { return flags; }
    public void setFlags(int v) { flags = v; }
    public String getFontFeatureSettings() { return fontFeatureSettings; }
    public void setFontFeatureSettings(String v) { fontFeatureSettings = v; }
    public LocaleList getTextLocales() { return textLocales; }
    public void setTextLocales(LocaleList v) { textLocales = v; }
    public Align getTextAlign() { return textAlign; }
    public void setTextAlign(Align v) { textAlign = v; }
    public int getColor() { return color; } // older: absent
    public void setColor(int v) { color = v; }
    public float getTextSize() { return textSize; }
    public void setTextSize(float v) { textSize = v; }
    public boolean isFakeBoldText() { return (flags & FAKE_BOLD_TEXT_FLAG) != 0; }
    public void setFakeBoldText(boolean v) { flags = v ? flags | FAKE_BOLD_TEXT_FLAG : flags & ~FAKE_BOLD_TEXT_FLAG; }
}
