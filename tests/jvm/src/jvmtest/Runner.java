package jvmtest;

import java.lang.reflect.*;
import java.util.*;

/**
 * Runs the tests of the classes named on the command line, in that order: every public method without
 * parameters that a class declares (not static), by name, each on a fresh instance. Prints one line per
 * test and a summary; exits with 1 when a test failed.
 */
public final class Runner {
    public static void main(String[] args) throws ReflectiveOperationException {
        int passed = 0;
        List<String> failures = new ArrayList<>();
        for (String name : args) {
            Class<?> suite = Class.forName(name);
            Method[] tests = Arrays.stream(suite.getDeclaredMethods()).filter(m -> Modifier.isPublic(m.getModifiers())
                    && !Modifier.isStatic(m.getModifiers()) && m.getParameterCount() == 0)
                    .sorted(Comparator.comparing(Method::getName)).toArray(Method[]::new);
            for (Method m : tests) {
                String id = suite.getSimpleName() + "." + m.getName();
                try {
                    m.invoke(suite.getDeclaredConstructor().newInstance());
                    passed++;
                    System.out.println("[  OK  ] " + id);
                } catch (InvocationTargetException e) {
                    failures.add(id + ": " + e.getCause());
                    System.out.println("[ FAIL ] " + id);
                    e.getCause().printStackTrace(System.out);
                }
            }
        }
        failures.forEach(f -> System.out.println("FAILED: " + f));
        System.out.println("jvm tests: " + passed + " passed, " + failures.size() + " failed");
        System.exit(failures.isEmpty() && passed > 0 ? 0 : 1);
    }
}
