#!/usr/bin/env bash
# Proves that the tests leave the user's settings file (BUILD/bin/qbrdemo.INI) as it was.
#   scripts/user-settings.sh snapshot|check BUILD_DIR
# "snapshot" keeps a copy (or notes that there is no file); "check" fails if
# the file was created, changed or removed since.
set -u
build=$(cd "$2" && pwd)
ini="$build/bin/qbrdemo.INI"
kept="$build/user-settings.snapshot"
case "$1" in
snapshot)
    rm -f "$kept" "$kept.absent"
    if [ -e "$ini" ]; then cp "$ini" "$kept"; else : >"$kept.absent"; fi
    ;;
check)
    if [ -e "$kept.absent" ]; then
        [ ! -e "$ini" ] || { echo "FAIL: the tests created $ini"; exit 1; }
    elif [ -e "$kept" ]; then
        cmp -s "$kept" "$ini" || { echo "FAIL: the tests changed or removed $ini"; exit 1; }
    else
        echo "FAIL: no snapshot of $ini was taken"
        exit 1
    fi
    echo "the user's $ini is as it was"
    ;;
*)
    echo "usage: $0 snapshot|check BUILD_DIR" >&2
    exit 2
    ;;
esac
