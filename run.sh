#!/bin/sh
# Installs what the build needs, builds the library and the command line, and shows what can be seen.
#
# ./run.sh                    what "orvane inspect" makes of two sample feeds, a good one and a bad one
# ./run.sh inspect FILE...    the same with arguments of your own, for "orvane"
# ./run.sh bench              measures the library
set -eu
# Files are named from where the user stands.
called=$PWD
cd "$(dirname "$0")"
top=$PWD

what=${1:-samples}
case $what in
bench) Tools/install_packages build run bench ;;
*) Tools/install_packages build run ;;
esac

build() {
    cmake --preset release -DBUILD_TESTING=OFF "-DORVANE_BENCHMARKS=$1"
    cmake --build --preset release
}

export ORVANE_PROGRAMS="$top/build/release/libexec/orvane"
export ORVANE_RESOURCES="$top/build/release/share/orvane"

if [ "$what" = bench ]; then
    build ON
    for program in build/release/Benchmarks/*_benchmark; do
        echo
        echo "== $(basename "$program")"
        "$program"
    done
    exit
fi

# What is built is of no interest to who wants to use it, unless it fails.
build OFF >&2
if [ "$what" = samples ]; then
    build/release/bin/orvane inspect Resources/samples/news.xml Resources/samples/broken.rss
else
    cd "$called"
    "$top/build/release/bin/orvane" "$@"
fi
