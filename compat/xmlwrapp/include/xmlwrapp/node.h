#pragma once
// #include_next is not standard C++; this silences the warning of a strict compiler.
#pragma GCC system_header

// For programs that ask for xmlwrapp's header by its own name: xmlwrapp's, if it is there.
#if __has_include_next(<xmlwrapp/node.h>)
#include_next <xmlwrapp/node.h>
#else
#include <korvex-compat/XmlNode.h>
#endif
