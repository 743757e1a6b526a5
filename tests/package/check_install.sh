#!/usr/bin/env bash
# Installs the built library into a scratch prefix, moves the prefix elsewhere,
# runs the installed zoa tool from there without any library path, and builds
# and runs a separate consumer of each library (zoa, zoa-text, zoa-interp)
# twice: through find_package(ZOA) and through pkg-config.
set -euo pipefail
build_dir=$1 work=$2 consumer=$3 cxx=$4 cxxflags=${5:-}

rm -rf "$work"
mkdir -p "$work"
cmake --install "$build_dir" --prefix "$work/installed" >/dev/null
# The installed tree must not depend on where it was installed.
mv "$work/installed" "$work/prefix"
prefix=$work/prefix
unset LD_LIBRARY_PATH

echo '(unit gcc (subprog s0 "seven" INT_S (block L0 (MOVE t0 (CONST INT_S 7)) (JUMP L1))))' >"$work/seven.zoa"
(cd / && "$prefix/bin/zoa" --version >/dev/null)
c_text=$(cd / && "$prefix/bin/zoa" --emit=c "$work/seven.zoa")
[[ $c_text == *"int seven"* ]]
[ "$(cd / && "$prefix/bin/zoa" --run=seven "$work/seven.zoa")" = 7 ]

cmake -S "$consumer" -B "$work/cmake-build" -DCMAKE_PREFIX_PATH="$prefix" \
      -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_CXX_FLAGS="$cxxflags" >/dev/null
cmake --build "$work/cmake-build" >/dev/null
for program in consumer text_consumer interp_consumer; do
  "$work/cmake-build/$program"
done

libdir=$(dirname "$(dirname "$(find "$prefix" -name zoa.pc | head -n1)")")
export PKG_CONFIG_PATH="$libdir/pkgconfig"
for pair in zoa:consumer zoa-text:text_consumer zoa-interp:interp_consumer; do
  package=${pair%%:*} program=${pair#*:}
  # shellcheck disable=SC2046
  "$cxx" $cxxflags "$consumer/$program.cpp" -o "$work/$program-pc" $(pkg-config --cflags --libs "$package")
  LD_LIBRARY_PATH="$libdir" "$work/$program-pc"
done
echo "package ok"
