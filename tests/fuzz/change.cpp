// tests/fuzz/change.cpp: making sequences of calls, and changing them.
#include "change.hpp"

#include <algorithm>
#include <array>
#include <cctype>
#include <cmath>
#include <limits>
#include <string_view>

namespace fuzz {
namespace {

/// What an input is for. The letters are those of the table of operations.
enum Role : char {
    path = 'P',
    createMode = 'C',
    openMode = 'O',
    datasetId = 'D',
    smallNumber = 'K',
    variableId = 'V',
    name = 'N',
    attributeName = 'A',
    type = 'T',
    length = 'L',
    sizeParameter = 'S',
    dimensionIds = 'J',
    indices = 'I',
    strides = 'R',
    values = 'X',
    format = 'F',
    fillMode = 'W',
    constantName = 'G',
};

/// An operation, or a family of them if its name ends with "_", and what its inputs are for.
struct Operation {
    std::string_view name;
    std::string_view roles;
};

constexpr std::array operations = {
    Operation{"abort", "D"},
    Operation{"close", "D"},
    Operation{"copy_att", "DVADV"},
    Operation{"create", "PC"},
    Operation{"_create", "PCSS"},
    Operation{"def_dim", "DNL"},
    Operation{"def_var", "DNTJ"},
    Operation{"del_att", "DVA"},
    Operation{"_enddef", "DSSSS"},
    Operation{"enddef", "D"},
    Operation{"end_def", "D"},
    Operation{"get_att_", "DVA"},
    Operation{"get_constant_names", ""},
    Operation{"get_var_", "DV"},
    Operation{"get_var1_", "DVI"},
    Operation{"get_vara_", "DVII"},
    Operation{"get_vars_", "DVIIR"},
    Operation{"inq", "D"},
    Operation{"inq_att", "DVA"},
    Operation{"inq_attid", "DVA"},
    Operation{"inq_attname", "DVK"},
    Operation{"inq_dim", "DK"},
    Operation{"inq_dimid", "DN"},
    Operation{"inq_libvers", ""},
    Operation{"inq_varid", "DN"},
    Operation{"inq_var", "DV"},
    Operation{"open", "PO"},
    Operation{"_open", "POS"},
    Operation{"parameter", "G"},
    Operation{"put_att_", "DVATX"},
    Operation{"put_att_text", "DVAX"},
    Operation{"put_var_", "DVX"},
    Operation{"put_var1_", "DVIX"},
    Operation{"put_vara_", "DVIIX"},
    Operation{"put_vars_", "DVIIRX"},
    Operation{"redef", "D"},
    Operation{"rename_att", "DVAA"},
    Operation{"rename_dim", "DKN"},
    Operation{"rename_var", "DVN"},
    Operation{"set_default_format", "F"},
    Operation{"set_fill", "DW"},
    Operation{"strerror", "K"},
    Operation{"sync", "D"},
};

constexpr std::array<std::string_view, 7> members = {"double", "float", "int", "short",
                                                     "schar",  "uchar", "text"};

constexpr std::array numericClasses = {tsDOUBLE, tsSINGLE, tsINT8,   tsUINT8, tsINT16,
                                       tsUINT16, tsINT32,  tsUINT32, tsINT64, tsUINT64};
constexpr std::array allClasses = {tsDOUBLE, tsSINGLE, tsINT8,     tsUINT8,  tsINT16, tsUINT16,
                                   tsINT32,  tsUINT32, tsINT64,    tsUINT64, tsCHAR,  tsLOGICAL,
                                   tsCELL,   tsSTRUCT, tsFUNCTION, tsUNKNOWN};

constexpr std::array<double, 12> smallNumbers = {0, 0, 0, 1, 1, 2, 2, 3, 4, 5, 7, -1};
constexpr std::array oddNumbers = {
    0.5,
    -0.5,
    -2.0,
    8.0,
    100.0,
    127.0,
    128.0,
    255.0,
    256.0,
    1024.0,
    32767.0,
    65536.,
    1e6,
    -0x1p31,
    0x1p31 - 1,
    0x1p31,
    0x1p32,
    0x1p53,
    0x1p62,
    0x1p63,
    -0x1p63,
    0x1p64,
    1e300,
    -1e300,
    0x1p30,
    0x1p29,
    1e-320,
    3e38,
    HUGE_VAL,
    -HUGE_VAL,
    std::numeric_limits<double>::quiet_NaN(),
};
constexpr std::array createFlags = {0,    0,     0,     4,     512,    512,    32,    2048, 8,
                                    16,   24,    544,   33,    256,    1,      2,     64,   128,
                                    8192, 16384, 32768, 65536, 131072, 262144, 524288};
constexpr std::array openFlags = {0,  0, 1,   1,  1,   2048, 2049,  8,    9,
                                  16, 4, 512, 64, 128, 512,  32768, 8192, 65536};
constexpr std::array<std::string_view, 8> names = {"x", "y", "t", "v", "w", "a", "_FillValue", ""};
// Letters that are longer when they are composed, alone or one behind the other.
constexpr std::array growingLetters = {0x344, 0x344, 0x958, 0xFB2C, 0x1D5, 0x323};
constexpr std::array<std::string_view, 6> paths = {"0.nc", "0.nc", "1.nc", "1.nc", "2.nc", ""};
constexpr std::array<std::string_view, 6> modeWords = {"CLOBBER", "NOCLOBBER", "WRITE",
                                                       "NOWRITE", "nc_write",  "SHARE"};
constexpr std::array<std::string_view, 8> constants = {
    "NC_DOUBLE", "global", "FILL_FLOAT", "nc_nat", "GLOBAL", "UNLIMITED", "MAX_NAME", "NOFILL"};

/// Makes values.
class Author {
  public:
    explicit Author(Chance &given) : chance(given) {}

