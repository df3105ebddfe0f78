# korvex_flags: how our own code is compiled; private to this tree, never a consumer's business.
# korvex_warnings: the same without sanitizers.
add_library(korvex_warnings INTERFACE)
target_compile_options(korvex_warnings INTERFACE
  -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Wformat-security
  # A program's choice for its own code (korvex/Export.h), even if it is made for the whole build.
  -UKORVEX_QUALIFIED_NAMES
  # __FILE__ in assertions reads "src/..." wherever the tree lies.
  "-fmacro-prefix-map=${PROJECT_SOURCE_DIR}/=")
# Parts that do not link the library exchange these types with it, too.
target_compile_definitions(korvex_warnings INTERFACE ${KORVEX_WIDE_TYPES})
if(KORVEX_RELATIVE_PATHS)
  target_compile_options(korvex_flags INTERFACE
    "-ffile-prefix-map=${PROJECT_SOURCE_DIR}/=" "-ffile-prefix-map=${PROJECT_BINARY_DIR}=.")
endif()
if(CMAKE_CXX_COMPILER_ID MATCHES Clang)
  target_compile_options(korvex_warnings INTERFACE -Wthread-safety)
endif()
if(KORVEX_WERROR)
  target_compile_options(korvex_warnings INTERFACE -Werror)
endif()
add_library(korvex_flags INTERFACE)
target_link_libraries(korvex_flags INTERFACE korvex_warnings)
if(KORVEX_SANITIZE)
  set(sanitize -fsanitize=${KORVEX_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_compile_options(korvex_flags INTERFACE ${sanitize})
  target_link_options(korvex_flags INTERFACE ${sanitize})
endif()
