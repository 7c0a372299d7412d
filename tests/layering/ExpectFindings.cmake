# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Proves that CheckLayers.cmake can fail: runs it on a tree whose includes
# break the layers in every way it knows and compares its report, line for
# line, with the expected one. Run as
#   cmake -DCHECK=<CheckLayers.cmake> -DROOT=<broken tree>
#         -DEXPECTED=<expected report> -P ExpectFindings.cmake
cmake_minimum_required(VERSION 3.20)

foreach(argument CHECK ROOT EXPECTED)
  if(NOT DEFINED ${argument})
    message(FATAL_ERROR "ExpectFindings: pass -D${argument}=...")
  endif()
endforeach()

execute_process(
  COMMAND ${CMAKE_COMMAND} -DROOT=${ROOT} -P ${CHECK}
  RESULT_VARIABLE result
  OUTPUT_VARIABLE output
  ERROR_VARIABLE output)
if(result EQUAL 0)
  message(FATAL_ERROR "ExpectFindings: the check passed a tree that breaks the layers:\n${output}")
endif()

# CMake names the script and line of its error; only the findings matter.
string(REGEX REPLACE "CMake Error at [^\n]*CheckLayers.cmake:[0-9]+" "CMake Error at CHECK:LINE"
       output "${output}")
string(STRIP "${output}" output)
file(READ "${EXPECTED}" expected)
string(STRIP "${expected}" expected)
if(NOT output STREQUAL expected)
  message(FATAL_ERROR "ExpectFindings: the report differs.\nExpected:\n${expected}\nGot:\n${output}")
endif()
message("ExpectFindings: the check reports every broken include of the tree")
