# Files beyond 2 GiB and times beyond 2038 on machines of 32 bits, where the C library has to be asked for
# them (feature_test_macros(7)). Public headers hold these types, so consumers are given the same words.
include(CheckCXXSourceCompiles)
set(wide_types "#include <sys/types.h>
  static_assert(sizeof(off_t) == 8 && sizeof(time_t) == 8, \"narrow\");
  int main() {}")
set(KORVEX_WIDE_TYPES "")
check_cxx_source_compiles("${wide_types}" KORVEX_TYPES_ARE_WIDE)
if(NOT KORVEX_TYPES_ARE_WIDE)
  set(KORVEX_WIDE_TYPES _FILE_OFFSET_BITS=64 _TIME_BITS=64)
endif()
