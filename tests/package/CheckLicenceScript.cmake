# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# The licence header script on a small tree of its own in WORK: --check must
# name exactly the files without the header and fail, --fix must add it in
# each file's comment syntax (below a #! line) and touch nothing else, and
# --check must then pass. SCRIPT is scripts/licence-headers.sh.
cmake_policy(VERSION 3.20)
file(REMOVE_RECURSE ${WORK})
file(WRITE ${WORK}/src/Plain.cpp "#include \"Plain.h\"\n")
file(WRITE ${WORK}/src/Done.h
  "// SPDX-License-Identifier: Apache-2.0\n// Copyright 2026 The Velt Conduit Authors\n\n#pragma once\n")
file(WRITE ${WORK}/scripts/run.sh "#!/bin/sh\necho run\n")
file(WRITE ${WORK}/CMakeLists.txt "project(x)\n")
file(WRITE ${WORK}/src/plugin.map "{ local: *; };\n")
file(WRITE ${WORK}/docs/guide.md "# Guide\n")
file(WRITE ${WORK}/build/Generated.cpp "int x;\n")

function(run_script mode expected_rc out)
  execute_process(COMMAND sh ${SCRIPT} ${mode} ${WORK} RESULT_VARIABLE rc
    OUTPUT_VARIABLE stdout ERROR_VARIABLE stderr)
  if(NOT rc EQUAL expected_rc)
    message(FATAL_ERROR "${mode}: exit ${rc}, expected ${expected_rc}\n${stdout}${stderr}")
  endif()
  set(${out} "${stdout}${stderr}" PARENT_SCOPE)
endfunction()

function(expect_file path expected)
  file(READ ${WORK}/${path} content)
  if(NOT content STREQUAL expected)
    message(FATAL_ERROR "${path}:\n${content}\nexpected:\n${expected}")
  endif()
endfunction()

run_script(--check 1 report)
set(expected_report "licence: no header in CMakeLists.txt
licence: no header in scripts/run.sh
licence: no header in src/Plain.cpp
licence: no header in src/plugin.map
licence: 4 of 5 source files lack the header; run make licence-fix
")
# find lists in directory order; compare sorted lines.
string(REPLACE "\n" ";" lines "${report}")
list(SORT lines)
string(REPLACE "\n" ";" expected_lines "${expected_report}")
list(SORT expected_lines)
if(NOT lines STREQUAL expected_lines)
  message(FATAL_ERROR "--check reported:\n${report}")
endif()

run_script(--fix 0 ignored)
set(spdx "SPDX-License-Identifier: Apache-2.0")
set(owner "Copyright 2026 The Velt Conduit Authors")
expect_file(src/Plain.cpp "// ${spdx}\n// ${owner}\n\n#include \"Plain.h\"\n")
expect_file(src/Done.h "// ${spdx}\n// ${owner}\n\n#pragma once\n")
expect_file(scripts/run.sh "#!/bin/sh\n# ${spdx}\n# ${owner}\n\necho run\n")
expect_file(CMakeLists.txt "# ${spdx}\n# ${owner}\n\nproject(x)\n")
expect_file(src/plugin.map "/* ${spdx}\n   ${owner} */\n\n{ local: *; };\n")
expect_file(docs/guide.md "# Guide\n")
expect_file(build/Generated.cpp "int x;\n")

run_script(--check 0 report)
if(NOT report STREQUAL "licence headers are present in all 5 source files\n")
  message(FATAL_ERROR "--check after --fix: ${report}")
endif()
