package com.vantrel.android.sdk.gxe.util;

/** The error class of the first Java layer: the error code, no reason. */
public final class GxError {
    private GxError() {}

    static native int Error_GetError();

    static boolean isBuildTypeEngMode() {
        return false;
    }

    public static int getLastError() {
        return Error_GetError();
    }
}
