# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Fails unless the library LIB defines exactly one dynamic symbol:
# GetInterfaceFactory, as an unmangled function.
execute_process(COMMAND ${NM} -D --defined-only ${LIB}
  OUTPUT_VARIABLE symbols RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "nm failed on ${LIB}")
endif()
string(STRIP "${symbols}" symbols)
string(REPLACE "\n" ";" lines "${symbols}")
list(LENGTH lines count)
if(NOT count EQUAL 1)
  message(FATAL_ERROR "expected one exported symbol, found ${count}:\n${symbols}")
endif()
if(NOT symbols MATCHES "^[0-9a-f]+ T GetInterfaceFactory$")
  message(FATAL_ERROR "the one exported symbol is not GetInterfaceFactory: ${symbols}")
endif()
message(STATUS "exports: ${symbols}")
