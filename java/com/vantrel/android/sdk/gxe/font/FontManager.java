package com.vantrel.android.sdk.gxe.font;

import android.text.FontConfig;
import com.vantrel.android.sdk.gxe.util.NativeLibrary;

/**
 * The library's process-wide fonts.
 *
 * <p>{@link #setFontConfig(FontConfig)} hands over the device's font families once per process; they are
 * the fallbacks for every text. {@link #insertFontData(String, byte[])} makes a font known under a name,
 * which texts can then choose with {@link com.vantrel.android.sdk.gxe.GxText#setFont(String)}. Fonts stay
 * loaded for the life of the process. In a plain JVM on Linux, {@link SystemFonts#install()} hands over
 * the system's own families instead of a configuration. When a call returns false,
 * {@link com.vantrel.android.sdk.gxe.util.GxError#getLastReason()} tells why.
 */
public final class FontManager {
    private FontManager() {}

    static native boolean GxFontManager_InsertFontData(String fontName, byte[] buffer);

    static native boolean GxFontManager_SetFontConfig(FontConfig fontConfig);

    static native boolean GxFontManager_InstallSystemFontFamilies();

    /**
     * Makes the font in {@code data} (a TrueType or OpenType file, first face) known under {@code name}.
     * The bytes are copied. A font already known under the name is kept, and the call succeeds.
     *
     * @return false for a null argument or bytes that are no font
     */
    public static boolean insertFontData(String name, byte[] data) {
        NativeLibrary.load();
        return GxFontManager_InsertFontData(name, data);
    }

    /**
     * Takes the system's font families: the first named family (the default font) and every unnamed
     * fallback family, without italic fonts, fonts that cannot be read, and fonts that only stand in for
     * another named family. Only the first successful call counts; later calls return true and change
     * nothing.
     *
     * @return false for null, or a configuration that could not be read
     */
    public static boolean setFontConfig(FontConfig config) {
        NativeLibrary.load();
        return GxFontManager_SetFontConfig(config);
    }
}
