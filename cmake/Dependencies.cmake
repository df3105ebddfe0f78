set(THREADS_PREFER_PTHREAD_FLAG ON)
find_package(Threads REQUIRED)
find_package(PkgConfig REQUIRED)
pkg_check_modules(popt REQUIRED IMPORTED_TARGET popt)

# xml::node comes from xmlwrapp where the system has it, else from compat/xmlwrapp over libxml2.
# KORVEX_XMLWRAPP says which; the package configuration hands it on.
pkg_check_modules(xmlwrapp IMPORTED_TARGET xmlwrapp)
if(xmlwrapp_FOUND)
  set(KORVEX_XMLWRAPP system)
else()
  set(KORVEX_XMLWRAPP compat)
  pkg_check_modules(libxml2 REQUIRED IMPORTED_TARGET libxml-2.0)
endif()
