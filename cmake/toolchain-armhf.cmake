# Cross build for 32-bit ARM with hardware floating point. VORNJSONDB_ARMHF_SYSROOT is the folder that
# scripts/armhf-sysroot.sh made; programs run under qemu's user emulation.

set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR arm)
set(CMAKE_LIBRARY_ARCHITECTURE arm-linux-gnueabihf)
set(CMAKE_C_COMPILER arm-linux-gnueabihf-gcc)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)

# Test programs that CMake compiles for itself, and nested projects, read this file again.
if(NOT VORNJSONDB_ARMHF_SYSROOT)
    get_filename_component(VORNJSONDB_ARMHF_SYSROOT
        "${CMAKE_CURRENT_LIST_DIR}/../build/armhf-sysroot" ABSOLUTE)
endif()
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES VORNJSONDB_ARMHF_SYSROOT)

list(APPEND CMAKE_FIND_ROOT_PATH "${VORNJSONDB_ARMHF_SYSROOT}" /usr/arm-linux-gnueabihf)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

# The linker must find what the libraries need in their turn.
set(CMAKE_EXE_LINKER_FLAGS_INIT
    "-Wl,-rpath-link,${VORNJSONDB_ARMHF_SYSROOT}/usr/lib/arm-linux-gnueabihf")
set(CMAKE_CROSSCOMPILING_EMULATOR
    qemu-arm
    -L /usr/arm-linux-gnueabihf
    -E "LD_LIBRARY_PATH=${VORNJSONDB_ARMHF_SYSROOT}/usr/lib/arm-linux-gnueabihf")
