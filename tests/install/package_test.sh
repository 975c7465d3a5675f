#!/usr/bin/env bash
# Builds the Debian package from the build folder and checks it: the dependencies were computed
# from the linked libraries (Qt 6 among them), and the programs run from an unpacked copy, which
# counts as installed and so keeps its files in the user's data folder.
# Usage: package_test.sh CPACK BUILD_DIR
set -euo pipefail
cpack="$1"
build="$2"

fail() { echo "FAIL: $*" >&2; exit 1; }

tmp="$(mktemp -d)"
trap 'rm -rf "$tmp"' EXIT

"$cpack" --config "$build/CPackConfig.cmake" -G DEB -B "$tmp/out" >/dev/null
debs=("$tmp"/out/*.deb)
deb="${debs[0]}"
[ -f "$deb" ] || fail "cpack made no .deb"

info="$(dpkg-deb -I "$deb")"
depends="$(sed -n 's/^ Depends: //p' <<<"$info")"
[[ "$depends" == *libqt6* ]] || fail "Depends does not name Qt 6: '$depends'"
[[ "$depends" == *libc6* ]] || fail "Depends does not name the C library: '$depends'"
grep -q '^ Package: tarn$' <<<"$info" || fail "the package is not called tarn"

root="$tmp/root"
dpkg-deb -x "$deb" "$root"
version="$("$root/usr/bin/tarn-cli" --version)"
[[ "$version" =~ ^tarn-cli\ [0-9.]+$ ]] || fail "tarn-cli --version printed '$version'"
[ -x "$root/usr/bin/tarn" ] || fail "the desktop program is not in the package"
[ -f "$root/usr/share/doc/tarn/README.txt" ] || fail "README.txt is not in /usr/share/doc/tarn"
[ -f "$root/usr/share/icons/hicolor/32x32/apps/tarn.png" ] || fail "the icon is not in the package"
desktop-file-validate "$root/usr/share/applications/tarn.desktop"
appstreamcli validate --no-net "$root"/usr/share/metainfo/*.metainfo.xml >/dev/null ||
    appstreamcli validate --no-net "$root"/usr/share/metainfo/*.metainfo.xml

folder="$(HOME="$tmp/home" XDG_DATA_HOME= "$root/usr/bin/tarn-cli" --help |
    sed -n 's/^ *--folder [^=]*=\([^ ]*\).*/\1/p')"
[ "$folder" = "$tmp/home/.local/share/tarn/" ] ||
    fail "the packaged tarn-cli would keep its files in '$folder'"
echo "Depends: $depends"
echo "package test passed"
