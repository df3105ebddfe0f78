# What a build is like that asks for nothing else.
get_property(multi_config GLOBAL PROPERTY GENERATOR_IS_MULTI_CONFIG)
if(KORVEX_IS_TOP_LEVEL AND NOT multi_config AND NOT CMAKE_BUILD_TYPE)
  set(CMAKE_BUILD_TYPE Release CACHE STRING "Kind of build" FORCE)
endif()

# Files keep things of the same name to themselves, so they are compiled one by one.
set(CMAKE_UNITY_BUILD OFF)

# A tool finds the shared library of its own prefix, wherever that lies. Debian's packages do without.
if(KORVEX_IS_TOP_LEVEL AND NOT DEFINED CMAKE_INSTALL_RPATH AND NOT CMAKE_INSTALL_PREFIX STREQUAL "/usr")
  file(RELATIVE_PATH from_bin "${CMAKE_INSTALL_FULL_BINDIR}" "${CMAKE_INSTALL_FULL_LIBDIR}")
  set(CMAKE_INSTALL_RPATH "$ORIGIN/${from_bin}")
endif()
