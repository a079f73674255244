package com.vantrel.android.sdk.gxe.util;

/**
 * Loads the native library once per process.
 *
 * <p>The library is {@code libGxEffect.glimmer.vantrel.so}, found on {@code java.library.path}; the system
 * property {@code gxe.library} may name the file instead. Loading registers the natives of
 * {@link com.vantrel.android.sdk.gxe.GxText}, {@link com.vantrel.android.sdk.gxe.font.FontManager} and
 * {@link GxError}.
 *
 * <p>The library's classes call {@link #load()} from their constructors and methods, never from a static
 * initialiser: loading initialises those classes, and a class initialiser waiting here for another thread's
 * load would deadlock with it.
 */
public final class NativeLibrary {
    /** The name passed to {@link System#loadLibrary(String)}. */
    public static final String NAME = "GxEffect.glimmer.vantrel";

    private static boolean loaded; // guarded by NativeLibrary.class

    private NativeLibrary() {}

    /** Loads the library unless it is loaded already. */
    public static synchronized void load() {
        if (loaded) {
            return;
        }
        // Set first: loading calls back into GxError on this thread.
        loaded = true;
        try {
            String path = System.getProperty("gxe.library");
            if (path != null) {
                System.load(path);
            } else {
                System.loadLibrary(NAME);
            }
        } catch (RuntimeException | Error e) {
            loaded = false;
            throw e;
        }
    }
}
