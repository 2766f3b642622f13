#!/usr/bin/env bash
# Builds the C host in tests/consumer/ one of the ways the README's "Use it in
# your program" shows, checks what the build did, and runs the host under Wine.
#   consumer_test.sh BUILD_DIR subdirectory|package [build|run]
# Each way works in BUILD_DIR/consumer/<way>/. "build" builds and checks, "run"
# starts the hosts built before (CTest runs the two apart, so that the builds
# need not hold the desktop); with neither, both.
set -eu
build=$(cd "$1" && pwd)
way=$2
phase=${3:-all}
here=$(cd "$(dirname "$0")" && pwd)
source_dir=$(cd "$here/../.." && pwd)
work=$build/consumer/$way
toolchain=$source_dir/cmake/mingw-w64-x86_64.cmake
mkdir -p "$work"
cd "$work"
fail() { echo "consumer $way: $*" >&2; exit 1; }
hosts=host/host.exe
[ "$way" = package ] && hosts="host/host.exe plain/host.exe"

if [ "$phase" = run ]; then
    for exe in $hosts; do
        "$source_dir/scripts/wine-run.sh" "$build" "$work/$exe" || fail "$exe failed (exit code $?)"
        echo "consumer $way: $exe started and worked"
    done
    exit 0
fi
# The folders stay between runs, as a developer's build folder does; what
# was installed goes.
rm -rf "$work/prefix"

# The library alone, configured, built and installed as the README shows. No
# step of its build may call Python (the pictures are committed).
install_package() {
    cmake -S "$source_dir" -B lib-build -DQBR_BUILD_DEMO=OFF -DQBR_BUILD_TESTS=OFF -DQBR_BUILD_BENCH=OFF >lib-configure.log \
        || { cat lib-configure.log; fail "the library alone does not configure"; }
    cmake --build lib-build -j2 >lib-build.log || { cat lib-build.log; fail "the library alone does not build"; }
    cmake --install lib-build --prefix "$work/prefix" >install.log
    ! grep -rqiI --include='*.make' --include=Makefile python lib-build || fail "the library's build calls Python"
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
    cmake -S "$here/subdirectory" -B host -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DQBR_STATIC_RUNTIME=ON \
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
    ;;
package)
    install_package
    prefix=$work/prefix
    # A CMake host finds the package.
    cmake -S "$here/package" -B host -DCMAKE_TOOLCHAIN_FILE="$toolchain" \
        -DCMAKE_PREFIX_PATH="$prefix" -DHOST_IMAGES_DIR="$source_dir/demo/images" >configure.log \
        || { cat configure.log; fail "configure failed"; }
    cmake --build host -j2 >build.log || { cat build.log; fail "build failed"; }
    # A version the package does not offer is refused.
    if cmake -S "$here/package" -B too-new -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DCMAKE_PREFIX_PATH="$prefix" \
        -DHOST_QUAYBAR_VERSION=2.0 >too-new.log 2>&1; then
        fail "find_package(Quaybar 2.0) was accepted"
    fi
    # A host built without CMake, by the README's compiler line (plus the
    # host's own shell32 and the folder of its bitmap).
    mkdir -p plain
    x86_64-w64-mingw32-windres -I "$source_dir/demo/images" "$here/host.rc" -O coff -o plain/host-res.o
    x86_64-w64-mingw32-gcc -mwindows -I "$prefix/include" "$here/host.c" plain/host-res.o "$prefix"/lib/quaybar/*.res \
        -L "$prefix/lib" -lquaybar -lstdc++ -lgdi32 -luser32 -ladvapi32 -luuid -loleacc -loleaut32 -lole32 -lshell32 -static -o plain/host.exe
    # Nor does the project's own build call Python, the demo's included.
    ! grep -rqiI --include='*.make' python "$build/CMakeFiles" "$build/demo" || fail "the project's build calls Python"
    ;;
*)
    fail "unknown way (subdirectory or package)"
    ;;
esac

for exe in $hosts; do
    # The program needs no DLL of the compiler beside it.
    dlls=$(x86_64-w64-mingw32-objdump -p "$exe" | sed -n 's/.*DLL Name: //p' | tr 'A-Z' 'a-z' | sort | xargs)
    case $dlls in
    *libstdc++*|*libgcc*|*libwinpthread*) fail "$exe imports the compiler's runtime: $dlls" ;;
    esac
    echo "consumer $way: $exe built, imports only $dlls"
    # It starts and works: frame, docked toolbar, the library's strings.
    if [ "$phase" = all ]; then
        "$source_dir/scripts/wine-run.sh" "$build" "$work/$exe" || fail "$exe failed (exit code $?)"
        echo "consumer $way: $exe started and worked"
    fi
done

if [ "$way" = subdirectory ]; then
    # The host may ask for the compiler's runtime as DLLs instead (in a
    # folder of its own: host/ keeps the host that runs).
    cmake -S "$here/subdirectory" -B host-dll -DCMAKE_TOOLCHAIN_FILE="$toolchain" -DQBR_STATIC_RUNTIME=OFF \
        -DHOST_GTEST_DIR=/usr/src/googletest >>configure.log && cmake --build host-dll -j2 >>build.log ||
        fail "the build with QBR_STATIC_RUNTIME=OFF failed"
    x86_64-w64-mingw32-objdump -p host-dll/host.exe | grep -qi "DLL Name: libstdc++" ||
        fail "with QBR_STATIC_RUNTIME=OFF the host still has the C++ runtime built in"
    echo "consumer $way: with QBR_STATIC_RUNTIME=OFF the host imports the C++ runtime"
fi
