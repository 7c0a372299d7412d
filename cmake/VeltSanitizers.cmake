# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Applies the chosen sanitizer set to everything built from here on.
# "fuzzer" instruments every object for libFuzzer's coverage feedback and
# checks it with AddressSanitizer and UndefinedBehaviorSanitizer; only the
# fuzz programs link libFuzzer itself (-fsanitize=fuzzer, in fuzz/).
if(VELT_SANITIZE STREQUAL "address")
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
elseif(VELT_SANITIZE STREQUAL "thread")
  add_compile_options(-fsanitize=thread -fno-omit-frame-pointer)
  add_link_options(-fsanitize=thread)
elseif(VELT_SANITIZE STREQUAL "fuzzer")
  if(NOT CMAKE_CXX_COMPILER_ID STREQUAL "Clang")
    message(FATAL_ERROR "VELT_SANITIZE=fuzzer needs clang (libFuzzer)")
  endif()
  add_compile_options(-fsanitize=fuzzer-no-link,address,undefined -fno-sanitize-recover=all
    -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
elseif(NOT VELT_SANITIZE STREQUAL "")
  message(FATAL_ERROR
    "VELT_SANITIZE must be empty, address, thread or fuzzer, not '${VELT_SANITIZE}'")
endif()
