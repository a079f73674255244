package com.vantrel.android.sdk.gxe.font;

import com.vantrel.android.sdk.gxe.util.NativeLibrary;

/**
 * The system's font families on Linux, handed to the library as a device hands over its font
 * configuration, for a plain JVM where no {@code FontConfig} comes from the framework.
 *
 * <p>The families are the ones the system's font configuration (fontconfig) chooses: first the default
 * sans-serif family, then one fallback family for each script or language the system has a font for
 * (Chinese, Japanese, Korean, Arabic, Hebrew, Thai, Devanagari and the other Indic scripts, Greek,
 * Cyrillic and more), each tagged with its language as on a device. They are taken by the same rules as
 * {@link FontManager#setFontConfig(android.text.FontConfig)}: a text without a font of its own draws with
 * the default family, and every text falls back to the others for characters its own font lacks.
 *
 * <pre>{@code
 * if (!SystemFonts.install()) {
 *     System.err.println("no system fonts: " + GxError.getLastReason());
 * }
 * }</pre>
 *
 * <p>The library takes one set of system families per process, from whichever comes first: this call or
 * {@link FontManager#setFontConfig(android.text.FontConfig)}. On a device, use the latter.
 */
public final class SystemFonts {
    private SystemFonts() {}

    /**
     * Reads the system's font families and hands them to the library. Does nothing (and succeeds) when the
     * library has its system families already. The first call reads the system's configuration, which may
     * take a moment; texts render meanwhile.
     *
     * @return false when the system lists no usable families (the reason is then in
     *     {@link com.vantrel.android.sdk.gxe.util.GxError#getLastReason()})
     */
    public static boolean install() {
        NativeLibrary.load();
        return FontManager.GxFontManager_InstallSystemFontFamilies();
    }
}
