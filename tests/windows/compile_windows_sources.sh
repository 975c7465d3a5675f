#!/usr/bin/env bash
# Compiles the sources that only a Windows build uses with the MinGW-w64 cross compiler, so that
# the Windows shell layer and the Windows branches of the core keep building on a Linux machine.
# Usage: compile_windows_sources.sh CROSS_CXX SOURCE_DIR
set -euo pipefail
cxx="$1"
src="$2/src"
out="$(mktemp -d)"
trap 'rm -rf "$out"' EXIT

for f in platform/windows_shell.cpp platform/utf16.cpp core/app_folder.cpp core/data_folder.cpp; do
    "$cxx" -std=c++20 -Wall -Wextra -Werror -I"$src" -c "$src/$f" -o "$out/$(basename "$f").o"
    echo "compiled $f"
done
