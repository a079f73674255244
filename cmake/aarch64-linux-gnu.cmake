# Cross build for 64-bit Arm with Debian's cross toolchain; binaries run under
# qemu-aarch64 so CTest can execute them on an x86-64 machine.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR aarch64)
set(CMAKE_C_COMPILER aarch64-linux-gnu-gcc)
set(CMAKE_CXX_COMPILER aarch64-linux-gnu-g++)
# The cross toolchain's own root, then the system root for Debian's arm64
# builds of the text stack, which live in the multiarch folders
# (/usr/lib/aarch64-linux-gnu, headers in /usr/include).
set(CMAKE_FIND_ROOT_PATH /usr/aarch64-linux-gnu /)
set(ENV{PKG_CONFIG_LIBDIR} /usr/lib/aarch64-linux-gnu/pkgconfig:/usr/share/pkgconfig)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
# The emulator uses the multiarch loader and C library (libc6:arm64, pulled in
# by the arm64 -dev packages): mixing the cross toolchain's older loader with
# that newer libc makes pthread_create spin forever under qemu.
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-aarch64 -L /)
