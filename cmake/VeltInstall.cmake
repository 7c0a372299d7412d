# SPDX-License-Identifier: Apache-2.0
# Copyright 2026 The Velt Conduit Authors

# What an integrator builds against: the host's interface headers, the
# reference host library and its headers, the CMake package Velt (targets
# Velt::hostapi, Velt::host and Velt::host_static, with a version file) and
# the pkg-config files velt-hostapi and velt-host. Every destination comes
# from GNUInstallDirs; the plug-in folder is VELT_INSTALL_PLUGINDIR.
include(CMakePackageConfigHelpers)
include(VeltComponents)

set(VELT_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/Velt)
set(VELT_INSTALL_PKGCONFIGDIR ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

install(TARGETS velt_hostapi EXPORT VeltTargets)
install(DIRECTORY ${PROJECT_SOURCE_DIR}/hostapi/
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velt/hostapi COMPONENT development
  FILES_MATCHING PATTERN "*.h")
install(EXPORT VeltTargets NAMESPACE Velt::
  DESTINATION ${VELT_INSTALL_CMAKEDIR} COMPONENT development)

configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/templates/VeltConfig.cmake.in
  ${PROJECT_BINARY_DIR}/VeltConfig.cmake
  INSTALL_DESTINATION ${VELT_INSTALL_CMAKEDIR}
  PATH_VARS VELT_INSTALL_PLUGINDIR)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/VeltConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/VeltConfig.cmake ${PROJECT_BINARY_DIR}/VeltConfigVersion.cmake
  DESTINATION ${VELT_INSTALL_CMAKEDIR} COMPONENT development)

# The pkg-config files find the prefix from their own folder, so an install
# can be moved as a whole.
file(RELATIVE_PATH VELT_PKGCONFIG_TO_PREFIX
  /prefix/${VELT_INSTALL_PKGCONFIGDIR} /prefix)
set(pc_names velt-hostapi)
if(VELT_BUILD_HOST)
  list(APPEND pc_names velt-host)
endif()
foreach(name IN LISTS pc_names)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/templates/${name}.pc.in
    ${PROJECT_BINARY_DIR}/pkgconfig/${name}.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/pkgconfig/${name}.pc
    DESTINATION ${VELT_INSTALL_PKGCONFIGDIR} COMPONENT development)
endforeach()

# Each Debian package's documentation folder holds its copyright file and
# change log; the plug-in's also holds the licence, the README and docs/.
foreach(component IN LISTS VELT_COMPONENTS)
  velt_package_name(${component} package)
  velt_package_documents(${component} ${package})
endforeach()
install(FILES ${PROJECT_SOURCE_DIR}/LICENSE ${PROJECT_SOURCE_DIR}/README.md
    ${PROJECT_SOURCE_DIR}/CHANGELOG.md
  DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${VELT_PACKAGE_plugin} COMPONENT plugin)
install(DIRECTORY ${PROJECT_SOURCE_DIR}/docs/
  DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/${VELT_PACKAGE_plugin}/docs COMPONENT plugin)
