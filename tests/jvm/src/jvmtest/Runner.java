package jvmtest;

import java.lang.reflect.InvocationTargetException;
import java.lang.reflect.Method;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.Comparator;
import java.util.List;

/**
 * Runs the @Test methods of the classes named on the command line, in that class order and by method
 * name within a class, each on a fresh instance. Prints one line per test and a summary; exits with 1
 * when a test failed.
 */
public final class Runner {
    public static void main(String[] args) throws ClassNotFoundException {
        int passed = 0;
        List<String> failures = new ArrayList<>();
        for (String name : args) {
            Class<?> suite = Class.forName(name);
            Method[] tests = suite.getMethods();
            Arrays.sort(tests, Comparator.comparing(Method::getName));
            for (Method m : tests) {
                if (!m.isAnnotationPresent(Test.class)) {
                    continue;
                }
                String id = suite.getSimpleName() + "." + m.getName();
                try {
                    m.invoke(suite.getDeclaredConstructor().newInstance());
                    passed++;
                    System.out.println("[  OK  ] " + id);
                } catch (ReflectiveOperationException e) {
                    Throwable cause = e instanceof InvocationTargetException ? e.getCause() : e;
                    failures.add(id + ": " + cause);
                    System.out.println("[ FAIL ] " + id);
                    cause.printStackTrace(System.out);
                }
            }
        }
        failures.forEach(f -> System.out.println("FAILED: " + f));
        System.out.println("jvm tests: " + passed + " passed, " + failures.size() + " failed");
        System.exit(failures.isEmpty() && passed > 0 ? 0 : 1);
    }
}
