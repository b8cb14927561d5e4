#!/usr/bin/env bash
# Builds and runs every ```cpp block of the README against an installed libzv, exactly as
# printed. Usage: readme_programs.sh README.md PREFIX WORKDIR
set -euo pipefail
readme=$1 prefix=$2
mkdir -p "$3"
work=$(cd "$3" && pwd)
awk -v dir="$work" '
  /^```cpp$/ { n++; file = sprintf("%s/readme_%d.cpp", dir, n); inside = 1; next }
  /^```$/    { inside = 0; next }
  inside     { print > file }
' "$readme"
count=0
for src in "$work"/readme_*.cpp; do
  [ -e "$src" ] || continue
  exe=${src%.cpp}
  c++ -std=c++17 -Wall -Wextra -Werror "$src" -o "$exe" \
    $(PKG_CONFIG_PATH="$prefix/lib/pkgconfig" pkg-config --cflags --libs zv) \
    -Wl,-rpath,"$prefix/lib"
  (cd "$work" && "$exe" >/dev/null)
  count=$((count + 1))
done
[ "$count" -gt 0 ] || { echo "no C++ programs found in $readme"; exit 1; }
echo "README programs: $count built and ran"
