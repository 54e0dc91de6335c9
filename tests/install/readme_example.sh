#!/bin/sh
# readme_example.sh SOURCE_DIR: the program in README.md is the example that the tests build and run.
set -eu
cd "$1"
# The quotes hold a pattern, nothing to expand.
# shellcheck disable=SC2016
sed -n '/^```cpp$/,/^```$/p' README.md | sed '1d;$d' | diff -u - examples/channel_host.cpp
