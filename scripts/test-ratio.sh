#!/usr/bin/env bash
# Prints the lines of test code, the lines of all other code, and their ratio
# (every tracked .c .cpp .h .rc .py .sh .cmake file and CMakeLists.txt; the
# mutation sets in tests/mutants/ aside).
#   scripts/test-ratio.sh [--check]   (--check: fail outside a quarter to a third)
set -eu
cd "$(dirname "$0")/.."
files() { git ls-files -- '*.c' '*.cpp' '*.h' '*.rc' '*.py' '*.sh' '*.cmake' '*CMakeLists.txt' | grep -v '^tests/mutants/'; }
lines() { xargs -r cat -- | wc -l; }
tests=$(files | grep '^tests/' | lines)
code=$(files | grep -v '^tests/' | lines)
ratio=$(awk -v t="$tests" -v c="$code" 'BEGIN { printf "%.2f", t / c }')
echo "tests: $tests lines, code: $code lines, ratio: $ratio (asked: 0.25 to 0.33)"
if [ "${1:-}" = --check ]; then
    [ $((4 * tests)) -ge "$code" ] && [ $((3 * tests)) -le "$code" ] || { echo "outside a quarter to a third"; exit 1; }
fi
