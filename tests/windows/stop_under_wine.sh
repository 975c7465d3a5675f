#!/usr/bin/env bash
# tarn-cli.exe stopped by Ctrl-C under Wine, in a folder with a non-ASCII name: Wine turns SIGINT
# into the console's CTRL_C_EVENT, the event a Windows user's Ctrl-C raises. The job leaves exit
# code 3 and a checkpoint that a resume takes to the file of one uninterrupted run.
# Usage: stop_under_wine.sh TARN_CLI_EXE
set -euo pipefail
cli="$1"
export WINEDEBUG=-all LC_ALL=C.UTF-8
work="$(mktemp -d)"
trap 'rm -rf "$work"' EXIT
stopped="$work/Primzahlen ü 素数" whole="$work/whole"
mkdir "$stopped" "$whole"
limit=400000000

# `wine` becomes the Windows process itself, so $! is the process the signal must reach.
wine "$cli" --folder "$stopped" generate "$limit" >"$work/out" 2>"$work/err" &
job=$!
for _ in $(seq 600); do
    [ "$(stat -c %s "$stopped/primes.txt" 2>/dev/null || echo 0)" -gt 1000000 ] && break
    sleep 0.05
done
kill -INT "$job"
code=0
wait "$job" || code=$?
[ "$code" -eq 3 ] || { echo "exit code $code, not 3: $(cat "$work/err")"; exit 1; }
[ "$(cat "$work/err")" = "All calculations were stopped!" ] || { cat "$work/err"; exit 1; }
checkpoint="$(cat "$stopped/primes.ini")"
[[ "$checkpoint" =~ ^\ [0-9]+\ \ $limit\ \ 1\ $'\r'$ ]] || { echo "checkpoint: $checkpoint"; exit 1; }

wine "$cli" --folder "$stopped" resume >/dev/null 2>"$work/err" || { cat "$work/err"; exit 1; }
wine "$cli" --folder "$whole" generate "$limit" >/dev/null
cmp "$stopped/primes.txt" "$whole/primes.txt"
cmp "$stopped/primes.ini" "$whole/primes.ini"
echo "stopped at ${checkpoint% *}, resumed to the file of one run"
