#!/usr/bin/env bash
# Splits a results file of every prime up to 10^9 (about 50.8 million CR LF records) into files
# of 1 000 000 records with tarn-cli split and with coreutils `split -l`, best of three runs
# each in the same session, and prints the time ratio ours/theirs and our peak memory.
# Usage: bench/split_vs_coreutils.sh [build-folder] [limit]   (default build/release, 1e9)
set -euo pipefail
root="$(cd "$(dirname "$0")/.." && pwd)"
build="${1:-$root/build/release}"
limit="${2:-1e9}"
cli="$build/tarn-cli"
[ -x "$cli" ] || { echo "no tarn-cli in $build: build it first" >&2; exit 1; }
command -v primesieve >/dev/null || { echo "primesieve is missing: run scripts/setup" >&2; exit 1; }
[ -x /usr/bin/time ] || { echo "/usr/bin/time is missing: run scripts/setup" >&2; exit 1; }

work="$(mktemp -d "${TMPDIR:-/tmp}/tarn-split-bench-XXXXXX")"
trap 'rm -rf "$work"' EXIT
mkdir -p "$work/D1" "$work/D2"

echo "Results file: primes up to $limit ..."
primesieve "$limit" -p | sed 's/$/\r/' >"$work/primes.txt"
records=$(wc -l <"$work/primes.txt")
echo "  $records records, $(du -m "$work/primes.txt" | cut -f1) MB"

best() {  # best wall time in seconds of three runs of "$@"
    local best_time="" t
    for _ in 1 2 3; do
        /usr/bin/time -o "$work/time.txt" -f '%e' "$@" >/dev/null 2>&1
        t=$(tail -1 "$work/time.txt")
        if [ -z "$best_time" ] || awk "BEGIN{exit !($t < $best_time)}"; then best_time=$t; fi
    done
    echo "$best_time"
}

ours=$(best "$cli" --folder "$work" split --records 1000000 --into "$work/D1")
theirs=$(best sh -c "cd '$work/D2' && split -l 1000000 '$work/primes.txt' part")
/usr/bin/time -o "$work/time.txt" -f '%M' "$cli" --folder "$work" split --records 1000000 \
    --into "$work/D1" >/dev/null
peak=$(tail -1 "$work/time.txt")

# Both must hold the same bytes, in the same order.
cmp <(cat $(ls "$work/D1"/primes*.txt | sort -V)) "$work/primes.txt" >/dev/null ||
    { echo "tarn-cli split did not copy the file unchanged" >&2; exit 1; }
echo "  files: ours $(ls "$work/D1" | wc -l), split -l $(ls "$work/D2" | wc -l)"
echo "tarn-cli split : ${ours} s"
echo "split -l       : ${theirs} s"
awk -v a="$ours" -v b="$theirs" 'BEGIN { printf "ratio ours/theirs: %.2f\n", a / b }'
echo "peak memory of tarn-cli split: ${peak} kB"
