// guard/src/datasets.cpp: what the guard knows of open datasets.
#include "datasets.hpp"

#include "external_types.hpp"
#include "tessel/array.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
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

/// The lengths of dimensions, each of which is asked for once.
class Lengths {
  public:
    Lengths(int dataset, const Ask &asked) : ncid(dataset), ask(asked) {}

    double operator()(double dimid) {
        const auto [found, isNew] = known.try_emplace(static_cast<int>(dimid), 0);
        if (isNew) {
            found->second = ask("inq_dim", ncid, dimid)[1].number();
        }
        return found->second;
    }

  private:
    int ncid;
    const Ask &ask;
    std::unordered_map<int, double> known;
};

/// The bytes of a variable, or of one record of it.
double bytesOf(const Variable &variable, std::span<const double> dimids, Lengths &lengthOf) {
    // What only files based on HDF5 have is taken for the largest of the others.
    const auto type = static_cast<std::size_t>(variable.type);
    auto bytes = static_cast<double>(type < typeSizes.size() ? typeSizes[type] : sizeof(double));
    for (const double dimid : dimids) {
        bytes *= lengthOf(dimid);
    }
    return bytes;
}

/// Rounded up as the formats have it.
double rounded(double bytes) {
    constexpr double word = 4;
    return std::ceil(bytes / word) * word;
}

} // namespace

Layout layoutOf(int ncid, const Ask &ask) {
    const Results dataset = ask("inq", ncid);
    const int unlimited = asInt(dataset[3]);
    Lengths lengthOf(ncid, ask);
    Layout layout;
    int recordVariables = 0;
    double last = 0; // of them
    layout.records = unlimited < 0 ? 0 : static_cast<std::uint64_t>(lengthOf(unlimited));
    for (int each = 0; each < asInt(dataset[1]); ++each) {
        const Variable variable = variableOf(ncid, each, ask);
        const bool inRecords = unlimited >= 0 && hasRecords(variable, unlimited);
        const double bytes =
            bytesOf(variable, variable.dimids.first(variable.dimids.size() - (inRecords ? 1 : 0)),
                    lengthOf);
        const double whole = rounded(bytes);
        (inRecords ? layout.record : layout.fixed) += whole;
        layout.largest = std::max(layout.largest, whole);
        recordVariables += inRecords ? 1 : 0;
        last = inRecords ? bytes : last;
    }
    if (recordVariables == 1) { // the records of one are not rounded
        layout.record = last;
    }
    return layout;
}

std::optional<Layout> recordsOf(int ncid, int varid, const Ask &ask) {
    const int unlimited = asInt(ask("inq", ncid)[3]);
    if (unlimited < 0 || !hasRecords(variableOf(ncid, varid, ask), unlimited)) {
        return std::nullopt;
    }
    return layoutOf(ncid, ask);
}

} // namespace tessel::guard
