package jvmtest;

import java.nio.charset.StandardCharsets;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;

/**
 * Captures the library's log lines. On Linux the library writes them to stderr as "P/tag: message" (with
 * GLIMMER_LOG_LEVEL=debug in the environment, which the test setup provides); while a capture runs, the
 * process's stderr goes to a temporary file instead. One capture at a time, from one thread.
 */
public final class LogTap {
    static {
        System.loadLibrary("glimmer_logtap");
    }

    private LogTap() {}

    private static native void begin();

    private static native byte[] end();

    /** Runs the action; returns the lines written to stderr meanwhile. */
    public static synchronized List<String> capture(Runnable action) {
        if (!"debug".equals(System.getenv("GLIMMER_LOG_LEVEL"))) {
            throw new IllegalStateException("run with GLIMMER_LOG_LEVEL=debug");
        }
        begin();
        byte[] written;
        try {
            action.run();
        } finally {
            written = end();
        }
        List<String> lines = new ArrayList<>(Arrays.asList(new String(written, StandardCharsets.UTF_8).split("\n")));
        lines.removeIf(String::isEmpty);
        // Anything the JVM itself said goes on to the real stderr.
        for (String line : lines) {
            if (!line.matches("^[DIWE?]/.*")) {
                System.err.println(line);
            }
        }
        return lines;
    }

    /** Whether `lines` holds exactly this line (priority letter, tag, message). */
    public static boolean contains(List<String> lines, char priority, String tag, String message) {
        return lines.contains(priority + "/" + tag + ": " + message);
    }

    /** How many of `lines` start with this prefix. */
    public static int count(List<String> lines, String prefix) {
        int n = 0;
        for (String line : lines) {
            if (line.startsWith(prefix)) {
                n++;
            }
        }
        return n;
    }
}
