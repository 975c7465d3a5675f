#!/usr/bin/env bash
# Installs Tarn into a temporary prefix and checks what an installed copy does: the programs run
# from there, the desktop entry and the AppStream data validate, and an unprivileged user's
# primes.txt and primes.ini go to the user's data folder, never into the prefix. A copy outside
# an installation keeps its files beside the program while it may write there.
# Usage: install_test.sh CMAKE BUILD_DIR WITH_UI(0|1)
set -euo pipefail
cmake="$1"
build="$2"
ui="$3"

fail() { echo "FAIL: $*" >&2; exit 1; }

tmp="$(mktemp -d)"
trap 'chmod -R u+w "$tmp" 2>/dev/null; rm -rf "$tmp"' EXIT
chmod 755 "$tmp"  # the unprivileged user must reach the programs inside

prefix="$tmp/prefix"
"$cmake" --install "$build" --prefix "$prefix" >/dev/null
cli="$prefix/bin/tarn-cli"

version="$("$cli" --version)"
[[ "$version" =~ ^tarn-cli\ [0-9]+\.[0-9]+\.[0-9]+$ ]] || fail "tarn-cli --version printed '$version'"
[ -f "$prefix/share/doc/tarn/README.txt" ] || fail "README.txt is not in share/doc/tarn"
cmp -s "$prefix/share/doc/tarn/README.txt" "$(dirname "$0")/../../README.md" ||
    fail "the installed README.txt is not README.md"

if [ "$ui" = 1 ]; then
    [ -x "$prefix/bin/tarn" ] || fail "the desktop program is not installed"
    desktop-file-validate "$prefix/share/applications/tarn.desktop"
    metainfo=("$prefix"/share/metainfo/*.metainfo.xml)
    [ -f "${metainfo[0]}" ] || fail "no AppStream metainfo installed"
    appstreamcli validate --no-net "${metainfo[@]}" >/dev/null ||
        appstreamcli validate --no-net "${metainfo[@]}"
    [ -f "$prefix/share/icons/hicolor/scalable/apps/tarn.svg" ] || fail "no scalable icon"
    file "$prefix/share/icons/hicolor/32x32/apps/tarn.png" | grep -q 'PNG image data, 32 x 32' ||
        fail "the 32x32 icon is not a 32x32 PNG"
fi

# The user who runs the installed copy: nobody when we are root (root may write anywhere, so a
# read-only program folder can only be shown to someone else), else ourselves.
home="$tmp/home"
mkdir -p "$home"
if [ "$(id -u)" -eq 0 ]; then
    as_user=(setpriv --reuid=nobody --regid=nogroup --clear-groups)
    chown nobody:nogroup "$home"
else
    as_user=()
fi
user() { "${as_user[@]}" env HOME="$home" XDG_DATA_HOME="$home/data" "$@"; }
default_folder() { "$@" --help | sed -n 's/^ *--folder [^=]*=\([^ ]*\).*/\1/p'; }

# The folder a program uses when --folder is not given, as its help shows it.
[ "$(default_folder user "$cli")" = "$home/data/tarn/" ] ||
    fail "installed copy: default folder '$(default_folder user "$cli")', wanted $home/data/tarn/"
[ "$("${as_user[@]}" env HOME="$home" XDG_DATA_HOME= "$cli" --help |
    sed -n 's/^ *--folder [^=]*=\([^ ]*\).*/\1/p')" = "$home/.local/share/tarn/" ] ||
    fail "installed copy without XDG_DATA_HOME does not use ~/.local/share/tarn/"
# An installed copy stays out of its prefix even for a user who may write there.
[ "$(HOME="$tmp/other" XDG_DATA_HOME= default_folder "$cli")" = "$tmp/other/.local/share/tarn/" ] ||
    fail "an installed copy in a writable prefix keeps its files in the prefix"

# A portable copy keeps its files beside the program, unless the user cannot write there.
portable="$tmp/portable"
mkdir "$portable"
cp "$build/tarn-cli" "$portable/"
[ "$(default_folder "$portable/tarn-cli")" = "$portable/" ] ||
    fail "portable copy: default folder is not the program folder"
[ "$(id -u)" -eq 0 ] || chmod a-w "$portable"
[ "$(default_folder user "$portable/tarn-cli")" = "$home/data/tarn/" ] ||
    fail "read-only portable copy: default folder is not the user's data folder"

# A command creates the missing data folder, private to the user.
[ ! -e "$home/data/tarn" ] || fail "the help text created the data folder"
user "$cli" test 97 >/dev/null
[ -d "$home/data/tarn" ] || fail "the data folder was not created"
[ "$(stat -c %a "$home/data/tarn")" = 700 ] || fail "the data folder is not private to its user"
[ -z "${as_user[*]}" ] || [ "$(stat -c %U "$home/data/tarn")" = nobody ] ||
    fail "the data folder does not belong to its user"

# Only when this build has the generate command (its own help names its usage).
if user "$cli" generate --help 2>/dev/null | grep -q '^Usage: .*tarn-cli generate'; then
    user "$cli" generate 1000 >"$tmp/generate.out" || fail "tarn-cli generate 1000 failed"
    [ "$(grep -c . "$home/data/tarn/primes.txt")" = 168 ] ||
        fail "primes.txt in the data folder does not hold the 168 primes up to 1000"
    [ -f "$home/data/tarn/primes.ini" ] || fail "primes.ini is not in the data folder"
    [ -z "$(find "$prefix" -name 'primes.*')" ] || fail "files were written into the prefix"
    echo "generate 1000 wrote its files into the user's data folder"
else
    echo "SKIP: this tarn-cli has no generate command; the folder choice was checked through --help"
fi
echo "install test passed"
