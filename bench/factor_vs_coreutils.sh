#!/usr/bin/env bash
# Times `tarn-cli factorize` against GNU coreutils `factor` on two batches made in this run
# with a fixed seed: 10 000 products of two random primes between 2.9e7 and 3.1e7 that stay in
# the entry range (the hardest kind of number there), and 10 000 random numbers below
# 922 337 203 685 277.
# Each program reads the batch on standard input; the best of three runs counts. Both outputs
# are reduced to "n: p p q" and must agree. Prints the ratio ours/theirs per batch.
#
# Usage: bench/factor_vs_coreutils.sh [path/to/tarn-cli]   (default build/release/tarn-cli)
set -euo pipefail

TARN_CLI=${1:-build/release/tarn-cli}
COUNT=${COUNT:-10000}
if [[ ! -x $TARN_CLI ]]; then
    echo "no tarn-cli at $TARN_CLI (build it first, or pass its path)" >&2
    exit 1
fi
command -v factor >/dev/null || { echo "GNU coreutils factor not found" >&2; exit 1; }

exec python3 - "$TARN_CLI" "$COUNT" <<'PY'
import random, subprocess, sys, time, tempfile, os

tarn, count = sys.argv[1], int(sys.argv[2])
rng = random.Random(20240611)

def is_prime(n):
    if n < 2:
        return False
    for p in (2, 3, 5, 7, 11, 13, 17, 19, 23, 29, 31, 37):
        if n % p == 0:
            return n == p
    d, s = n - 1, 0
    while d % 2 == 0:
        d //= 2
        s += 1
    for a in (2, 325, 9375, 28178, 450775, 9780504, 1795265022):
        x = pow(a % n, d, n)
        if x in (0, 1, n - 1):
            continue
        for _ in range(s - 1):
            x = x * x % n
            if x == n - 1:
                break
        else:
            return False
    return True

def random_prime(lo, hi):
    while True:
        p = rng.randrange(lo, hi) | 1
        if is_prime(p):
            return p

UPPER = 922337203685277

def semiprime():
    # Both factors near the square root of the upper bound; a product above it is drawn again.
    while True:
        n = random_prime(29_000_000, 31_000_000) * random_prime(29_000_000, 31_000_000)
        if n <= UPPER:
            return n

batches = {
    "semiprimes": [semiprime() for _ in range(count)],
    "random":     [rng.randrange(2, UPPER + 1) for _ in range(count)],
}

def normal_ours(text):
    out = []
    for line in text.splitlines():
        n, rhs = line.split(" = ")
        primes = []
        for term in rhs.split(" * "):
            p, _, e = term.partition("^")
            primes += [p] * int(e or 1)
        out.append(n + ": " + " ".join(primes))
    return out

def normal_theirs(text):
    return [line.strip() for line in text.splitlines()]

def best_of_three(cmd, data):
    best, output = None, None
    for _ in range(3):
        start = time.perf_counter()
        result = subprocess.run(cmd, input=data, capture_output=True, check=True)
        elapsed = time.perf_counter() - start
        best = elapsed if best is None else min(best, elapsed)
        output = result.stdout.decode()
    return best, output

failed = False
for name, numbers in batches.items():
    data = ("\n".join(map(str, numbers)) + "\n").encode()
    ours_t, ours_out = best_of_three([tarn, "factorize"], data)
    theirs_t, theirs_out = best_of_three(["factor"], data)
    ours, theirs = normal_ours(ours_out), normal_theirs(theirs_out)
    agree = ours == theirs and len(ours) == len(numbers)
    if not agree:
        failed = True
        for a, b in zip(ours, theirs):
            if a != b:
                print(f"  first difference: tarn '{a}' / factor '{b}'")
                break
    print(f"{name:>10}: {len(numbers)} numbers  tarn-cli {ours_t * 1000:8.1f} ms  "
          f"factor {theirs_t * 1000:8.1f} ms  ratio {ours_t / theirs_t:5.2f}  "
          f"{'outputs agree' if agree else 'OUTPUTS DIFFER'}")
sys.exit(1 if failed else 0)
PY