    Step step() {
        const Operation &operation = chance.oneOf(operations);
        Step made{std::string(operation.name), {}};
        if (made.operation.ends_with('_')) {
            made.operation += chance.oneOf(members);
        }
        if (chance.percent(15)) {
            spell(made.operation);
        }
        for (const char role : operation.roles) {
            made.inputs.push_back(input(static_cast<Role>(role)));
        }
        made.outputs = chance.percent(90) ? 1 : static_cast<int>(chance.below(17));
        return made;
    }

    /// Another input in the place of one.
    Value another(const Step &step, std::size_t place) {
        const auto *const known =
            std::find_if(operations.begin(), operations.end(), [&](const Operation &operation) {
                return step.operation.starts_with(operation.name) &&
                       operation.roles.size() == step.inputs.size();
            });
        return known == operations.end() ? anything()
                                         : input(static_cast<Role>(known->roles[place]));
    }

    Value anything() {
        Value value;
        value.classID = chance.oneOf(allClasses);
        value.complex = chance.percent(5) && value.classID >= tsDOUBLE && value.classID <= tsUINT64;
        value.dims.assign(1 + chance.below(3) + (chance.percent(10) ? 2 : 0), 0);
        for (std::size_t &dim : value.dims) {
            dim = chance.below(4);
        }
        const std::size_t n = chance.below(5);
        for (std::size_t i = 0; i < n; ++i) {
            value.elements.push_back(chance.percent(60) ? chance.oneOf(smallNumbers)
                                                        : chance.oneOf(oddNumbers));
        }
        return value;
    }

  private:
    Value input(Role role) { return chance.percent(7) ? anything() : fitting(role); }

    Value fitting(Role role) {
        switch (role) {
        case path:
            return text(paths);
        case createMode:
            return mode(createFlags);
        case openMode:
            return mode(openFlags);
        case datasetId:
            return {.kind = Value::Kind::dataset, .slot = chance.below(3)};
        case variableId:
            return number(static_cast<double>(chance.below(5)) - 1);
        case name:
        case attributeName:
            return text(names);
        case constantName:
            return text(constants);
        case type:
            return number(static_cast<double>(chance.below(chance.percent(90) ? 7 : 14)));
        case format:
            return number(static_cast<double>(chance.below(chance.percent(80) ? 3 : 9)));
        case fillMode:
            return number(chance.percent(50) ? 256 : static_cast<double>(chance.below(2)));
        case dimensionIds: {
            std::vector<double> ids(chance.below(4));
            std::generate(ids.begin(), ids.end(),
                          [&] { return static_cast<double>(chance.below(4)); });
            return row(std::move(ids));
        }
        case indices:
        case strides:
            return list();
        case values:
            return data();
        case length:
        case sizeParameter:
        case smallNumber:
            break;
        }
        return number(size());
    }

