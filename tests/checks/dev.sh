#!/bin/sh
# Runs ./dev where programs stand in for apt, CMake and the like: what it says, and its status, when it
# cannot do what it is asked to. Usage: dev.sh SOURCE-DIR
# shellcheck disable=SC2016  # dollars of the programs that stand in
set -eu
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
mkdir "$work/tree" "$work/tools" "$work/bin"
cd "$1"
cp -r dev scripts CMakeLists.txt "$work/tree"
cp .github/workflows/ci.yml "$work"
cd "$work"
for tool in awk cat dirname env find grep head mkdir rm sed sh tail wc xargs; do
    ln -s "$(command -v "$tool")" tools/
done
export KORVEX_BUILD_DIR="$work/out"

# stand_in NAME: a program, from standard input; everybody's calls are noted.
stand_in() {
    { printf '#!/bin/sh\necho "%s $*" >> "%s/calls"\n' "$1" "$work" && cat; } > "bin/$1"
    chmod +x "bin/$1"
}

# machine: a Debian, as root, where everything is there and works.
machine() {
    rm -f bin/*
    echo 'echo install ok installed' | stand_in dpkg-query
    for name in apt-get sudo pkg-config sleep cmake ctest; do
        : | stand_in "$name"
    done
    printf 'exec "$@"\n' | stand_in sudo
    echo 'echo 2' | stand_in nproc
    echo 'echo 0' | stand_in id
}

# dev STATUS WORD...: runs it, and looks at the status.
dev() {
    wanted=$1
    shift
    : > calls
    status=0
    PATH="$work/bin:$work/tools" tree/dev "$@" > stdout 2> stderr < /dev/null || status=$?
    [ $status -eq "$wanted" ] || fail "dev $*: status $status, not $wanted"
}
fail() {
    echo "$*"
    cat stdout stderr calls
    exit 1
}
says() { grep -qF -- "$1" stderr || fail "stderr lacks: $1"; }
prints() { grep -qF -- "$1" stdout || fail "stdout lacks: $1"; }
prints_no() { ! grep -qF -- "$1" stdout || fail "stdout has: $1"; }
called() { grep -qE -- "$1" calls || fail "not called: $1"; }
called_no() { ! grep -qE -- "$1" calls || fail "called: $1"; }

machine
dev 0
prints "  test	"
# The hosted run calls words that there are.
called=$(sed -n 's/^ *word: \[\(.*\)\]$/\1/p' ci.yml | tr -d ,)
[ -n "$called" ]
for word in $called; do
    prints "  $word	"
done
dev 2 tset
says "there is no command 'tset'"
says "  test	"
called_no '^(apt-get|sudo|cmake|ctest)'
dev 0 test --help
prints "./dev test [CTEST-ARGUMENT...] build and run every test"
prints "    ./dev test -R Logger"
called_no '^(apt-get|sudo|cmake|ctest)'
KORVEX_BUILD_DIR=/proc/none dev 1 test
says "set KORVEX_BUILD_DIR"

# All is there: nothing is installed, and the build goes where it should.
dev 0 test -R Logger
called "^cmake --preset dev -B $work/out/dev"
called "^ctest .*-R Logger"
called_no '^(apt-get|sudo)'
[ ! -e tree/build ]

# Packages are missing.
echo 'exit 1' | stand_in dpkg-query
echo 'exit 1' | stand_in pkg-config
dev 0 build
says "installing"
called '^apt-get update'
called '^apt-get install .*libpopt-dev'
echo '[ "$1" != update ]' | stand_in apt-get
dev 0 build
says "trying with those that are here"
called '^apt-get install'
printf '[ "$1" = update ] || { echo "E: no such package"; exit 100; }\n' | stand_in apt-get
dev 1 build
says "E: no such package"
says "could not install"
called_no '^cmake'
printf 'n=$(grep -c "^apt-get" "%s/calls"); [ "$n" -gt 2 ] || { echo "E: Could not get lock /x"; exit 100; }\n' "$work" | stand_in apt-get
dev 0 build
[ "$(grep -c 'another apt is at work' stderr)" -eq 1 ] || fail "told more than once"
called '^sleep'
called '^cmake'

# Root is asked for, if there is sudo.
echo 'echo 1000' | stand_in id
: | stand_in apt-get
dev 0 build
called '^sudo .*apt-get install'
rm bin/sudo
dev 1 build
says "As root: apt-get install"
called_no '^(apt-get|cmake)'
# No apt: what is there is used, what is missing is named.
rm bin/apt-get bin/dpkg-query
dev 1 build
says "missing: g++"
says "There is no apt-get here"
for program in g++ ninja abidw clang-format locale-gen logrotate gzip mandoc zsh patch setfacl; do
    : | stand_in "$program"
done
: | stand_in pkg-config
dev 0 build
called '^cmake --build'

# What passes is in the log only; what fails is shown, and how it ended.
cat << 'END' | stand_in ctest
echo '    Start 1: Good.One'
echo '1/2 Test #1: Good.One ....   Passed    0.01 sec'
echo '2/2 Test #2: Bad.One ....***Failed    0.01 sec'
echo 'the reason'
echo '50% tests passed, 1 tests failed out of 2'
exit 8
END
dev 8 test
prints 'Bad.One ....***Failed'
prints 'the reason'
prints '50% tests passed, 1 tests failed out of 2'
prints_no 'Good.One'
grep -q 'Good.One .*Passed' out/test.log || fail "not in the log"
printf '[ "$1" != --build ] || { echo "[1/2] Building CXX a"; echo "a.cc: error"; exit 3; }\n' | stand_in cmake
dev 3 build
says 'a.cc: error'
says "$work/out/build.log"
! grep -q '\[1/2\]' stderr || fail "progress is shown"

# tidy ends with a verdict.
machine
: | stand_in clang-tidy
mkdir -p tree/src && echo > tree/src/A.cc
dev 0 tidy
says "clang-tidy found nothing"
called '^clang-tidy .*src/A.cc'
echo 'echo finding; exit 1' | stand_in clang-tidy
dev 1 tidy
prints finding
says "clang-tidy found what stands above"

# install
dev 1 install --prefx /x
says "not '--prefx'"
called_no '^(apt-get|sudo|cmake|ctest)'
mkdir out/install
echo CMAKE_INSTALL_LIBDIR:PATH=lib/here > out/install/CMakeCache.txt
dev 0 install --prefix "$work/pre fix" --shared
called "^cmake --preset install -B $work/out/install -DCMAKE_INSTALL_PREFIX=$work/pre fix -DBUILD_SHARED_LIBS=ON"
called '^cmake --install'
called_no ctest
prints "CMAKE_PREFIX_PATH=\"$work/pre fix\" PKG_CONFIG_PATH=\"$work/pre fix/lib/here/pkgconfig\""
echo 'echo 1000' | stand_in id
dev 0 install --prefix /dev/null/x
called '^sudo cmake --install'
rm bin/sudo
dev 1 install --prefix /dev/null/x
says "choose a folder of yours by --prefix"
called_no '^cmake'
