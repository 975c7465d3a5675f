#!/usr/bin/env bash
# Times one interval of 10^9 numbers at several heights, from 10^12 to the top of the range:
# `tarn-cli resume` of a prepared checkpoint (the results file holds 2, 3, 5, 7 and the last prime
# below the candidate) against `primesieve START STOP -p` and a copy-and-sync of the same bytes,
# in the same run (best of 3 each, alternating). Prints each ratio, Tarn's peak memory and the
# share of the cores it kept busy.
# Usage: bench/height_vs_primesieve.sh [build-dir] [height...]
set -euo pipefail

top=922337203685277
span=1000000000
# shellcheck source=bench/lib.sh
source "$(dirname "$0")/lib.sh" "${1:-}" height
shift || true
heights=("$@")
[ ${#heights[@]} -gt 0 ] || heights=(1000000000000 10000000000000 100000000000000 $((top - span)))

# A stopped job whose checkpoint stands at the last candidate of the turn before `height`.
prepare() {
    local candidate=$1 limit=$2 last
    last=$(primesieve $((candidate - 2000)) "$candidate" -p | tail -1)
    printf '2\r\n3\r\n5\r\n7\r\n%s\r\n' "$last" > "$work/primes.txt"
    printf ' %s  %s  1 \r\n' "$candidate" "$limit" > "$work/primes.ini"
}

printf '%-16s %8s %8s %7s %8s %7s %9s %5s\n' height tarn primesv ratio copy+sync ratio 'peak MiB' cpu%
for height in "${heights[@]}"; do
    # The turn that starts at or above the height: turns start at 30k + 11.
    first=$((height - (height - 11) % 30))
    [ "$first" -lt "$height" ] && first=$((first + 30))
    limit=$((first + span - 1))
    [ "$limit" -gt "$top" ] && limit=$top
    t=() p=() c=()
    peakMax=0 cpuBest=0
    for _ in 1 2 3; do
        prepare $((first - 4)) "$limit"
        timed "$cli" --folder "$work" resume; t+=("$wall")
        [ "$peak" -gt "$peakMax" ] && peakMax=$peak
        [ "$cpu" -gt "$cpuBest" ] && cpuBest=$cpu
        timed sh -c "primesieve $first $limit -p > '$work/primesieve.txt'"; p+=("$wall")
        tail -n +6 "$work/primes.txt" > "$work/ours.txt"
        rm -f "$work/copy.txt"
        timed dd if="$work/ours.txt" of="$work/copy.txt" bs=8M conv=fsync status=none
        c+=("$wall")
    done
    if ! tr -d '\r' < "$work/ours.txt" | cmp -s - "$work/primesieve.txt"; then
        echo "MISMATCH at $height: the two files name different primes" >&2
        exit 1
    fi
    bt=$(best "${t[@]}") bp=$(best "${p[@]}") bc=$(best "${c[@]}")
    awk -v h="$height" -v t="$bt" -v p="$bp" -v c="$bc" -v m="$peakMax" -v u="$cpuBest" \
        'BEGIN { printf "%-16s %8.2f %8.2f %7.2f %8.2f %7.2f %9.1f %5d\n",
                 h, t, p, t / p, c, t / c, m / 1024, u }'
    rm -f "$work"/*.txt
done
echo "interval: $span numbers from each height; times in seconds, best of 3; cpu%: of one core"
