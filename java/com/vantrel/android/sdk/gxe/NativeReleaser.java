package com.vantrel.android.sdk.gxe;

import java.lang.ref.PhantomReference;
import java.lang.ref.ReferenceQueue;
import java.util.Set;
import java.util.concurrent.ConcurrentHashMap;

/**
 * Runs a release action once its owner has become unreachable, on a daemon thread of its own: the safety
 * net for native state whose owner was never closed, without a finaliser.
 *
 * <p>The owner is watched through a phantom reference, so the action must not reach it (it holds what it
 * needs itself) and runs after the owner is gone for good. {@code java.lang.ref.Cleaner} does the same
 * from Java 9 and Android 13 on; this works on every version the library is built for.
 */
final class NativeReleaser {
    private static final ReferenceQueue<Object> QUEUE = new ReferenceQueue<>();
    /** Registrations whose action has neither run nor been forgotten; keeps them reachable meanwhile. */
    private static final Set<Registration> PENDING = ConcurrentHashMap.newKeySet();
    private static Thread thread; // guarded by NativeReleaser.class

    private NativeReleaser() {}

    /** One owner's action. */
    static final class Registration extends PhantomReference<Object> {
        private final Runnable action;

        Registration(Object owner, Runnable action) {
            super(owner, QUEUE);
            this.action = action;
        }

        /** The owner released its state itself: the action will not run. */
        void forget() {
            if (PENDING.remove(this)) {
                clear();
            }
        }

        private void runOnce() {
            if (PENDING.remove(this)) {
                action.run();
            }
        }
    }

    /** Runs {@code action} once {@code owner} is unreachable, unless the registration is forgotten first. */
    static Registration register(Object owner, Runnable action) {
        Registration registration = new Registration(owner, action);
        PENDING.add(registration);
        startThread();
        return registration;
    }

    /** How many registrations wait for their owner to go (for tests). */
    static int pending() {
        return PENDING.size();
    }

    private static synchronized void startThread() {
        if (thread != null && thread.isAlive()) {
            return;
        }
        thread = new Thread(NativeReleaser::serve, "gxe-releaser");
        thread.setDaemon(true);
        thread.start();
    }

    private static void serve() {
        while (true) {
            try {
                ((Registration) QUEUE.remove()).runOnce();
            } catch (InterruptedException e) {
                // Nothing is meant to stop this thread: keep serving.
            } catch (RuntimeException e) {
                // An action that failed must not take the others with it.
            }
        }
    }
}
