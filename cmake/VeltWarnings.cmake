# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# Warning flags shared by every target of the project.
add_library(velt_warnings INTERFACE)
target_compile_options(velt_warnings INTERFACE -Wall -Wextra -Wpedantic -Wshadow
  -Wnon-virtual-dtor -Woverloaded-virtual -Wcast-align -Wformat=2)
if(VELT_WERROR)
  target_compile_options(velt_warnings INTERFACE -Werror)
endif()
