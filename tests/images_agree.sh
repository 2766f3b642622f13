#!/usr/bin/env bash
# Checks that every committed bitmap and icon is what its text source makes
# today: each is drawn again into a temporary folder and compared byte for byte.
# After editing a picture, run the generator it names and commit both files.
set -eu
here=$(cd "$(dirname "$0")/.." && pwd)
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
status=0

compare() { # committed file, the freshly drawn one, how to draw it again
    if ! cmp -s "$1" "$2"; then
        echo "images: ${1#"$here"/} does not match its source; run: $3" >&2
        status=1
    fi
}

for picture in "$here"/demo/images/*.txt "$here"/tests/support/test_strip.txt; do
    base=${picture%.txt}
    committed=
    for ext in bmp ico; do [ -f "$base.$ext" ] && committed=$base.$ext; done
    if [ -z "$committed" ]; then
        echo "images: ${picture#"$here"/} has no committed .bmp or .ico beside it" >&2
        status=1
        continue
    fi
    fresh=$scratch/$(basename "$committed")
    python3 "$here/scripts/make-bmp.py" "$picture" "$fresh"
    compare "$committed" "$fresh" "scripts/make-bmp.py ${picture#"$here"/} ${committed#"$here"/}"
    # The same strip drawn for larger display scales (NAME_150.bmp, NAME_200.bmp).
    for scaled in "${base}"_[0-9]*.bmp; do
        [ -f "$scaled" ] || continue
        percent=${scaled##*_}
        percent=${percent%.bmp}
        fresh=$scratch/$(basename "$scaled")
        python3 "$here/scripts/make-bmp.py" --scale "$percent" "$picture" "$fresh"
        compare "$scaled" "$fresh" "scripts/make-bmp.py --scale $percent ${picture#"$here"/} ${scaled#"$here"/}"
    done
done

[ "$status" = 0 ] && echo "images: every committed picture matches its source"
exit "$status"
