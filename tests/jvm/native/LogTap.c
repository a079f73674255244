/* Test helper: sends the process's stderr to a temporary file while a
   capture runs, so the JVM tests can read the library's log lines. */
#include <jni.h>
#include <stdio.h>
#include <stdlib.h>
#include <unistd.h>

static int savedStderr = -1;
static FILE* sink = NULL;

JNIEXPORT void JNICALL Java_jvmtest_LogTap_begin(JNIEnv* env, jclass cls) {
    (void)env;
    (void)cls;
    if (sink != NULL) return;
    sink = tmpfile();
    if (sink == NULL) return;
    fflush(stderr);
    savedStderr = dup(2);
    dup2(fileno(sink), 2);
}

JNIEXPORT jbyteArray JNICALL Java_jvmtest_LogTap_end(JNIEnv* env, jclass cls) {
    (void)cls;
    if (sink == NULL) return (*env)->NewByteArray(env, 0);
    fflush(stderr);
    dup2(savedStderr, 2);
    close(savedStderr);
    savedStderr = -1;
    /* fd 2 shared the file's offset: its end is what was written. */
    off_t size = lseek(fileno(sink), 0, SEEK_END);
    if (size < 0) size = 0;
    char* bytes = malloc(size > 0 ? (size_t)size : 1);
    size_t got = 0;
    if (bytes != NULL && lseek(fileno(sink), 0, SEEK_SET) == 0) {
        ssize_t n;
        while (got < (size_t)size && (n = read(fileno(sink), bytes + got, (size_t)size - got)) > 0) got += (size_t)n;
    }
    fclose(sink);
    sink = NULL;
    jbyteArray result = (*env)->NewByteArray(env, (jsize)got);
    if (result != NULL && got > 0) (*env)->SetByteArrayRegion(env, result, 0, (jsize)got, (const jbyte*)bytes);
    free(bytes);
    return result;
}
