#!/usr/bin/env bash
# Times `tarn-cli generate` against `primesieve -p` writing the same primes to the same disk,
# alternating the two (best of 3 each): a table of our time, output rate and ratio ours/theirs
# with 1, 2 and all sieving threads, our peak memory, and a run without the periodic flush and
# checkpoint.
# Usage: bench/generate_vs_primesieve.sh [build-dir] [limit]   (TARN_BENCH_BIG=1 also times 10^10)
set -euo pipefail

limit="${2:-1000000000}"
# shellcheck source=bench/lib.sh
source "$(dirname "$0")/lib.sh" "${1:-}" gen
ours() { timed "$cli" --folder "$work" generate "$limit" "$@"; }
theirs() { timed sh -c "primesieve $limit -p > '$work/primesieve.txt'"; }

cores=$(nproc)
threadCounts=(1 2 "$cores")
[ "$cores" -le 2 ] && threadCounts=(1 2)
declare -A times
t=()
ourPeak=0
for _ in 1 2 3; do
    for k in "${threadCounts[@]}"; do
        ours --threads "$k"; times[$k]+="$wall "
        [ "$peak" -gt "$ourPeak" ] && ourPeak=$peak
    done
    theirs; t+=("$wall")
done
ourBytes=$(stat -c %s "$work/primes.txt")
theirBytes=$(stat -c %s "$work/primesieve.txt")
if ! tr -d '\r' < "$work/primes.txt" | cmp -s - "$work/primesieve.txt"; then
    echo "MISMATCH: the two files name different primes" >&2
    exit 1
fi
bt=$(best "${t[@]}")
printf 'limit %s, %s cores; primesieve -p: %.2f s (%.0f MB/s)\n' "$limit" "$cores" "$bt" \
    "$(awk -v b="$theirBytes" -v s="$bt" 'BEGIN { print b / s / 1e6 }')"
printf '%-9s %8s %8s %12s\n' threads seconds MB/s ours/theirs
for k in "${threadCounts[@]}"; do
    # shellcheck disable=SC2086
    bo=$(best ${times[$k]})
    awk -v k="$k" -v bo="$bo" -v bt="$bt" -v ob="$ourBytes" \
        'BEGIN { printf "%-9s %8.2f %8.0f %12.2f\n", k, bo, ob / bo / 1e6, bo / bt }'
done
printf 'tarn-cli peak memory: %.1f MiB\n' "$(awk -v p="$ourPeak" 'BEGIN { print p / 1024 }')"

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
