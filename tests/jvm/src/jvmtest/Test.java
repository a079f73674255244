package jvmtest;

import java.lang.annotation.Retention;
import java.lang.annotation.RetentionPolicy;

/** Marks a public no-argument method of a test class as a test. */
@Retention(RetentionPolicy.RUNTIME)
public @interface Test {}
