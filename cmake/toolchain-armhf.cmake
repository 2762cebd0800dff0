# Cross build for armhf receivers with Debian's arm-linux-gnueabihf compilers
# (g++-arm-linux-gnueabihf). Programs built for the target, the tests among them, run
# through qemu-user with the target's libraries: ctest and test discovery use
# CMAKE_CROSSCOMPILING_EMULATOR. scripts/test-cross.sh armhf builds and runs the
# whole test suite this way.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)

set(RAVEL_CROSS_TRIPLE arm-linux-gnueabihf)
set(CMAKE_C_COMPILER ${RAVEL_CROSS_TRIPLE}-gcc)
set(CMAKE_CXX_COMPILER ${RAVEL_CROSS_TRIPLE}-g++)

set(RAVEL_CROSS_SYSROOT /usr/${RAVEL_CROSS_TRIPLE})
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L ${RAVEL_CROSS_SYSROOT})

# Libraries of the target only (GoogleTest comes from a prefix built for the
# target: the caller gives GTest_DIR); programs of the host. Headers and CMake
# packages are looked for on the host too: the tools' JSON and command-line
# libraries are header-only and serve any target.
list(APPEND CMAKE_FIND_ROOT_PATH ${RAVEL_CROSS_SYSROOT})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE BOTH)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE BOTH)
