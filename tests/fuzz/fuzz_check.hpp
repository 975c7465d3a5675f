// What the harnesses share: a property that, when it fails, ends the run with a report, so that
// libFuzzer keeps the input and a replay of the corpus fails its test; and a file of given bytes.
#pragma once

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "support/temp_folder.hpp"

#define FUZZ_CHECK(condition)                                                                    \
    ((condition) ? void()                                                                        \
                 : (std::fprintf(stderr, "%s:%d: failed: %s\n", __FILE__, __LINE__, #condition), \
                    std::abort()))

// The path of `name`, holding `bytes`, in a folder kept for the whole run.
inline std::string fileHolding(std::string_view bytes, const std::string& name) {
    static const tarn::test::TempFolder folder;
    tarn::test::writeFile(folder.path() + name, std::string(bytes));
    return folder.path() + name;
}
