package com.vantrel.android.sdk.gxe.util;

/**
 * Error codes of the native library.
 *
 * <p>A library call that fails returns {@code false}, {@code 0}, {@code -1} or {@code null}; the reason is
 * kept per thread and read with {@link #getLastError()} on the thread that made the call. Only some
 * failures set a code (a call on a text that was already released sets {@link #NOT_BOUND}); the others are
 * only logged.
 */
public final class GxError {
    public static final int NONE = 0;
    public static final int SYSTEM_CALL = 1;
    public static final int LIMIT_REACHED = 2;
    public static final int INDEX_OUT_OF_RANGE = 3;
    public static final int ALREADY_CONSTRUCTED = 4;
    public static final int INVALID_ARGUMENT = 7;
    public static final int NOT_CONSTRUCTED = 8;
    public static final int NOT_FOUND = 9;
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
}
