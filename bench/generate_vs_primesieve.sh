#!/usr/bin/env bash
# Times `tarn-cli generate` against `primesieve -p` writing the same primes to the same disk,
# alternating the two (best of 3 each), and prints the wall-time ratio ours/theirs, both output
# rates, our peak memory, and the cost of the periodic flush and checkpoint (a run without them).
# Usage: bench/generate_vs_primesieve.sh [build-dir] [limit]   (TARN_BENCH_BIG=1 also times 10^10)
set -euo pipefail

root="$(cd "$(dirname "$0")/.." && pwd)"
build="${1:-$root/build/release}"
limit="${2:-1000000000}"
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

work="$(mktemp -d "$root/build/bench-gen.XXXXXX")"
trap 'rm -rf "$work"' EXIT

# Runs one command; its wall seconds go to $wall and its peak memory in kB to $peak.
timed() {
    /usr/bin/time -f '%e %M' -o "$work/time" "$@" >/dev/null 2>&1
    read -r wall peak < "$work/time"
}
ours() { timed "$cli" --folder "$work" generate "$limit" "$@"; }
theirs() { timed sh -c "primesieve $limit -p > '$work/primesieve.txt'"; }
best() { printf '%s\n' "$@" | sort -g | head -1; }

o=() t=() n=()
ourPeak=0
for _ in 1 2 3; do
    ours; o+=("$wall"); [ "$peak" -gt "$ourPeak" ] && ourPeak=$peak
    theirs; t+=("$wall")
    ours --no-sync; n+=("$wall")
done
ourBytes=$(stat -c %s "$work/primes.txt")
theirBytes=$(stat -c %s "$work/primesieve.txt")
if ! tr -d '\r' < "$work/primes.txt" | cmp -s - "$work/primesieve.txt"; then
    echo "MISMATCH: the two files name different primes" >&2
    exit 1
fi
bo=$(best "${o[@]}") bt=$(best "${t[@]}") bn=$(best "${n[@]}")
awk -v bo="$bo" -v bt="$bt" -v bn="$bn" -v ob="$ourBytes" -v tb="$theirBytes" -v pk="$ourPeak" \
    -v lim="$limit" 'BEGIN {
    printf "limit %s: tarn-cli %.2f s (%.0f MB/s), primesieve -p %.2f s (%.0f MB/s)\n",
        lim, bo, ob / bo / 1e6, bt, tb / bt / 1e6
    printf "ratio ours/theirs: %.2f\n", bo / bt
    printf "tarn-cli peak memory: %.1f MiB\n", pk / 1024
    printf "flush and checkpoint cost: %.2f s with, %.2f s without (%+.0f%%)\n",
        bo, bn, 100 * (bo - bn) / bn
}'

if [ "${TARN_BENCH_BIG:-0}" = 1 ]; then
    rm -f "$work/primes.txt" "$work/primesieve.txt"
    free=$(df -Pk "$work" | awk 'NR == 2 { print $4 }')
    if [ "$free" -lt $((8 * 1024 * 1024)) ]; then
        echo "10^10 skipped: less than 8 GB free" >&2
    else
        timed "$cli" --folder "$work" generate 10000000000
        echo "limit 10000000000: tarn-cli $wall s, $(stat -c %s "$work/primes.txt") bytes, peak $((peak / 1024)) MiB"
    fi
fi
