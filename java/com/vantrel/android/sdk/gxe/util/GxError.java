package com.vantrel.android.sdk.gxe.util;

/**
 * Error codes and failure reasons of the native library.
 *
 * <p>A library call that fails returns {@code false}, {@code 0}, {@code -1} or {@code null}. Two things are
 * kept per thread to tell why, each read on the thread that made the call: a code, {@link #getLastError()},
 * which only some failures set (a call on a text that was already released sets {@link #NOT_BOUND}), and a
 * reason in words, {@link #getLastReason()}, which every failure with a code sets and so do the failures
 * without one that a caller can do something about: a font file that is missing, cannot be read or is no
 * font, font bytes that are no font, a missing asset, a framework class of another version.
 *
 * <pre>{@code
 * if (!text.setFont(path)) {
 *     Log.w(TAG, "font not used: " + GxError.getLastReason());
 * }
 * }</pre>
 */
public final class GxError {
    /** No error. */
    public static final int NONE = 0;
    /** A system call failed. */
    public static final int SYSTEM_CALL = 1;
    /** A size or count limit of the library was reached. */
    public static final int LIMIT_REACHED = 2;
    /** An index lies outside its range. */
    public static final int INDEX_OUT_OF_RANGE = 3;
    /** The object was set up already. */
    public static final int ALREADY_CONSTRUCTED = 4;
    /** An argument is invalid: null, negative, zero or malformed. */
    public static final int INVALID_ARGUMENT = 7;
    /** The object is not set up, or lacks what the call needs. */
    public static final int NOT_CONSTRUCTED = 8;
    /** No such object. */
    public static final int NOT_FOUND = 9;
    /** A file could not be opened. */
    public static final int FILE_OPEN = 11;
    /** No native text behind the Java object: it was released, or could not be made. */
    public static final int NOT_BOUND = 19;

    private GxError() {}

    /** The last error code set on the calling thread (registered by the library). */
    static native int Error_GetError();

    /** The reason of the last failure on the calling thread, or null (registered by the library). */
    static native String Error_GetReason();

    /**
     * Whether this is an engineering build, in which the library writes all its diagnostic log lines. Asked
     * once, when the library loads; here the system property {@code gxe.engMode}.
     */
    static boolean isBuildTypeEngMode() {
        return Boolean.getBoolean("gxe.engMode");
    }

    /** The last error code set on the calling thread by a library call; {@link #NONE} if there was none. */
    public static int getLastError() {
        NativeLibrary.load();
        return Error_GetError();
    }

    /**
     * Why the last failed library call on the calling thread failed, in words (for people and logs, not
     * for parsing), or null when no failure left a reason.
     *
     * <p>Every failure of setting a font ({@code GxText.setFont}, {@code FontManager.insertFontData},
     * {@code FontManager.setFontConfig}), of {@code SystemFonts.install} and of adding an effect leaves a
     * reason of its own. Other calls may fail without one (a null paint, say) and then leave an earlier
     * reason in place; like the error code, a reason is not cleared by a call that succeeds. Read it right
     * after the call that failed.
     */
    public static String getLastReason() {
        NativeLibrary.load();
        return Error_GetReason();
    }
}
