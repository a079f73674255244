/* Test helper: sends the process's stderr to a file while a capture runs, so
   the JVM tests can read the library's log lines (stderr is unbuffered). */
#include <fcntl.h>
#include <jni.h>
#include <unistd.h>

static int savedStderr = -1;

/* To the file at `path`; back to the saved stderr when `path` is null. */
JNIEXPORT void JNICALL Java_jvmtest_LogTap_redirect(JNIEnv* env, jclass cls, jstring path) {
    (void)cls;
    if (path == NULL) {
        dup2(savedStderr, 2);
        close(savedStderr);
        return;
    }
    const char* name = (*env)->GetStringUTFChars(env, path, NULL);
    int fd = open(name, O_WRONLY | O_TRUNC);
    (*env)->ReleaseStringUTFChars(env, path, name);
    savedStderr = dup(2);
    dup2(fd, 2);
    close(fd);
}
