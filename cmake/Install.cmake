# Installs the library for find_package(Korvex) and for pkg-config; both say the same. Programs that
# were linked with it need the component "runtime", all else is "development".
include(CMakePackageConfigHelpers)
set(CMAKE_INSTALL_DEFAULT_COMPONENT_NAME development)
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/Korvex)

install(TARGETS korvex EXPORT KorvexTargets
  LIBRARY COMPONENT runtime NAMELINK_COMPONENT development)
install(EXPORT KorvexTargets NAMESPACE Korvex:: DESTINATION ${package_dir})
if(TARGET korvex_static)
  install(TARGETS korvex_static EXPORT KorvexStaticTargets)
  install(EXPORT KorvexStaticTargets NAMESPACE Korvex:: DESTINATION ${package_dir})
endif()
install(DIRECTORY include/korvex DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(KORVEX_XMLWRAPP STREQUAL "compat")
  install(DIRECTORY compat/xmlwrapp/include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/korvex-compat)
endif()

configure_package_config_file(cmake/KorvexConfig.cmake.in ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfig.cmake
  INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/KorvexConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES
  ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/KorvexConfigVersion.cmake
  DESTINATION ${package_dir})

# Whoever links a static library links what it needs as well; a shared one brings it along. So
# korvex-static is not just korvex with "pkg-config --static": that would mean a wholly static program.
if(KORVEX_XMLWRAPP STREQUAL "system")
  set(pc_public xmlwrapp)
  set(pc_hidden popt)
else()
  set(pc_public "")
  set(pc_hidden "popt libxml-2.0")
  set(pc_compat_cflags " -I\${includedir}/korvex-compat")
endif()
file(RELATIVE_PATH pc_prefix
  ${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
function(install_pc name library requires requires_private)
  string(STRIP "${requires}" requires)
  configure_file(cmake/korvex.pc.in ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endfunction()
if(BUILD_SHARED_LIBS)
  install_pc(korvex -lkorvex "${pc_public}" "${pc_hidden}")
else()
  install_pc(korvex -lkorvex "${pc_public} ${pc_hidden}" "")
endif()
if(TARGET Korvex::static)
  install_pc(korvex-static -l:libkorvex.a "${pc_public} ${pc_hidden}" "")
endif()
