#!/bin/sh
# Fails when libzv's dynamic symbol table holds anything but the library's own interface: its
# classes and free functions, their members, typeinfo and vtables, and stream output of its types.
lib="$1"
[ -f "$lib" ] || { echo "no library at '$lib'"; exit 1; }

names=$(nm -D --defined-only "$lib" | awk '$2 != "A" { $1 = ""; $2 = ""; sub(/^  /, ""); print }' |
        c++filt)
[ -n "$names" ] || { echo "no exported symbols in $lib"; exit 1; }

own='(Zv|SetToSimilarityXY|CFC|Ob|_zv|gc_oABTable|AngleWithFirstAxis|ClipAndAddLineSegment|InvertParamCubic|BezierCubicRegularize|IntegrateBezierSegment|ComputePointWithSameRatio|ComputeMidPointNewPositions|ComputeNewPosition|Hermite|PreComputedHermite|ComputeP1ValidInterval|ComputeP2ValidInterval)'
stray=$(printf '%s\n' "$names" |
  sed -E 's/^(typeinfo name for|typeinfo for|vtable for|VTT for|construction vtable for|guard variable for|non-virtual thunk to|virtual thunk to) //' |
  grep -Ev "^([^(<]* )?$own" |
  grep -Ev "^operator<<\(std::basic_ostream<char, std::char_traits<char> >&, (const )?$own")
if [ -n "$stray" ]; then
  echo "libzv exports names that are not part of its interface:"
  printf '%s\n' "$stray"
  exit 1
fi
echo "$(printf '%s\n' "$names" | wc -l) exported symbols, all of the library's interface"
