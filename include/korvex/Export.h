#pragma once

// Stands before each free function of a public header, because clang++ takes the visibility from
// the namespace around the definition. Users of the static library compile with KORVEX_STATIC: it
// exports nothing, so a plugin that it is linked into does not export Korvex either.
#ifdef KORVEX_STATIC
#define KORVEX_EXPORT
#else
#define KORVEX_EXPORT [[gnu::visibility("default")]]
#endif

// Stands before the name of a class that a public header declares but does not define. No other
// code links to it. Everything that no public header declares is hidden anyway.
#define KORVEX_HIDDEN [[gnu::visibility("hidden")]]

// Opens the namespace in a public header; what is declared in it is exported from a shared library.
// Names can be written without "korvex::", unless the program defines KORVEX_QUALIFIED_NAMES before
// the first header of Korvex, because it has a Logger, Thread or ERROR of its own. The symbols in
// the library are the same in both cases, so files compiled with and without the macro link
// together.
#ifdef KORVEX_QUALIFIED_NAMES
#define KORVEX_NAMESPACE(name) namespace KORVEX_EXPORT name
#else
#define KORVEX_NAMESPACE(name) inline namespace KORVEX_EXPORT name
#endif
