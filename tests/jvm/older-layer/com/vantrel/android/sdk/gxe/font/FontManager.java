package com.vantrel.android.sdk.gxe.font;

import android.text.FontConfig;

/** The font manager of the first Java layer: font data and the font configuration, nothing newer. */
public final class FontManager {
    private FontManager() {}

    static native boolean GxFontManager_InsertFontData(String fontName, byte[] buffer);

    static native boolean GxFontManager_SetFontConfig(FontConfig fontConfig);

    public static boolean insertFontData(String name, byte[] data) {
        return GxFontManager_InsertFontData(name, data);
    }

    public static boolean setFontConfig(FontConfig config) {
        return GxFontManager_SetFontConfig(config);
    }
}
