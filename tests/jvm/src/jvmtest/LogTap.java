package jvmtest;

import static java.nio.charset.StandardCharsets.UTF_8;

import java.nio.file.*;
import java.util.*;

/**
 * Captures the library's log lines. On Linux the library writes them to stderr as "P/tag: message" (with
 * GLIMMER_LOG_LEVEL=debug in the environment, which the test setup provides); while a capture runs, the
 * process's stderr goes to a temporary file instead. One capture at a time.
 */
public final class LogTap {
    static {
        System.loadLibrary("glimmer_logtap");
    }

    private LogTap() {}

    /** Sends stderr to the file at `path`, or back when `path` is null. */
    private static native void redirect(String path);

    /** Runs the action; returns the lines written to stderr meanwhile. */
    public static synchronized List<String> capture(Runnable action) {
        Check.isTrue("debug".equals(System.getenv("GLIMMER_LOG_LEVEL")), "run with GLIMMER_LOG_LEVEL=debug");
        try {
            Path file = Files.createTempFile("gxe-log", ".txt");
            redirect(file.toString());
            try {
                action.run();
            } finally {
                redirect(null);
            }
            List<String> lines = Arrays.asList(new String(Files.readAllBytes(file), UTF_8).split("\n"));
            Files.delete(file);
            // Anything the JVM itself said goes on to the real stderr.
            lines.stream().filter(line -> !line.matches("^[DIWE?]/.*")).forEach(System.err::println);
            return lines;
        } catch (java.io.IOException e) {
            throw new AssertionError(e);
        }
    }

    /** How many of `lines` start with this prefix. */
    public static long count(List<String> lines, String prefix) {
        return lines.stream().filter(line -> line.startsWith(prefix)).count();
    }
}
