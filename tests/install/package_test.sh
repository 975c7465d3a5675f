#!/usr/bin/env bash
# Builds the Debian package from the build folder and checks it: lintian finds no error and no
# warning (no tag is overridden), the dependencies were computed from the linked libraries (Qt 6
# among them), the programs run from an unpacked copy, which counts as installed and so keeps its
# files in the user's data folder, the manual pages render, the changelog is this version's, and
# the bash completion that bash-completion loads offers what tarn-cli --help-all lists.
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

lintian --fail-on error,warning "$deb" || fail "lintian found the errors or warnings above"

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
doc="$root/usr/share/doc/tarn"
grep -qx 'License: Expat' "$doc/copyright" || fail "the copyright file does not name the licence"
changelog="$(zcat "$doc/changelog.gz" | dpkg-parsechangelog -l - -S Version)"
[ "$changelog" = "${version#tarn-cli }" ] ||
    fail "the changelog's latest version is '$changelog', the package's ${version#tarn-cli }"
for page in tarn tarn-cli; do
    text="$(MANWIDTH=80 man -l "$root/usr/share/man/man1/$page.1.gz")"
    for section in SYNOPSIS OPTIONS 'EXIT STATUS' FILES EXAMPLES; do
        grep -qx "$section" <<<"$text" || fail "$page(1) has no $section"
    done
done
desktop-file-validate "$root/usr/share/applications/tarn.desktop"
appstreamcli validate --no-net "$root"/usr/share/metainfo/*.metainfo.xml >/dev/null ||
    appstreamcli validate --no-net "$root"/usr/share/metainfo/*.metainfo.xml

folder="$(HOME="$tmp/home" XDG_DATA_HOME= "$root/usr/bin/tarn-cli" --help |
    sed -n 's/^ *--folder [^=]*=\([^ ]*\).*/\1/p')"
[ "$folder" = "$tmp/home/.local/share/tarn/" ] ||
    fail "the packaged tarn-cli would keep its files in '$folder'"
# The words the completion offers for a command line, completing its last word; loaded the way
# bash-completion does on the first use of tarn-cli, from the unpacked package.
offered() {
    XDG_DATA_DIRS="$root/usr/share" bash -c '
        source /usr/share/bash-completion/bash_completion
        __load_completion tarn-cli || exit 1
        read -ra COMP_WORDS <<<"$1"
        [[ "$1" == *" " ]] && COMP_WORDS+=("")
        COMP_CWORD=$((${#COMP_WORDS[@]} - 1))
        function=$(complete -p tarn-cli | sed -n "s/.*-F \([^ ]*\) .*/\1/p")
        "$function" tarn-cli "${COMP_WORDS[COMP_CWORD]}" "${COMP_WORDS[COMP_CWORD - 1]}"
        printf "%s\n" "${COMPREPLY[@]}" | sort' _ "$1"
}
# What --help-all lists: with no argument the subcommands and the program's options, else the
# options of that subcommand (with its --help).
listed() {
    "$root/usr/bin/tarn-cli" --help-all | awk -v want="$1" '
        /^Subcommands:$/ { section = "-"; next }
        section == "" && /^  -/ { if (want == "") { sub(/^-h,/, "", $1); print $1 } next }
        /^[a-z]+$/ { section = $1; if (want == "") print $1; else if (want == $1) print "--help" }
        section == want && /^    --/ { print $1 }' | sort
}
for command in "" $(listed "" | grep -v "^-"); do
    line="tarn-cli ${command:+--folder /tmp $command --}"
    [ "$(offered "$line")" = "$(listed "$command")" ] || fail "completing '$line' offers:" \
        "$(offered "$line" | tr '\n' ' '); --help-all lists: $(listed "$command" | tr '\n' ' ')"
done
mkdir -p "$tmp/dirs/a b" "$tmp/dirs/ab"
touch "$tmp/dirs/afile"
for line in "tarn-cli --folder $tmp/dirs/a" "tarn-cli split --records 1000 --into $tmp/dirs/a"; do
    [ "$(offered "$line")" = "$(printf '%s\n' "$tmp/dirs/a b" "$tmp/dirs/ab")" ] ||
        fail "completing '$line' offers '$(offered "$line")', not the two folders"
done

echo "Depends: $depends"
echo "package test passed"
