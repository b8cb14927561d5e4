#!/bin/sh
# <zv/zv.h> must include every public header.
dir="$1"
missing=0
for h in "$dir"/*.h; do
  name=$(basename "$h")
  [ "$name" = zv.h ] && continue
  grep -q "#include <zv/$name>" "$dir/zv.h" || { echo "zv.h does not include <zv/$name>"; missing=1; }
done
exit $missing
