#!/usr/bin/env bash
# Test code against library code, in non-blank, non-comment lines: src/, tools/,
# java/ and include/ count as code, tests/ and fuzz/ as tests. Fonts, images and
# other data files are left out; the picture table counts one line per case.
set -euo pipefail
cd "$(dirname "$0")/.."

# Lines of the given files that are neither blank nor only a comment (//, /* */
# blocks and # lines, by file kind).
count() {
  [ $# -eq 0 ] && { echo 0; return; }
  awk '
    FNR == 1 { hash = (FILENAME ~ /(\.cmake|\.txt|\.sh|\.supp|\.tsv|\.map)$/); block = 0 }
    {
      line = $0
      sub(/^[ \t]+/, "", line)
      if (line == "") next
      if (hash) { if (line !~ /^#/) n++; next }
      if (block) { if (line ~ /\*\//) { block = 0; sub(/.*\*\//, "", line); sub(/^[ \t]+/, "", line); if (line != "") n++ } next }
      if (line ~ /^\/\//) next
      if (line ~ /^\/\*/) { if (line !~ /\*\//) block = 1; else { sub(/^\/\*.*\*\//, "", line); sub(/^[ \t]+/, "", line); if (line != "") n++ } next }
      n++
    }
    END { print n + 0 }' "$@"
}

files() {
  find "$@" -type f \( -name '*.cpp' -o -name '*.h' -o -name '*.c' -o -name '*.java' -o -name '*.inc' \
       -o -name '*.cmake' -o -name 'CMakeLists.txt' -o -name '*.in' -o -name '*.map' -o -name '*.supp' \
       -o -name '*.sh' -o -name '*.tsv' \) 2>/dev/null | sort
}

mapfile -t code_files < <(files src tools java include)
mapfile -t test_files < <(files tests fuzz)
code=$(count "${code_files[@]}")
tests=$(count "${test_files[@]}")
echo "code  $code lines (src/ tools/ java/ include/)"
echo "tests $tests lines (tests/ fuzz/)"
awk -v c="$code" -v t="$tests" 'BEGIN { printf "ratio %.1f %% (target: at most 33.3 %%)\n", 100 * t / c }'
