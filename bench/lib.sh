# shellcheck shell=bash
# Set-up shared by the benchmarks that time tarn-cli against primesieve: sourced with the
# build folder (default build/release) and a name for the work folder. Leaves $root, $build,
# $cli and $work (removed on exit), and installs primesieve and GNU time when missing.

root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
build="${1:-$root/build/release}"
cli="$build/tarn-cli"
[ -x "$cli" ] || { echo "no $cli: build first" >&2; exit 1; }

sudo=()
[ "$(id -u)" -ne 0 ] && sudo=(sudo)
need=()
command -v primesieve >/dev/null || need+=(primesieve)
[ -x /usr/bin/time ] || need+=(time)
if [ ${#need[@]} -gt 0 ]; then
    "${sudo[@]}" apt-get install -y -qq --no-install-recommends "${need[@]}"
fi

work="$(mktemp -d "$root/build/bench-$2.XXXXXX")"
trap 'rm -rf "$work"' EXIT

# Runs one command; its wall seconds go to $wall, its peak memory in kB to $peak, and the share
# of one core it used, in percent, to $cpu.
# shellcheck disable=SC2034
timed() {
    /usr/bin/time -f '%e %M %P' -o "$work/time" "$@" >/dev/null 2>&1
    read -r wall peak cpu < "$work/time"
    cpu=${cpu%\%}
}
# The smallest of its arguments.
best() { printf '%s\n' "$@" | sort -g | head -1; }
