package jvmtest;

import java.lang.reflect.InvocationTargetException;
import java.lang.reflect.Method;
import java.util.ArrayList;
import java.util.Comparator;
import java.util.List;

/**
 * Runs the @Test methods of the classes named on the command line, in that class order and by method
 * name within a class, each on a fresh instance. Prints one line per test and a summary; exits with 1
 * when a test failed.
 */
public final class Runner {
    public static void main(String[] args) {
        int passed = 0;
        List<String> failures = new ArrayList<>();
        for (String name : args) {
            Class<?> suite;
            try {
                suite = Class.forName(name);
            } catch (ClassNotFoundException e) {
                failures.add(name + ": no such class");
                continue;
            }
            List<Method> tests = new ArrayList<>();
            for (Method m : suite.getMethods()) {
                if (m.isAnnotationPresent(Test.class)) {
                    tests.add(m);
                }
            }
            tests.sort(Comparator.comparing(Method::getName));
            for (Method m : tests) {
                String id = suite.getSimpleName() + "." + m.getName();
                try {
                    m.invoke(suite.getDeclaredConstructor().newInstance());
                    passed++;
                    System.out.println("[  OK  ] " + id);
                } catch (InvocationTargetException e) {
                    Throwable cause = e.getCause();
                    failures.add(id + ": " + cause);
                    System.out.println("[ FAIL ] " + id);
                    cause.printStackTrace(System.out);
                } catch (ReflectiveOperationException e) {
                    failures.add(id + ": " + e);
                    System.out.println("[ FAIL ] " + id + ": " + e);
                }
            }
        }
        System.out.println();
        for (String f : failures) {
            System.out.println("FAILED: " + f);
        }
        System.out.println("jvm tests: " + passed + " passed, " + failures.size() + " failed");
        System.out.flush();
        System.exit(failures.isEmpty() && passed > 0 ? 0 : 1);
    }
}
