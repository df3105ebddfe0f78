# Debian packages by CPack: libkorvex1, libkorvex-dev, korvex-tools and korvex-doc. Made by ./dev package
# from a shared build with the tools (docs/packaging.md).
include(GNUInstallDirs)
set(runtime libkorvex${PROJECT_VERSION_MAJOR})

# What only packages hold; a plain install leaves it out.
function(install_for_packages component package)
  set(doc ${CMAKE_INSTALL_DATADIR}/doc)
  install(FILES LICENSE DESTINATION ${doc}/${package} RENAME copyright
    COMPONENT ${component} EXCLUDE_FROM_ALL)
  install(FILES CHANGELOG.md DESTINATION ${doc}/${package} RENAME changelog
    COMPONENT ${component} EXCLUDE_FROM_ALL)
endfunction()
install_for_packages(runtime ${runtime})
install_for_packages(development libkorvex-dev)
install_for_packages(tools korvex-tools)
install_for_packages(documentation korvex-doc)
install(FILES docs/samples/korvex.logrotate
  DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/korvex-tools/examples COMPONENT tools EXCLUDE_FROM_ALL)
install(DIRECTORY docs DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/korvex-doc
  COMPONENT documentation EXCLUDE_FROM_ALL
  PATTERN Doxyfile EXCLUDE PATTERN doxygen-filter.sh EXCLUDE)
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/korvex-doc
  COMPONENT documentation EXCLUDE_FROM_ALL REGEX "/examples/CMakeLists\\.txt$" EXCLUDE)

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME korvex)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_CONTACT "The Korvex authors <korvex@localhost>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_OUTPUT_FILE_PREFIX ${PROJECT_BINARY_DIR}/packages)
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)
# Files come out with these modes whatever the umask of whoever packs them.
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
  OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/Compress.cmake)
set(CPACK_COMPONENTS_ALL runtime development tools documentation)
set(CPACK_DEB_COMPONENT_INSTALL ON)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(same_version "(= ${PROJECT_VERSION})")

# component DEBIAN-NAME SECTION DESCRIPTION
function(describe component name section description)
  string(TOUPPER ${component} upper)
  set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name} PARENT_SCOPE)
  set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section} PARENT_SCOPE)
  set(CPACK_DEBIAN_${upper}_DESCRIPTION "${PROJECT_DESCRIPTION}: ${description}
 Start-up, logging, a record store, paths and files, threads and time values." PARENT_SCOPE)
endfunction()
describe(runtime ${runtime} libs "the shared library")
describe(development libkorvex-dev libdevel "headers, the static library, CMake and pkg-config files")
describe(tools korvex-tools utils "command-line tools")
describe(documentation korvex-doc doc "pages, samples and examples")

set(CPACK_DEBIAN_RUNTIME_PACKAGE_SHLIBDEPS ON)
# Within one major version names are added: a program needs the version it was linked with, or a later.
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")

# Whoever links the static library links what it needs.
set(xml_dev libxml2-dev)
if(KORVEX_XMLWRAPP STREQUAL "system")
  set(xml_dev libxmlwrapp-dev)
endif()
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
  "${runtime} ${same_version}, libpopt-dev, ${xml_dev}, libc6-dev, pkgconf | pkg-config")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SUGGESTS "cmake, korvex-doc")

set(CPACK_DEBIAN_TOOLS_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/src)
set(CPACK_DEBIAN_TOOLS_PACKAGE_DEPENDS "${runtime} (>= ${PROJECT_VERSION})")
set(CPACK_DEBIAN_TOOLS_PACKAGE_SUGGESTS "logrotate, korvex-doc")

set(CPACK_DEBIAN_DOCUMENTATION_PACKAGE_ARCHITECTURE all)
include(CPack)
