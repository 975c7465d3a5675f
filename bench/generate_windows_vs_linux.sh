#!/usr/bin/env bash
# Times the Windows build's `tarn-cli.exe generate` under Wine against the Linux build's
# `tarn-cli generate` on the same disk, alternating the two (best of 3 each), checks that both
# write the same bytes, and prints the ratio Windows/Linux.
# Usage: bench/generate_windows_vs_linux.sh [limit]   (builds: build/release, build/windows)
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
limit="${1:-1000000000}"
linux="$root/build/release/tarn-cli" windows="$root/build/windows/tarn-cli.exe"
for p in "$linux" "$windows"; do [ -x "$p" ] || { echo "no $p: build first" >&2; exit 1; }; done
export WINEDEBUG=-all

work="$(mktemp -d "$root/build/bench-win.XXXXXX")"
trap 'rm -rf "$work"' EXIT
mkdir "$work/linux" "$work/windows"

# The wall seconds of one run.
timed() {
    local start end
    start=$(date +%s.%N)
    "$@" >/dev/null
    end=$(date +%s.%N)
    awk -v a="$start" -v b="$end" 'BEGIN { printf "%.3f\n", b - a }'
}
best() { printf '%s\n' "$@" | sort -g | head -1; }

wine "$windows" --version >/dev/null  # the Wine server is up before the first timed run
l=() w=()
for _ in 1 2 3; do
    l+=("$(timed "$linux" --folder "$work/linux" generate "$limit")")
    w+=("$(timed wine "$windows" --folder "$work/windows" generate "$limit")")
done
for f in primes.txt primes.ini; do
    cmp "$work/linux/$f" "$work/windows/$f" || { echo "MISMATCH in $f" >&2; exit 1; }
done
bl=$(best "${l[@]}") bw=$(best "${w[@]}")
printf 'limit %s, %s cores, same bytes (%s)\n' "$limit" "$(nproc)" \
    "$(stat -c %s "$work/linux/primes.txt")"
printf 'Linux %.2f s, Windows under Wine %.2f s, Windows/Linux %.2f\n' "$bl" "$bw" \
    "$(awk -v w="$bw" -v l="$bl" 'BEGIN { print w / l }')"
