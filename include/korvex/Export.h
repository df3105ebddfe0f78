#pragma once

// Stands before a free function of a public header, as clang++ looks at the namespace around the
// function's definition. The static library, whose users compile with KORVEX_STATIC, shows nothing:
// a plugin that it is linked into does not show Korvex either.
#ifdef KORVEX_STATIC
#define KORVEX_EXPORT
#else
#define KORVEX_EXPORT [[gnu::visibility("default")]]
#endif

// Stands before the name of a class that a public header declares but does not define: nobody else
// links to it. The library is compiled so that whatever no public header declares is hidden anyway.
#define KORVEX_HIDDEN [[gnu::visibility("hidden")]]

// Opens the namespace in a public header: what stands in it is seen from outside a shared library.
// Names can be written without "korvex::", unless a program defines KORVEX_QUALIFIED_NAMES before
// the first header of Korvex because it has a Logger, Thread or ERROR of its own. The names in the
// library are the same either way, so files compiled with it and without link together.
#ifdef KORVEX_QUALIFIED_NAMES
#define KORVEX_NAMESPACE(name) namespace KORVEX_EXPORT name
#else
#define KORVEX_NAMESPACE(name) inline namespace KORVEX_EXPORT name
#endif
