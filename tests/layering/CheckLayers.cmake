# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Keeps the plug-in's layers pointing one way. Run as
#   cmake -DROOT=<source tree> -P CheckLayers.cmake
# It reads every #include of ROOT/src and ROOT/hostapi and fails, naming the
# file and line, when an include runs back up, names a folder of src/ that
# has no layer, does not resolve to a file of the tree, or names a system
# header that is not part of the C++ standard library (the plug-in depends
# on hostapi/ and the standard library only).
#
# The layers, from the top down; a folder may include its own layer and the
# ones below it:
#   4 factory/                      the entry point, the factories, the module
#   3 driver/                       the token channel driver
#   2 protlib/, config/, memory/    the framework, configuration, memory model
#   1 binding/                      the host service pointers, CompareInterface
#   0 hostapi/                      the host's interfaces
# A quoted include is resolved as the compiler does: beside the including
# file first, then in src/, then in hostapi/.

cmake_minimum_required(VERSION 3.20)

if(NOT DEFINED ROOT)
  message(FATAL_ERROR "CheckLayers: pass -DROOT=<source tree>")
endif()
get_filename_component(ROOT "${ROOT}" REALPATH)

set(rank_factory 4)
set(rank_driver 3)
set(rank_protlib 2)
set(rank_config 2)
set(rank_memory 2)
set(rank_binding 1)
set(rank_hostapi 0)

set(STANDARD_HEADERS
  algorithm any array atomic bitset cassert ccomplex cctype cerrno cfenv cfloat
  charconv chrono cinttypes ciso646 climits clocale cmath codecvt complex
  condition_variable csetjmp csignal cstdalign cstdarg cstdbool cstddef cstdint
  cstdio cstdlib cstring ctgmath ctime cuchar cwchar cwctype deque exception
  execution filesystem forward_list fstream functional future initializer_list
  iomanip ios iosfwd iostream istream iterator limits list locale map memory
  memory_resource mutex new numeric optional ostream queue random ratio regex
  scoped_allocator set shared_mutex sstream stack stdexcept streambuf string
  string_view strstream system_error thread tuple type_traits typeindex typeinfo
  unordered_map unordered_set utility valarray variant vector)

set(violations 0)

# The layer folder of a file of the tree: "hostapi", or the first folder
# under src/. Empty for a file elsewhere.
function(folder_of path out)
  file(RELATIVE_PATH relative "${ROOT}" "${path}")
  if(relative MATCHES "^hostapi/")
    set(${out} hostapi PARENT_SCOPE)
  elseif(relative MATCHES "^src/([^/]+)/")
    set(${out} "${CMAKE_MATCH_1}" PARENT_SCOPE)
  else()
    set(${out} "" PARENT_SCOPE)
  endif()
endfunction()

function(report where text)
  message("${where}: ${text}")
  math(EXPR count "${violations} + 1")
  set(violations ${count} PARENT_SCOPE)
endfunction()

# The file a quoted include names, or empty when it names none.
function(resolve including name out)
  get_filename_component(here "${including}" DIRECTORY)
  foreach(base "${here}" "${ROOT}/src" "${ROOT}/hostapi")
    if(EXISTS "${base}/${name}" AND NOT IS_DIRECTORY "${base}/${name}")
      get_filename_component(found "${base}/${name}" REALPATH)
      set(${out} "${found}" PARENT_SCOPE)
      return()
    endif()
  endforeach()
  set(${out} "" PARENT_SCOPE)
endfunction()

function(check_include file where kind name)
  folder_of("${file}" from)
  if(kind STREQUAL "<")
    if(NOT name IN_LIST STANDARD_HEADERS)
      report("${where}" "<${name}> is not a C++ standard library header")
    endif()
  else()
    resolve("${file}" "${name}" target)
    if(target STREQUAL "")
      report("${where}" "\"${name}\" resolves to no file of src/ or hostapi/")
    else()
      folder_of("${target}" to)
      if(to STREQUAL "" OR NOT DEFINED rank_${to})
        report("${where}" "\"${name}\" lies outside the layers")
      elseif(rank_${to} GREATER rank_${from})
        report("${where}" "${from}/ may not include ${to}/ (\"${name}\"), a layer above it")
      endif()
    endif()
  endif()
  set(violations ${violations} PARENT_SCOPE)
endfunction()

file(GLOB_RECURSE sources LIST_DIRECTORIES false
  "${ROOT}/src/*.h" "${ROOT}/src/*.cpp" "${ROOT}/hostapi/*.h" "${ROOT}/hostapi/*.cpp")
list(SORT sources)
if(NOT sources)
  message(FATAL_ERROR "CheckLayers: no sources under ${ROOT}/src or ${ROOT}/hostapi")
endif()

foreach(file IN LISTS sources)
  file(RELATIVE_PATH shown "${ROOT}" "${file}")
  folder_of("${file}" from)
  if(from STREQUAL "" OR NOT DEFINED rank_${from})
    report("${shown}" "lies in no layer folder")
    continue()
  endif()
  # One list item per line: the characters that would split or join CMake
  # list items are blanked first (no include name holds them).
  file(READ "${file}" text)
  string(REGEX REPLACE "[][;\\]" "_" text "${text}")
  string(REPLACE "\n" ";" lines "${text}")
  set(number 0)
  foreach(line IN LISTS lines)
    math(EXPR number "${number} + 1")
    if(line MATCHES "^[ \t]*#[ \t]*include[ \t]*([<\"])([^>\"]+)[>\"]")
      check_include("${file}" "${shown}:${number}" "${CMAKE_MATCH_1}" "${CMAKE_MATCH_2}")
    endif()
  endforeach()
endforeach()

list(LENGTH sources checked)
if(violations GREATER 0)
  message(FATAL_ERROR "CheckLayers: ${violations} finding(s): the includes break the layers")
endif()
message("CheckLayers: the includes of ${checked} files keep the layers")
