#!/usr/bin/env bash
# Installs what building and testing needs on a Debian machine (run as root);
# does nothing for packages that are already there.
set -eu
packages="g++-mingw-w64-x86-64 mingw-w64-tools wine wine64 xvfb xauth cmake make googletest xdotool imagemagick x11-apps python3 util-linux rsync"
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
