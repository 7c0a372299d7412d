# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# armhf (32-bit ARMv7, hard-float) panels, with Debian's
# g++-arm-linux-gnueabihf; the tests run under qemu-arm.
set(CMAKE_SYSTEM_PROCESSOR armv7l)
set(VELT_CROSS_TRIPLET arm-linux-gnueabihf)
set(VELT_CROSS_QEMU qemu-arm)
include(${CMAKE_CURRENT_LIST_DIR}/debian-cross.cmake)
