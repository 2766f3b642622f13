#!/usr/bin/env bash
# Builds the C host in tests/consumer/ one of the ways the README's "Use it in
# your program" shows, checks what the build did, and runs the host under Wine.
#   consumer_test.sh BUILD_DIR subdirectory|package|link-line
# Each way works in BUILD_DIR/consumer/<way>/ and starts from an empty folder.
set -eu
build=$(cd "$1" && pwd)
way=$2
here=$(cd "$(dirname "$0")" && pwd)
source_dir=$(cd "$here/../.." && pwd)
work=$build/consumer/$way
toolchain=$source_dir/cmake/mingw-w64-x86_64.cmake
rm -rf "$work"
mkdir -p "$work"
cd "$work"

fail() { echo "consumer $way: $*" >&2; exit 1; }

# The library's package, installed from the project's own build.
install_package() {
    cmake --install "$build" --prefix "$work/prefix" >install.log
    for f in include/quaybar.h include/qbr_records.h lib/libquaybar.a \
             lib/cmake/Quaybar/QuaybarConfig.cmake lib/cmake/Quaybar/QuaybarConfigVersion.cmake; do
        [ -f "prefix/$f" ] || fail "the install has no $f"
    done
    ls prefix/lib/quaybar/*.res >/dev/null 2>&1 || fail "the install has no resource objects"
}

case $way in
subdirectory)
    # The host has its own GoogleTest; the library must neither clash with it
    # nor change the host's cache values.
    cmake -S "$here/subdirectory" -B host -DCMAKE_TOOLCHAIN_FILE="$toolchain" \
        -DHOST_GTEST_DIR=/usr/src/googletest >configure.log || { cat configure.log; fail "configure failed"; }
    for entry in BUILD_GMOCK:BOOL=ON INSTALL_GTEST:BOOL=ON gtest_force_shared_crt:BOOL=OFF; do
        grep -qx "$entry" host/CMakeCache.txt || fail "the host's cache lost $entry"
    done
    cmake --build host -j2 >build.log || { cat build.log; fail "build failed"; }
    # The default build made the library and the host, nothing else of the project.
    built=$(find host -name '*.exe' -not -path '*/CMakeFiles/*' -printf '%f\n' | sort | xargs)
    [ "$built" = "host.exe" ] || fail "the default build made more programs: $built"
    [ -z "$(find host -path '*googletest*' -name '*.a')" ] || fail "the default build made GoogleTest"
    # The library's warning flags are its own business when it is the project.
    ! grep -q -- "-Werror" host/quaybar/CMakeFiles/quaybar.dir/flags.make || fail "-Werror reached the host's build of the library"
    ! grep -qE "WIN32_LEAN_AND_MEAN|NOMINMAX" host/CMakeFiles/host.dir/flags.make || fail "the library trims the host's windows.h"
    exe=host/host.exe
    objdump=x86_64-w64-mingw32-objdump
    ;;
package)
    install_package
    cmake -S "$here/package" -B host -DCMAKE_TOOLCHAIN_FILE="$toolchain" \
        -DCMAKE_PREFIX_PATH="$work/prefix" -DHOST_IMAGES_DIR="$source_dir/demo/images" >configure.log \
        || { cat configure.log; fail "configure failed"; }
    cmake --build host -j2 >build.log || { cat build.log; fail "build failed"; }
    # A version the package does not offer is refused.
    if cmake -S "$here/package" -B too-new -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DCMAKE_PREFIX_PATH="$work/prefix" \
        -DHOST_QUAYBAR_VERSION=2.0 >too-new.log 2>&1; then
        fail "find_package(Quaybar 2.0) was accepted"
    fi
    exe=host/host.exe
    objdump=x86_64-w64-mingw32-objdump
    ;;
link-line)
    # The README's build without CMake, word for word but for the paths.
    install_package
    prefix=$work/prefix
    x86_64-w64-mingw32-windres -I "$source_dir/demo/images" "$here/host.rc" -O coff -o host-res.o
    x86_64-w64-mingw32-gcc -mwindows -I "$prefix/include" "$here/host.c" host-res.o "$prefix"/lib/quaybar/*.res \
        -L "$prefix/lib" -lquaybar -lstdc++ -lgdi32 -luser32 -lshell32 -static -o host.exe
    exe=host.exe
    objdump=x86_64-w64-mingw32-objdump
    ;;
*)
    fail "unknown way (subdirectory, package or link-line)"
    ;;
esac

# The program needs no DLL of the compiler beside it.
dlls=$($objdump -p "$exe" | sed -n 's/.*DLL Name: //p' | tr 'A-Z' 'a-z' | tr -d '\r' | sort | xargs)
case $dlls in
*libstdc++*|*libgcc*|*libwinpthread*) fail "the program imports the compiler's runtime: $dlls" ;;
esac

# It starts and works: frame, docked toolbar, the library's strings, a real click.
"$source_dir/scripts/wine-run.sh" "$build" "$work/$exe" || fail "the host failed (exit code $?)"
echo "consumer $way: built, imports only $dlls, started and worked"
