#pragma once

// Stands where a public header opens the namespace: what that header declares is seen from outside
// a shared library. Stands before a free function as well, as clang++ looks at the namespace around
// its definition.
#define KORVEX_EXPORT [[gnu::visibility("default")]]

// Stands before the name of a class that a public header declares but does not define: nobody else
// links to it. The library is compiled so that whatever no public header declares is hidden anyway.
#define KORVEX_HIDDEN [[gnu::visibility("hidden")]]
