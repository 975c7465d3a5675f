#!/usr/bin/env bash
# Compiles the window's Windows shell with the MinGW-w64 cross compiler, so that it keeps building
# on a Linux machine, where no Qt for Windows can be installed (the rest of the Windows build is
# the `windows` preset). Each file sees the
# include roots of its own layer, as in the build.
# Usage: compile_windows_sources.sh CROSS_CXX SOURCE_DIR
set -euo pipefail
cxx="$1"
src="$2/src"
out="$(mktemp -d)"
trap 'rm -rf "$out"' EXIT

# The include roots of the layers, as the build lays them out: <root>/<folder> -> src/<folder>.
for layer in platform core generation tools ui; do
    mkdir -p "$out/layers/$layer"
    ln -s "$src/$layer" "$out/layers/$layer/$layer"
done
platform=(-I"$out/layers/platform")
core=("${platform[@]}" -I"$out/layers/core")
ui=("${core[@]}" -I"$out/layers/generation" -I"$out/layers/tools" -I"$out/layers/ui")

compile() {
    local f="$1"
    shift
    "$cxx" -std=c++20 -Wall -Wextra -Werror "$@" -c "$src/$f" -o "$out/$(basename "$f").o"
    echo "compiled $f"
}
compile ui/shell/desktop_shell_windows.cpp "${ui[@]}"
