#!/bin/sh
# Installs what the tests need, builds, and runs every test but those with the label "slow".
set -eu
cd "$(dirname "$0")"

Tools/install_packages build run bench test

cmake --preset debug
cmake --build --preset debug

cmake --preset fuzz
cmake --build --preset fuzz --target fuzzers
Tools/run_tests fuzz

Tools/run_tests debug "$@"
