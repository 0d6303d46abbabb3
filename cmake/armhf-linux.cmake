# Cross-compiling for the gateway's target, 32-bit ARM Linux (Debian's
# armhf), with the distribution's cross compiler and the multiarch :armhf
# packages of the libraries. Tests run under qemu-user with the multiarch
# root as its prefix ("-L /"), so that the loader and libc come from the
# same glibc build as the armhf libraries.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_C_COMPILER arm-linux-gnueabihf-gcc)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_LIBRARY_ARCHITECTURE arm-linux-gnueabihf)
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L /)

# pkg-config must answer for the target, not the build machine.
set(ENV{PKG_CONFIG_LIBDIR} /usr/lib/arm-linux-gnueabihf/pkgconfig:/usr/share/pkgconfig)
set(ENV{PKG_CONFIG_PATH} "")
