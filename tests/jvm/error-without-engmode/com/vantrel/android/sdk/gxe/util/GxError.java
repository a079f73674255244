package com.vantrel.android.sdk.gxe.util;

/** The error class of another version: it has no isBuildTypeEngMode. */
public final class GxError {
    private GxError() {}

    static native int Error_GetError();

    public static int getLastError() {
        NativeLibrary.load();
        return Error_GetError();
    }
}
