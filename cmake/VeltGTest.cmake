# GoogleTest for the test programs: Debian's installed libraries, or, for a
# target without them (a cross build), compiled here from the source tree
# that Debian's googletest package installs under /usr/src/googletest.
if(VELT_GTEST_SOURCE_DIR)
  set(INSTALL_GTEST OFF CACHE BOOL "Install GoogleTest with the project" FORCE)
  set(BUILD_GMOCK ON CACHE BOOL "Build GoogleMock" FORCE)
  add_subdirectory(${VELT_GTEST_SOURCE_DIR} ${PROJECT_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
  foreach(library gtest gtest_main gmock gmock_main)
    add_library(GTest::${library} ALIAS ${library})
  endforeach()
else()
  find_package(GTest REQUIRED)
endif()
