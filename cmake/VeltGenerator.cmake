# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# The description generator velt-xmlblock runs at build time, so it is always
# a program for the build machine, never run through an emulator:
# - VELT_XMLBLOCK_EXECUTABLE names one that is already built;
# - a native build builds it as the target velt-xmlblock;
# - a cross build builds it for the build machine as an external project
#   from tools/xmlblock, with the build machine's compiler and zlib.
# Sets VELT_XMLBLOCK_COMMAND (what to run) and VELT_XMLBLOCK_DEPENDS (what the
# generated source depends on), and VELT_BUILD_XMLBLOCK when the target
# velt-xmlblock is part of this build.
set(VELT_BUILD_XMLBLOCK OFF)
if(VELT_XMLBLOCK_EXECUTABLE)
  if(NOT EXISTS "${VELT_XMLBLOCK_EXECUTABLE}")
    message(FATAL_ERROR "VELT_XMLBLOCK_EXECUTABLE: no file ${VELT_XMLBLOCK_EXECUTABLE}")
  endif()
  set(VELT_XMLBLOCK_COMMAND "${VELT_XMLBLOCK_EXECUTABLE}")
  set(VELT_XMLBLOCK_DEPENDS "${VELT_XMLBLOCK_EXECUTABLE}")
elseif(CMAKE_CROSSCOMPILING)
  include(ExternalProject)
  set(VELT_NATIVE_CXX_COMPILER "c++" CACHE STRING
    "The build machine's C++ compiler, for the description generator of a cross build")
  set(native_dir ${CMAKE_BINARY_DIR}/native-xmlblock)
  ExternalProject_Add(velt_native_xmlblock
    SOURCE_DIR ${PROJECT_SOURCE_DIR}/tools/xmlblock
    BINARY_DIR ${native_dir}
    CMAKE_ARGS -DCMAKE_BUILD_TYPE=Release -DCMAKE_CXX_COMPILER=${VELT_NATIVE_CXX_COMPILER}
               -DVELT_WERROR=${VELT_WERROR}
    INSTALL_COMMAND ""
    BUILD_BYPRODUCTS ${native_dir}/velt-xmlblock)
  set(VELT_XMLBLOCK_COMMAND ${native_dir}/velt-xmlblock)
  set(VELT_XMLBLOCK_DEPENDS velt_native_xmlblock)
else()
  set(VELT_BUILD_XMLBLOCK ON)
  set(VELT_XMLBLOCK_COMMAND velt-xmlblock)
  set(VELT_XMLBLOCK_DEPENDS velt-xmlblock)
endif()
