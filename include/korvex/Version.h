#pragma once

// The version of these headers. CMakeLists.txt reads the version of the project from here. Within
// one major version, a program that compiles and links keeps compiling and linking.
#define KORVEX_VERSION_MAJOR 1
#define KORVEX_VERSION_MINOR 0
#define KORVEX_VERSION_PATCH 0

// To compare: 10203 is 1.2.3.
#define KORVEX_VERSION_NUMBER \
    (KORVEX_VERSION_MAJOR * 10000 + KORVEX_VERSION_MINOR * 100 + KORVEX_VERSION_PATCH)

// To show: "1.2.3".
#define KORVEX_VERSION_STRING \
    KORVEX_VERSION_JOIN(KORVEX_VERSION_MAJOR, KORVEX_VERSION_MINOR, KORVEX_VERSION_PATCH)

#define KORVEX_VERSION_JOIN(major, minor, patch) KORVEX_VERSION_JOIN_(major, minor, patch)
#define KORVEX_VERSION_JOIN_(major, minor, patch) #major "." #minor "." #patch
