// The simplest sieve of Eratosthenes: the oracle the fast engines are checked against.
#pragma once

#include <cstddef>
#include <vector>

namespace tarn::test {

inline std::vector<bool> plainSieve(std::size_t limit) {
    std::vector<bool> prime(limit + 1, true);
    prime[0] = false;
    if (limit >= 1) prime[1] = false;
    for (std::size_t p = 2; p * p <= limit; ++p)
        if (prime[p])
            for (std::size_t m = p * p; m <= limit; m += p) prime[m] = false;
    return prime;
}

}  // namespace tarn::test
