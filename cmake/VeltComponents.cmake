# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# The install components of this build and the Debian package of each:
#   plugin       velt-conduit         the plug-in, its licence and documentation
#   libraries    libvelt-host1        the shared reference host library
#   development  velt-conduit-dev     headers, static library, CMake and pkg-config files
#   tools        velt-conduit-tools   velt-host and velt-peer with their manual pages
#   debug        velt-conduit-dbgsym  the plug-in's debug information
set(VELT_PACKAGE_MAINTAINER "The Velt Conduit Authors <authors@velt-conduit.invalid>" CACHE STRING
  "The maintainer named in the Debian packages")
set(VELT_PACKAGE_plugin velt-conduit)
set(VELT_PACKAGE_libraries libvelt-host${PROJECT_VERSION_MAJOR})
set(VELT_PACKAGE_development velt-conduit-dev)
set(VELT_PACKAGE_tools velt-conduit-tools)
set(VELT_PACKAGE_debug velt-conduit-dbgsym)

set(VELT_COMPONENTS plugin development debug)
if(VELT_BUILD_HOST)
  list(APPEND VELT_COMPONENTS libraries)
endif()
if(VELT_BUILD_TOOLS)
  list(APPEND VELT_COMPONENTS tools)
endif()

function(velt_package_name component out)
  set(${out} ${VELT_PACKAGE_${component}} PARENT_SCOPE)
endfunction()

# The Debian copyright file and the Debian change log (compressed) of one
# package, in its documentation folder.
function(velt_package_documents component package)
  set(dir ${PROJECT_BINARY_DIR}/package-documents/${package})
  configure_file(${PROJECT_SOURCE_DIR}/cmake/templates/copyright.in ${dir}/copyright @ONLY)
  velt_release_date(date)
  set(VELT_PACKAGE_NAME ${package})
  configure_file(${PROJECT_SOURCE_DIR}/cmake/templates/changelog.in ${dir}/changelog @ONLY)
  # gzip -n: no name or time stamp, so the same text gives the same bytes.
  find_program(VELT_GZIP gzip REQUIRED)
  execute_process(COMMAND ${VELT_GZIP} -9 -n -c ${dir}/changelog
    OUTPUT_FILE ${dir}/changelog.gz RESULT_VARIABLE rc)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "gzip failed on ${dir}/changelog")
  endif()
  install(FILES ${dir}/copyright ${dir}/changelog.gz
    DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${package} COMPONENT ${component})
endfunction()

# The date of this version's entry in CHANGELOG.md ("## [X.Y.Z] - YYYY-MM-DD")
# in the form of a Debian change log ("Mon, 23 Nov 2026 00:00:00 +0000").
function(velt_release_date out)
  file(STRINGS ${PROJECT_SOURCE_DIR}/CHANGELOG.md entries REGEX "^## \\[")
  set(pattern "^## \\[${PROJECT_VERSION}\\] - ([0-9][0-9][0-9][0-9])-([0-9][0-9])-([0-9][0-9])$")
  foreach(entry IN LISTS entries)
    if(entry MATCHES "${pattern}")
      set(year ${CMAKE_MATCH_1})
      math(EXPR month "1${CMAKE_MATCH_2} - 100")
      math(EXPR day "1${CMAKE_MATCH_3} - 100")
      set(day_text ${CMAKE_MATCH_3})
    endif()
  endforeach()
  if(NOT DEFINED year)
    message(FATAL_ERROR "CHANGELOG.md has no entry \"## [${PROJECT_VERSION}] - YYYY-MM-DD\"")
  endif()
  # Zeller's congruence gives the day of the week (0 = Saturday).
  set(m ${month})
  set(y ${year})
  if(m LESS 3)
    math(EXPR m "${m} + 12")
    math(EXPR y "${y} - 1")
  endif()
  math(EXPR weekday "(${day} + (13 * (${m} + 1)) / 5 + ${y} + ${y} / 4 - ${y} / 100 + ${y} / 400) % 7")
  set(weekdays Sat Sun Mon Tue Wed Thu Fri)
  set(months Jan Feb Mar Apr May Jun Jul Aug Sep Oct Nov Dec)
  list(GET weekdays ${weekday} weekday_name)
  math(EXPR month_index "${month} - 1")
  list(GET months ${month_index} month_name)
  set(${out} "${weekday_name}, ${day_text} ${month_name} ${year} 00:00:00 +0000" PARENT_SCOPE)
endfunction()
