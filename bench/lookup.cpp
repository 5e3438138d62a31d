// bench/lookup.cpp: what it costs to find an operation by its name.
//
// The names are all that there are, one after the other in an order that has nothing to do with the
// table's. Finding one makes it lower-case in place, so that each time it is copied first, and that
// alone is the reference.
#include "gateway/lookup.hpp"
#include "gateway/operation_table.hpp"
#include "pairs.hpp"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstdio>
#include <cstring>
#include <random>
#include <vector>

namespace {

using namespace tessel;
using bench::Pair;

/// Room for the longest name.
using Name = std::array<char, 32>;

std::vector<Name> namesAs(int (*letter)(int)) {
    std::vector<Name> names;
    for (const netcdf::OperationEntry &entry : netcdf::operationTable) {
        for (const char *from : {entry.longName, entry.shortName}) {
            Name &name = names.emplace_back();
            std::transform(from, from + std::strlen(from), name.begin(),
                           [&](unsigned char c) { return static_cast<char>(letter(c)); });
        }
    }
    std::shuffle(names.begin(), names.end(), std::mt19937(1));
    return names;
}

Pair pairOf(const char *what, const std::vector<Name> &names) {
    // One iteration is one name.
    auto copied = [&names, at = std::size_t{0}]() mutable {
        at = at + 1 == names.size() ? 0 : at + 1;
        return names[at];
    };
    return {what,
            [copied]() mutable {
                Name name = copied();
                benchmark::DoNotOptimize(name);
            },
            [copied]() mutable {
                Name name = copied();
                benchmark::DoNotOptimize(name);
                benchmark::DoNotOptimize(netcdf::findOperation(name.data()));
            }};
}

} // namespace

int main(int argc, char **argv) try {
    const std::vector<Name> asListed = namesAs(std::tolower);
    const std::vector<Name> inCapitals = namesAs(std::toupper);
    return bench::measure(
        argc, argv, "bench_lookup",
        {pairOf("lookup, in lower case", asListed), pairOf("lookup, in capitals", inCapitals)});
} catch (const std::exception &error) {
    std::fprintf(stderr, "bench_lookup: %s\n", error.what());
    return 1;
}
