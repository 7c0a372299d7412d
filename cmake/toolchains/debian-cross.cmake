# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Shared part of the toolchain files for Debian's cross compilers
# (g++-<triplet>, from the Debian packages g++-aarch64-linux-gnu and
# g++-arm-linux-gnueabihf). The including file sets VELT_CROSS_TRIPLET,
# CMAKE_SYSTEM_PROCESSOR and VELT_CROSS_QEMU.
#
# Only the target's C and C++ runtimes are needed, which the cross compiler
# packages bring under /usr/<triplet>. Target programs (the tests) run under
# qemu-user with that folder as their root for the dynamic loader; programs
# that run at build time (the description generator) are built for the build
# machine instead (see VeltGenerator.cmake).
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_C_COMPILER ${VELT_CROSS_TRIPLET}-gcc)
set(CMAKE_CXX_COMPILER ${VELT_CROSS_TRIPLET}-g++)
set(CMAKE_LIBRARY_ARCHITECTURE ${VELT_CROSS_TRIPLET})

set(CMAKE_FIND_ROOT_PATH /usr/${VELT_CROSS_TRIPLET})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

find_program(VELT_QEMU_PROGRAM ${VELT_CROSS_QEMU})
if(VELT_QEMU_PROGRAM)
  set(CMAKE_CROSSCOMPILING_EMULATOR ${VELT_QEMU_PROGRAM} -L /usr/${VELT_CROSS_TRIPLET})
endif()
