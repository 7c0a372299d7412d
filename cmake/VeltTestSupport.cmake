# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# The test doubles of tests/support (fake host services, memory protocol,
# allocation counter, loopback helpers) for programs outside the test tree:
# benchmarks and fuzz targets. They come with the tests; a build without the
# tests adds them on their own.
function(velt_require_test_support)
  if(NOT TARGET velt_test_support)
    add_subdirectory(${PROJECT_SOURCE_DIR}/tests/support ${PROJECT_BINARY_DIR}/test-support)
  endif()
endfunction()
