#!/bin/sh
# Installs what the build needs, builds the library, and measures it.
set -eu
cd "$(dirname "$0")"

Tools/install_packages build run bench

cmake --preset release -DBUILD_TESTING=OFF
cmake --build --preset release

for program in build/release/Benchmarks/*_benchmark; do
    echo
    echo "== $(basename "$program")"
    "$program"
done
