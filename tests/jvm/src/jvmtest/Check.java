package jvmtest;

import java.util.Arrays;
import java.util.Objects;

/** Assertions; a failed one throws AssertionError saying what differed, in one line. */
public final class Check {
    private Check() {}

    public static void isTrue(boolean condition, String what) {
        if (!condition) {
            throw new AssertionError(what);
        }
    }

    /** Values, or int arrays: short ones are shown whole, of whole pictures the first differing pixel. */
    public static void equal(Object expected, Object actual, String what) {
        if (!(expected instanceof int[] && actual instanceof int[])) {
            isTrue(Objects.equals(expected, actual), what + ": expected " + expected + ", got " + actual);
            return;
        }
        int[] e = (int[]) expected, a = (int[]) actual;
        int i = Arrays.mismatch(e, a);
        if (i >= 0 && e.length <= 4 && a.length <= 4) {
            throw new AssertionError(what + ": expected " + Arrays.toString(e) + ", got " + Arrays.toString(a));
        } else if (i >= 0) {
            isTrue(i < Math.min(e.length, a.length), what + ": expected " + e.length + " values, got " + a.length);
            throw new AssertionError(String.format("%s: value %d is %08X, expected %08X", what, i, a[i], e[i]));
        }
    }

    /** Two 0xAARRGGBB pixels. */
    public static void pixel(int expected, int actual, String what) {
        isTrue(expected == actual, String.format("%s: expected pixel %08X, got %08X", what, expected, actual));
    }

    /** Runs the action, failing unless it throws that kind of exception. */
    public static void raises(Class<? extends Throwable> kind, Runnable action, String what) {
        try {
            action.run();
        } catch (Throwable t) {
            isTrue(kind.isInstance(t), what + ": expected " + kind.getSimpleName() + ", got " + t);
            return;
        }
        throw new AssertionError(what + ": expected " + kind.getSimpleName() + ", nothing was thrown");
    }
}
