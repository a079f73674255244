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

    /** Values (ints also in hex, as pixels are), or int arrays (sizes, ink boxes, pictures: the first difference). */
    public static void equal(Object expected, Object actual, String what) {
        if (expected instanceof int[] && actual instanceof int[]) {
            int[] e = (int[]) expected, a = (int[]) actual;
            int i = Arrays.mismatch(e, a);
            isTrue(i < 0 || i < Math.min(e.length, a.length), what + ": " + a.length + " values, not " + e.length);
            isTrue(i < 0, i < 0 ? "" : String.format("%s: value %d is %d (%08X), expected %d (%08X)", what, i, a[i],
                    a[i], e[i], e[i]));
        } else if (expected instanceof Integer && actual instanceof Integer) {
            isTrue(expected.equals(actual), String.format("%s: expected %d (%08X), got %d (%08X)", what, expected,
                    expected, actual, actual));
        } else {
            isTrue(Objects.equals(expected, actual), what + ": expected " + expected + ", got " + actual);
        }
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
