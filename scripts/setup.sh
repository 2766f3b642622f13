#!/usr/bin/env bash
# Installs what building and testing needs on a Debian machine (run as root);
# does nothing for packages that are already there.
set -eu
# clang and g++-mingw-w64-i686 serve the portable builds (scripts/portable-build.sh);
# python3 only the tests and tools, never the build.
packages="g++-mingw-w64-x86-64 mingw-w64-tools wine wine64 xvfb xauth cmake make googletest xdotool imagemagick x11-apps python3 util-linux rsync"
packages="$packages clang g++-mingw-w64-i686 g++-mingw-w64-i686-posix ccache"
missing=""
for p in $packages; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing="$missing $p"
done
if [ -n "$missing" ]; then
    echo "setup: installing$missing"
    export DEBIAN_FRONTEND=noninteractive
    apt-get update -qq
    # shellcheck disable=SC2086
    apt-get install -y -qq --no-install-recommends $missing >/dev/null
fi
# A 32-bit Wine also runs the 32-bit build's tests. It needs the i386
# architecture, which this script leaves to the machine's owner to enable;
# without it the 32-bit programs are built, not run.
if dpkg --print-foreign-architectures | grep -qx i386 &&
    ! dpkg-query -W -f='${Status}' wine32:i386 2>/dev/null | grep -q "install ok installed"; then
    apt-get install -y -qq --no-install-recommends wine32:i386 >/dev/null ||
        echo "setup: wine32:i386 could not be installed; the 32-bit tests are built, not run"
fi
