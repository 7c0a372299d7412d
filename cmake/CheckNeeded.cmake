# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Fails when the ELF file LIB records a DT_NEEDED entry that matches the
# regular expression FORBID, so that a library only the build tools use (zlib)
# cannot leak into the plug-in. OBJDUMP is the objdump program to read it with.
execute_process(COMMAND ${OBJDUMP} -p ${LIB}
  OUTPUT_VARIABLE dump ERROR_VARIABLE errors RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "objdump failed on ${LIB}: ${errors}")
endif()
string(REGEX MATCHALL "NEEDED[ \t]+[^\n]+" entries "${dump}")
set(needed "")
foreach(entry IN LISTS entries)
  string(REGEX REPLACE "^NEEDED[ \t]+" "" name "${entry}")
  string(STRIP "${name}" name)
  list(APPEND needed "${name}")
endforeach()
# Every shared object needs at least the C library; finding nothing means the
# dump was not understood, and the check must not pass by accident.
if(needed STREQUAL "")
  message(FATAL_ERROR "no DT_NEEDED entries found in ${LIB}; cannot check it")
endif()
foreach(name IN LISTS needed)
  if(name MATCHES "${FORBID}")
    message(FATAL_ERROR "${LIB} needs forbidden library ${name}")
  endif()
endforeach()
message(STATUS "needed: ${needed}")