    double size() {
        return chance.percent(80) ? chance.oneOf(smallNumbers) : chance.oneOf(oddNumbers);
    }

    Value list() {
        std::vector<double> numbers(chance.below(4));
        std::generate(numbers.begin(), numbers.end(), [&] { return size(); });
        Value value = row(std::move(numbers));
        value.classID = chance.percent(85) ? tsDOUBLE : chance.oneOf(numericClasses);
        return value;
    }

    Value data() {
        Value value = list();
        if (chance.percent(25)) {
            value.classID = tsCHAR;
        } else if (chance.percent(60)) {
            value.classID = chance.oneOf(numericClasses);
        }
        const std::size_t n = 1 + chance.below(12);
        value.dims[0] = chance.percent(30) ? 1 + chance.below(3) : 1;
        value.dims[1] = n;
        return value;
    }

    template <class List>
    Value text(const List &list) {
        if (chance.percent(90)) {
            return characters(chance.oneOf(list));
        }
        Value value = characters("");
        const bool grows = chance.percent(10);
        std::size_t n = chance.percent(80) ? chance.below(6) : 250 + chance.below(20);
        n = grows ? 30 + chance.below(100) : n;
        for (std::size_t i = 0; i < n; ++i) {
            if (grows) {
                value.elements.push_back(chance.oneOf(growingLetters));
            } else {
                value.elements.push_back(static_cast<double>(
                    chance.percent(70) ? 'a' + chance.below(3) : chance.below(0x10000)));
            }
        }
        value.dims[1] = n;
        return value;
    }

    template <class List>
    Value mode(const List &flags) {
        if (chance.percent(10)) {
            return text(modeWords);
        }
        auto both = static_cast<unsigned>(chance.oneOf(flags));
        if (chance.percent(25)) {
            both |= static_cast<unsigned>(chance.oneOf(flags));
        }
        return number(both);
    }

    void spell(std::string &operation) {
        if (chance.percent(70)) {
            operation = "nc_" + operation;
        }
        for (char &c : operation) {
            if (chance.percent(20)) {
                c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
            }
        }
        if (chance.percent(10)) {
            operation += 'x';
        }
    }

    Chance &chance;
};

template <class List>
std::ptrdiff_t placeIn(const List &list, Chance &chance, std::size_t more = 0) {
    return static_cast<std::ptrdiff_t>(chance.below(list.size() + more));
}

void changeStep(Step &step, Author &author, Chance &chance) {
    std::vector<Value> &inputs = step.inputs;
    if (inputs.empty() || chance.percent(4)) {
        inputs.insert(inputs.begin() + placeIn(inputs, chance, 1), author.anything());
    } else if (chance.percent(4)) {
        inputs.erase(inputs.begin() + placeIn(inputs, chance));
    } else if (chance.percent(5)) {
        std::swap(chance.below(2) == 0 ? inputs.front() : inputs.back(),
                  inputs[chance.below(inputs.size())]);
    } else {
        const std::size_t place = chance.below(inputs.size());
        Value &value = inputs[place];
        if (!value.elements.empty() && chance.percent(35)) {
            value.elements[chance.below(value.elements.size())] =
                chance.percent(50) ? chance.oneOf(smallNumbers) : chance.oneOf(oddNumbers);
        } else {
            value = author.another(step, place);
        }
    }
}

} // namespace

void change(Sequence &sequence, Chance &chance) {
    Author author(chance);
    const auto anywhere = [&](std::size_t more = 0) {
        return sequence.begin() + placeIn(sequence, chance, more);
    };
    constexpr std::size_t mostMade = 10; // several short ones find more than a long one
    const bool full = sequence.size() >= mostMade;
    if (sequence.empty() || (chance.percent(30) && !full)) {
        Step made = author.step();
        sequence.insert(anywhere(1), std::move(made));
    } else if (chance.percent(15)) {
        sequence.erase(anywhere());
    } else if (chance.percent(10) && !full) {
        const Step copied = *anywhere();
        sequence.insert(anywhere(1), copied);
    } else if (chance.percent(10)) {
        std::swap(*anywhere(), *anywhere());
    } else {
        changeStep(*anywhere(), author, chance);
    }
}

} // namespace fuzz
