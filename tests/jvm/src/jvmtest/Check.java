package jvmtest;

import java.util.Arrays;
import java.util.Objects;

/** Assertions; a failed one throws AssertionError with both values. */
public final class Check {
    private Check() {}

    public static void isTrue(boolean condition, String what) {
        if (!condition) {
            throw new AssertionError(what);
        }
    }

    public static void equal(long expected, long actual, String what) {
        if (expected != actual) {
            throw new AssertionError(what + ": expected " + expected + ", got " + actual);
        }
    }

    public static void equal(Object expected, Object actual, String what) {
        if (!Objects.equals(expected, actual)) {
            throw new AssertionError(what + ": expected " + expected + ", got " + actual);
        }
    }

    public static void equal(int[] expected, int[] actual, String what) {
        if (!Arrays.equals(expected, actual)) {
            throw new AssertionError(what + ": expected " + Arrays.toString(expected) + ", got "
                    + Arrays.toString(actual));
        }
    }

    /** Two 0xAARRGGBB pixels. */
    public static void pixel(int expected, int actual, String what) {
        if (expected != actual) {
            throw new AssertionError(String.format("%s: expected pixel %08X, got %08X", what, expected, actual));
        }
    }

    public static void isNull(Object value, String what) {
        if (value != null) {
            throw new AssertionError(what + ": expected null, got " + value);
        }
    }

    public static void notNull(Object value, String what) {
        if (value == null) {
            throw new AssertionError(what + ": expected a value, got null");
        }
    }

    /** Runs the action and returns what it threw, failing when it threw nothing of that kind. */
    public static <T extends Throwable> T raises(Class<T> kind, Runnable action, String what) {
        try {
            action.run();
        } catch (Throwable t) {
            if (kind.isInstance(t)) {
                return kind.cast(t);
            }
            throw new AssertionError(what + ": expected " + kind.getSimpleName() + ", got " + t, t);
        }
        throw new AssertionError(what + ": expected " + kind.getSimpleName() + ", nothing was thrown");
    }
}
