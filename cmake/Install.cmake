# Installs the library for find_package(Korvex) and for pkg-config; both say the same.
include(CMakePackageConfigHelpers)

install(TARGETS korvex EXPORT KorvexTargets)
install(DIRECTORY include/korvex DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(KORVEX_XMLWRAPP STREQUAL "compat")
  install(DIRECTORY compat/xmlwrapp/include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/korvex-compat)
endif()

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/Korvex)
install(EXPORT KorvexTargets NAMESPACE Korvex:: DESTINATION ${package_dir})
configure_package_config_file(cmake/KorvexConfig.cmake.in ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfig.cmake
  INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/KorvexConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES
  ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfigVersion.cmake
  DESTINATION ${package_dir})

# Whoever links a static library links what it needs as well; a shared one brings it along.
if(KORVEX_XMLWRAPP STREQUAL "system")
  set(pc_public xmlwrapp)
  set(pc_hidden popt)
else()
  set(pc_public "")
  set(pc_hidden "popt libxml-2.0")
  set(pc_compat_cflags " -I\${includedir}/korvex-compat")
endif()
if(BUILD_SHARED_LIBS)
  set(pc_requires "${pc_public}")
  set(pc_requires_private "${pc_hidden}")
else()
  string(STRIP "${pc_public} ${pc_hidden}" pc_requires)
  set(pc_requires_private "")
endif()
file(RELATIVE_PATH pc_prefix
  ${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
configure_file(cmake/korvex.pc.in ${CMAKE_CURRENT_BINARY_DIR}/korvex.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/korvex.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
