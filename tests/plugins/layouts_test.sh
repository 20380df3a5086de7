#!/bin/sh
# The plug-in ABI structs have the documented layout with 4-byte pointers, too, whatever this build
# uses.
project=$(cd "$(dirname "$0")/../.." && pwd)
compiler=${CXX:-g++}
syntax="-m32 -ffreestanding -fsyntax-only"
layouts="$compiler $syntax -std=c++20 -I$project/src $project/src/plugins/block_layouts.cpp"
if ! echo 'static_assert(sizeof(void*) == 4);' | $compiler $syntax -x c++ - 2>/dev/null; then
  echo "skipped: $compiler has no 32-bit target"
  exit 77
fi
$layouts && echo "the layouts hold with 4-byte pointers"
