// tests/difference/author_values.cpp: the values in programs, good and bad.
#include "author.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cmath>
#include <limits>

namespace difference {
namespace {

constexpr double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double infinity = std::numeric_limits<double>::infinity();

/// The range of each class that has one, and values that are apt to go wrong.
struct Range {
    tsClassID classID;
    double low;
    double high;
};
constexpr std::array ranges = {
    Range{tsINT8, -128, 127},
    Range{tsUINT8, 0, 255},
    Range{tsINT16, -32768, 32767},
    Range{tsUINT16, 0, 65535},
    Range{tsINT32, -2147483648, 2147483647},
    Range{tsUINT32, 0, 4294967295},
    Range{tsINT64, -0x1p63, 0x1p62},
    Range{tsUINT64, 0, 0x1p63},
    Range{tsCHAR, 0, 65535},
    Range{tsLOGICAL, 0, 1},
};

constexpr std::array extremes = {0.0,     1.0,     -1.0,         127.0,        128.0,    255.0,
                                 256.0,   -128.0,  -129.0,       32767.0,      32768.0,  -32769.0,
                                 65535.0, 65536.0, 2147483647.0, 2147483648.0, 0x1p31,   -0x1p31,
                                 0x1p62,  -0x1p63, 0x1p63,       4294967295.0, -32767.0, -127.0};
constexpr std::array floating = {0.5, -0.0, -1.5, 1e30, -1e30, nan, infinity, -infinity};

const std::vector<std::u16string> plainNames = {u"",           u"x",   u"time",
                                                u"_FillValue", u"a b", u"lat-1"};
const std::vector<std::u16string> strangeNames = {u"",
                                                  u"a/b",
                                                  u"trailing ",
                                                  u" leading",
                                                  u"0digit",
                                                  u"\u00e9",
                                                  u"e\u0301",
                                                  u"\xd834\xdd1e",
                                                  u"\xd834z",
                                                  u"tab\t",
                                                  std::u16string(u"nul\0after", 9),
                                                  std::u16string(257, u'n'),
                                                  u"\x80"};

bool isFloating(tsClassID classID) {
    return classID == tsDOUBLE || classID == tsSINGLE;
}

/// A value as a class can hold it.
double fitted(double value, tsClassID classID) {
    if (classID == tsDOUBLE) {
        return value;
    }
    if (classID == tsSINGLE) {
        return static_cast<double>(static_cast<float>(value));
    }
    const auto *const range = std::find_if(
        ranges.begin(), ranges.end(), [&](const Range &row) { return row.classID == classID; });
    if (range == ranges.end() || std::isnan(value)) {
        return 0.0;
    }
    return std::clamp(std::trunc(value), range->low, range->high);
}

Value asClass(const Value &value, tsClassID classID) {
    Value other = value;
    other.classID = classID;
    std::transform(other.elements.begin(), other.elements.end(), other.elements.begin(),
                   [&](double element) { return fitted(element, classID); });
    return other;
}

} // namespace

Plan::Variable *Author::variableFor(std::size_t member) {
    std::vector<Plan::Variable> &all = here().variables;
    std::vector<Plan::Variable *> fitting;
    for (Plan::Variable &variable : all) {
        if ((variable.type == NC_CHAR) == (member == textMember)) {
            fitting.push_back(&variable);
        }
    }
    if (all.empty()) {
        return nullptr;
    }
    return fitting.empty() || chance.percent(4) ? &all[chance.below(all.size())]
                                                : chance.oneOf(fitting);
}

std::vector<Plan::Attribute> *Author::attributesOf(double varid) {
    Plan::Dataset &in = here();
    if (varid < 0) {
        return &in.globals;
    }
    const auto at = static_cast<std::size_t>(varid);
    return at < in.variables.size() ? &in.variables[at].attributes : nullptr;
}

double Author::variableOrGlobal() {
    const std::size_t n = here().variables.size();
    return n == 0 || chance.percent(40) ? NC_GLOBAL : static_cast<double>(chance.below(n));
}

Value Author::id(double value) {
    if (chance.percent(10)) {
        return of(tsINT32, {value});
    }
    if (chance.percent(5)) {
        return row({value < 0 ? value - 0.5 : value + 0.5, 99});
    }
    return num(value);
}

Value Author::newName(const char16_t *prefix) {
    if (chance.percent(5)) {
        return characters(chance.oneOf(strangeNames));
    }
    std::u16string name = chance.oneOf(plainNames);
    if (name.empty() || chance.percent(70)) {
        name = prefix;
        name += static_cast<char16_t>(u'0' + chance.below(10));
        name += static_cast<char16_t>(u'a' + chance.below(26));
    }
    return characters(name);
}

Value Author::attributeName(const std::vector<Plan::Attribute> &known) {
    return known.empty() || chance.percent(10) ? newName(u"a") : chance.oneOf(known).name;
}

Value Author::positions(const std::vector<double> &libraryOrder) {
    Value value = row({libraryOrder.rbegin(), libraryOrder.rend()});
    if (chance.percent(10)) {
        value.dims = {value.elements.size(), 1};
    }
    return chance.percent(70)
               ? value
               : asClass(value, static_cast<tsClassID>(chance.between(tsDOUBLE, tsUINT64)));
}

double Author::element(tsClassID classID, bool tame) {
    if (classID == tsCHAR) {
        return static_cast<double>(tame ? chance.between(' ', '~') : chance.below(65536));
    }
    if (tame) {
        return static_cast<double>(chance.below(101));
    }
    const bool special = isFloating(classID) && chance.percent(30);
    return fitted(special ? chance.oneOf(floating) : chance.oneOf(extremes), classID);
}

Value Author::values(std::size_t member, std::size_t n, bool tame) {
    const tsClassID classID = members.at(member).classID;
    std::vector<double> list(n);
    std::generate(list.begin(), list.end(), [&] { return element(classID, tame); });
    Value value = of(classID, std::move(list));
    if (n == 0 && chance.percent(50)) {
        value.dims = {0, 0};
    } else if (n % 2 == 0 && chance.percent(30)) {
        value.dims = {2, n / 2};
    }
    return value;
}

std::size_t Author::lengthOf(std::size_t dim) {
    const std::size_t length = here().dims.at(dim).length;
    return length == 0 ? here().records : length;
}

Author::Block Author::block(const Plan::Variable &variable, bool writes, bool strided) {
    Block part;
    for (const std::size_t dim : variable.dims) {
        const bool isRecord = here().dims.at(dim).length == 0;
        const std::size_t room = isRecord && writes ? here().records + 3 : lengthOf(dim);
        const std::size_t start = room == 0 ? 0 : chance.below(room);
        const std::size_t stride = strided ? chance.between(1, 3) : 1;
        const std::size_t most = room == 0 ? 0 : (room - 1 - start) / stride + 1;
        std::size_t count = most == 0 ? 0 : chance.between(1, most);
        if (chance.percent(writes ? 1 : 5)) {
            count = 0;
        }
        part.start.push_back(static_cast<double>(start));
        part.count.push_back(static_cast<double>(count));
        part.stride.push_back(static_cast<double>(stride));
        part.elements *= count;
        if (isRecord && count > 0) {
            part.records = start + (count - 1) * stride + 1;
        }
    }
    return part;
}

void Author::spoil(Step &step) {
    const std::size_t n = step.inputs.size();
    if (n == 0 || chance.percent(12)) {
        if (chance.percent(50) || n == 0) {
            step.inputs.push_back(odd());
        } else {
            step.inputs.pop_back();
        }
        return;
    }
    if (chance.percent(3)) {
        step.operation += chance.oneOf({"x", " ", "_double"});
        return;
    }
    Value &value = step.inputs[chance.below(n)];
    if (!value.isArray()) {
        value = chance.percent(40) ? odd()
                : value.kind == Value::Kind::dataset
                    ? (chance.percent(50) ? dataset(chance.below(fileCount)) : num(123))
                    : (chance.percent(50) ? file(chance.below(fileCount))
                                          : text("no-such-folder/there.nc"));
        return;
    }
    spoilValue(value);
}

void Author::spoilValue(Value &value) {
    const std::size_t n = value.elements.size();
    switch (chance.below(5)) {
    case 0:
        value = odd();
        break;
    case 1:
        value = asClass(value, static_cast<tsClassID>(chance.between(tsLOGICAL, tsUINT64)));
        break;
    case 2: // one element more or less
        if (n > 1 && chance.percent(50)) {
            value.elements.pop_back();
        } else {
            value.elements.push_back(n == 0 ? 0.0 : value.elements.back());
        }
        value.dims = {1, value.elements.size()};
        break;
    default:
        if (n > 0) { // one element is another
            double &one = value.elements[chance.below(n)];
            const double step = chance.oneOf({1.0, -1.0, 4.0});
            one = fitted(chance.percent(50)   ? one + step
                         : chance.percent(50) ? -one
                                              : chance.oneOf(extremes),
                         value.classID);
        }
        break;
    }
}

Value Author::odd() {
    static const std::vector<Value> list = {
        of(tsDOUBLE, {0, 0}, {}),
        of(tsCHAR, {}),
        of(tsCELL, {2, 1}, {0, 0}),
        of(tsLOGICAL, {1}),
        of(tsSINGLE, {1.5}),
        of(tsSINGLE, {infinity}),
        of(tsINT8, {-1}),
        of(tsUINT8, {1, 0}),
        of(tsINT32, {0, 1072693248}), // as a double, 1
        of(tsUINT64, {0x1p63}),
        of(tsINT64, {-0x1p63}),
        num(nan),
        num(infinity),
        num(-infinity),
        num(-1),
        num(-0.5),
        num(1e10),
        num(-1e10),
        num(0x1p63),
        num(0x1p64),
        num(2.5),
        num(6.5),
        row({nan, infinity}),
        row({0, 0, 0, 0, 0}),
        text("write"),
        text("x"),
        of(tsDOUBLE, std::vector<double>(NC_MAX_VAR_DIMS + 1)),
    };
    return chance.oneOf(list);
}

} // namespace difference
