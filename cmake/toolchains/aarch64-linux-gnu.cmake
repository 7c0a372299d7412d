# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# arm64 (AArch64) panels, with Debian's g++-aarch64-linux-gnu; the tests run
# under qemu-aarch64.
set(CMAKE_SYSTEM_PROCESSOR aarch64)
set(VELT_CROSS_TRIPLET aarch64-linux-gnu)
set(VELT_CROSS_QEMU qemu-aarch64)
include(${CMAKE_CURRENT_LIST_DIR}/debian-cross.cmake)
