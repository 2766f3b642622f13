#!/usr/bin/env bash
# Builds the project with a second compiler and for 32-bit Windows, so that code
# only one compiler or one word size accepts is found at once.
#   portable-build.sh BUILD_DIR clang   Clang for 64-bit Windows: library and demo
#   portable-build.sh BUILD_DIR i686    GCC for 32-bit Windows: library and demo (and the
#                                       test programs, which then run, where a 32-bit Wine is installed)
# Each builds in BUILD_DIR/portable/<kind>, two jobs at a time; the folder stays
# between runs, as a build folder does, so a later run builds what changed.
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
build=$(mkdir -p "$1" && cd "$1" && pwd)
kind=$2
work=$build/portable/$kind
mkdir -p "$work"

fail() { echo "portable $kind: $*" >&2; exit 1; }

case $kind in
clang)
    # Besides -Wall -Wextra -Werror, the warnings MSVC gives at /W4 (hidden
    # names, integers cut short) and the MinGW headers' marks on the C
    # run-time calls MSVC deprecates. Those marks also fall on memcpy and
    # memmove, which MSVC does not deprecate, so they are warnings here and the
    # log is read for the others.
    flags="-Wshadow-all -Wshorten-64-to-32 -Wimplicit-int-conversion -Wfloat-conversion"
    flags="$flags -D__MINGW_MSVC_COMPAT_WARNINGS -Wno-error=deprecated-declarations"
    cmake -S "$here" -B "$work" -DCMAKE_TOOLCHAIN_FILE="$here/cmake/clang-mingw-w64-x86_64.cmake" \
        -DQBR_BUILD_TESTS=OFF -DQBR_BUILD_BENCH=OFF -DCMAKE_CXX_FLAGS="$flags" >"$work/configure.log" \
        || { cat "$work/configure.log"; fail "configure failed"; }
    cmake --build "$work" -j2 >"$work/build.log" 2>&1 || { cat "$work/build.log"; fail "build failed"; }
    deprecated=$(grep -o "'[A-Za-z_0-9]*' is deprecated" "$work/build.log" | grep -vE "'w?mem(cpy|move)'" | sort -u || true)
    [ -z "$deprecated" ] || { grep -F "$deprecated" "$work/build.log"; fail "deprecated C run-time calls: $deprecated"; }
    programs="qbrdemo.exe"
    machine=pei-x86-64
    ;;
i686)
    tests=OFF
    [ -x /usr/lib/wine/wine ] && tests=ON
    cmake -S "$here" -B "$work" -DCMAKE_TOOLCHAIN_FILE="$here/cmake/mingw-w64-i686.cmake" \
        -DQBR_BUILD_BENCH=OFF -DQBR_BUILD_TESTS=$tests >"$work/configure.log" || { cat "$work/configure.log"; fail "configure failed"; }
    cmake --build "$work" -j2 >"$work/build.log" 2>&1 || { cat "$work/build.log"; fail "build failed"; }
    programs=$(cd "$work/bin" && ls ./*.exe | xargs -n1 basename | xargs)
    case " $programs " in *" qbrdemo.exe "*) ;; *) fail "the demo is missing: $programs" ;; esac
    machine=pei-i386
    ;;
*)
    fail "unknown kind (clang or i686)"
    ;;
esac

for program in $programs; do
    format=$(x86_64-w64-mingw32-objdump -f "$work/bin/$program" 2>/dev/null | sed -n 's/.*file format //p')
    [ "$format" = "$machine" ] || fail "$program is $format, not $machine"
done
echo "portable $kind: built $programs"

if [ "$kind" = i686 ]; then
    if [ -x /usr/lib/wine/wine ]; then
        # The suite of this build, but for the tests that build others.
        cd "$work" && ctest --output-on-failure --timeout 900 -E '^(portable|consumer)_'
    else
        echo "portable i686: no 32-bit Wine here (wine32), so the test programs were neither built nor run"
    fi
fi
