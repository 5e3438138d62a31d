// guard/src/datasets.cpp: what the guard knows of open datasets.
#include "datasets.hpp"

#include "external_types.hpp"
#include "tessel/array.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <span>

namespace tessel::guard {
namespace {

int asInt(const Array &array) {
    return static_cast<int>(array.number());
}

struct Variable {
    int type;
    std::span<const double> dimids; // the host's order: the dimension of the records comes last
    Results answer;
};

Variable variableOf(int ncid, int varid, const Ask &ask) {
    Results answer = ask("inq_var", ncid, varid);
    const int type = asInt(answer[1]);
    const std::span<const double> dimids = answer[2].elements<double>();
    return {type, dimids, std::move(answer)};
}

bool hasRecords(const Variable &variable, int unlimited) {
    return !variable.dimids.empty() && static_cast<int>(variable.dimids.back()) == unlimited;
}

std::uint64_t lengthOf(int ncid, int dimid, const Ask &ask) {
    return static_cast<std::uint64_t>(ask("inq_dim", ncid, dimid)[1].number());
}

/// The bytes of one record of a variable, rounded up as the formats have it.
std::uint64_t recordBytes(int ncid, const Variable &variable, const Ask &ask) {
    // What only files based on HDF5 have is taken for the largest of the others.
    const auto type = static_cast<std::size_t>(variable.type);
    std::uint64_t bytes = type < typeSizes.size() ? typeSizes[type] : sizeof(double);
    for (const double dimid : variable.dimids.first(variable.dimids.size() - 1)) {
        bytes *= lengthOf(ncid, static_cast<int>(dimid), ask);
    }
    return (bytes + 3) / 4 * 4;
}

} // namespace

std::optional<Records> recordsOf(int ncid, int varid, const Ask &ask) {
    const Results dataset = ask("inq", ncid);
    const int unlimited = asInt(dataset[3]);
    if (unlimited < 0 || !hasRecords(variableOf(ncid, varid, ask), unlimited)) {
        return std::nullopt;
    }
    Records records{lengthOf(ncid, unlimited, ask), 0};
    for (int each = 0; each < asInt(dataset[1]); ++each) {
        const Variable variable = variableOf(ncid, each, ask);
        if (hasRecords(variable, unlimited)) {
            records.bytes += recordBytes(ncid, variable, ask);
        }
    }
    return records;
}

} // namespace tessel::guard
