# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Fails unless the ELF file LIB needs the C library alone: no DT_NEEDED entry
# but libc.so.6, libm.so.6 and the dynamic loader, and no version reference
# but GLIBC_x.y (no GLIBCXX_, CXXABI_ or GCC_), none newer than GLIBC_CEILING.
# OBJDUMP is the target's objdump.
execute_process(COMMAND ${OBJDUMP} -p ${LIB}
  OUTPUT_VARIABLE dump ERROR_VARIABLE errors RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "objdump failed on ${LIB}: ${errors}")
endif()

string(REGEX MATCHALL "NEEDED[ \t]+[^\n]+" entries "${dump}")
if(entries STREQUAL "")
  message(FATAL_ERROR "no DT_NEEDED entries found in ${LIB}; cannot check it")
endif()
foreach(entry IN LISTS entries)
  string(REGEX REPLACE "^NEEDED[ \t]+" "" name "${entry}")
  string(STRIP "${name}" name)
  if(NOT name MATCHES "^(libc[.]so[.]6|libm[.]so[.]6|ld-linux[-a-z0-9_.]*[.]so[.][0-9]+)$")
    message(FATAL_ERROR "${LIB} needs ${name}")
  endif()
endforeach()

# The version references: "0x0d696914 0x00 02 GLIBC_2.34" lines.
string(REGEX MATCHALL "0x[0-9a-f]+ 0x[0-9a-f]+ [0-9]+ [A-Za-z_]+[0-9.]*" references "${dump}")
set(highest "0")
foreach(reference IN LISTS references)
  string(REGEX REPLACE "^.* " "" version "${reference}")
  if(NOT version MATCHES "^GLIBC_([0-9.]+)$")
    message(FATAL_ERROR "${LIB} needs the symbol version ${version}")
  endif()
  if(CMAKE_MATCH_1 VERSION_GREATER highest)
    set(highest ${CMAKE_MATCH_1})
  endif()
endforeach()
if(highest STREQUAL "0")
  message(FATAL_ERROR "no GLIBC version reference found in ${LIB}; cannot check it")
endif()
if(highest VERSION_GREATER CEILING)
  message(FATAL_ERROR "${LIB} needs GLIBC_${highest}, newer than GLIBC_${CEILING}")
endif()
message(STATUS "${LIB} needs only glibc, at most GLIBC_${CEILING} (newest used: GLIBC_${highest})")
