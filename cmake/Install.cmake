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
# The prefix is told by where the file lies, so that it can be moved; unless that has been given as an
# absolute folder.
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
  set(pc_prefix ${CMAKE_INSTALL_PREFIX})
else()
  file(RELATIVE_PATH pc_prefix
    ${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
  string(REGEX REPLACE "^(.*[^/])/?$" "\${pcfiledir}/\\1" pc_prefix ${pc_prefix})
endif()
foreach(dir IN ITEMS includedir libdir)
  string(TOUPPER ${dir} upper)
  set(pc_${dir} ${CMAKE_INSTALL_${upper}})
  if(NOT IS_ABSOLUTE "${pc_${dir}}")
    set(pc_${dir} "\${prefix}/${pc_${dir}}")
  endif()
endforeach()
foreach(definition IN LISTS KORVEX_WIDE_TYPES)
  string(APPEND pc_wide_types " -D${definition}")
endforeach()
# kind is shared or static.
function(install_pc name kind requires requires_private)
  string(STRIP "${requires}" requires)
  get_target_property(library korvex OUTPUT_NAME)
  if(kind STREQUAL "static")
    set(static_cflags " -DKORVEX_STATIC")
    if(BUILD_SHARED_LIBS)
      set(library -l:lib${library}.a)
    else()
      set(library -l${library})
    endif()
  else()
    set(library -l${library})
    # Programs find the library of a prefix where the loader does not look.
    if(NOT CMAKE_INSTALL_PREFIX MATCHES "^/usr(/local)?$")
      set(rpath " -Wl,-rpath,\${libdir}")
    endif()
  endif()
  configure_file(cmake/korvex.pc.in ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endfunction()
if(BUILD_SHARED_LIBS)
  install_pc(korvex shared "${pc_public}" "${pc_hidden}")
else()
  install_pc(korvex static "${pc_public} ${pc_hidden}" "")
endif()
if(TARGET Korvex::static)
  install_pc(korvex-static static "${pc_public} ${pc_hidden}" "")
endif()

# The loader learns of a shared library in its own folders, where it keeps a list of them.
if(BUILD_SHARED_LIBS AND CMAKE_INSTALL_FULL_LIBDIR MATCHES "^/usr/(local/)?lib")
  install(CODE [[
    if("$ENV{DESTDIR}" STREQUAL "")
      find_program(ldconfig ldconfig PATHS /usr/sbin /sbin)
      if(ldconfig)
        execute_process(COMMAND ${ldconfig} ERROR_QUIET)
      endif()
    endif()]] COMPONENT runtime)
endif()
