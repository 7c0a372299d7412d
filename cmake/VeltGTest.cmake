# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# GoogleTest for the test programs: Debian's installed libraries, or, for a
# target without them (a cross build), compiled here from the source tree
# that Debian's googletest package installs under /usr/src/googletest.
if(VELT_GTEST_SOURCE_DIR)
  set(INSTALL_GTEST OFF CACHE BOOL "Install GoogleTest with the project" FORCE)
  set(BUILD_GMOCK ON CACHE BOOL "Build GoogleMock" FORCE)
  add_subdirectory(${VELT_GTEST_SOURCE_DIR} ${PROJECT_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
  # The names find_package(GTest) gives; recent GoogleTest defines them itself.
  foreach(library gtest gtest_main gmock gmock_main)
    if(NOT TARGET GTest::${library})
      add_library(GTest::${library} ALIAS ${library})
    endif()
  endforeach()
else()
  find_package(GTest REQUIRED)
endif()
