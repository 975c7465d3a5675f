#!/usr/bin/env bash
# The Windows package: `cpack -G ZIP` gives tarn-cli-<version>-win64.zip holding tarn-cli.exe,
# which needs no DLL beside it, README.txt and LICENSE.txt.
# Usage: zip_package_test.sh CPACK BUILD_DIR VERSION
set -euo pipefail
cpack="$1" build="$2" version="$3"
out="$(mktemp -d)"
trap 'rm -rf "$out"' EXIT
"$cpack" -G ZIP -B "$out" --config "$build/CPackConfig.cmake" >/dev/null
zip="$out/tarn-cli-$version-win64.zip"
names="$(python3 -c 'import sys, zipfile; print("\n".join(sorted(zipfile.ZipFile(sys.argv[1]).namelist())))' "$zip")"
expected="tarn-cli-$version-win64/LICENSE.txt
tarn-cli-$version-win64/README.txt
tarn-cli-$version-win64/tarn-cli.exe"
[ "$names" = "$expected" ] || { echo "zip holds:"; echo "$names"; exit 1; }
# Only system DLLs: the C++ runtime and threads are linked in.
imports="$(x86_64-w64-mingw32-objdump -p "$build/tarn-cli.exe" | sed -n 's/^\s*DLL Name: //p' | tr 'A-Z' 'a-z')"
if echo "$imports" | grep -qE 'libstdc|libgcc|libwinpthread'; then
    echo "tarn-cli.exe needs DLLs: $imports"
    exit 1
fi
echo "$zip: $names"
