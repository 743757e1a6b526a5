#!/usr/bin/env bash
# Installs the built library into a scratch prefix, then builds and runs a
# separate consumer against it twice: through find_package(ZOA) and through pkg-config.
set -euo pipefail
build_dir=$1 work=$2 consumer=$3 cxx=$4 cxxflags=${5:-}

rm -rf "$work"
mkdir -p "$work"
cmake --install "$build_dir" --prefix "$work/prefix" >/dev/null

cmake -S "$consumer" -B "$work/cmake-build" -DCMAKE_PREFIX_PATH="$work/prefix" \
      -DCMAKE_CXX_COMPILER="$cxx" -DCMAKE_CXX_FLAGS="$cxxflags" >/dev/null
cmake --build "$work/cmake-build" >/dev/null
"$work/cmake-build/consumer"

libdir=$(dirname "$(find "$work/prefix" -name zoa.pc | head -n1)")/..
export PKG_CONFIG_PATH="$libdir/pkgconfig"
# shellcheck disable=SC2046
"$cxx" $cxxflags "$consumer/consumer.cpp" -o "$work/consumer-pc" $(pkg-config --cflags --libs zoa)
LD_LIBRARY_PATH="$libdir" "$work/consumer-pc"
echo "package ok"
