// fontconfig 2.14 loses a few hundred bytes while parsing its XML
// configuration (once per process, inside FcInit); without frame pointers in
// the library the leak's stack stops at it, so it is matched by library.
// Linked into the test programs that reach the system's fonts.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
