// tests/conformance/gateway.cpp: from the first argument of a call to the operation.
#include "support/conformance.hpp"
#include "support/constants.hpp"
#include "support/operations.hpp"

#include <algorithm>
#include <cctype>

namespace tessel::test {
namespace {

constexpr const char *notChar = "TESSEL:netcdf:firstArgNotChar";
constexpr const char *notCharText = "First argument must be a function string.";
constexpr const char *unknownName = "TESSEL:netcdf:InvalidOperation";

// clang-format off
Rows rows() {
    return {
        {"no arguments", On::nothing, {},
         refuses("TESSEL:netcdf:tooFewArguments", "Must provide at least one input argument.")},

        {"the first argument is a double",            On::nothing, {58},                            refuses(notChar, notCharText)},
        {"the first argument is an empty double",     On::nothing, {empty(tsDOUBLE)},               refuses(notChar, notCharText)},
        {"the first argument is a single",            On::nothing, {singles({1})},                  refuses(notChar, notCharText)},
        {"the first argument is an int8",             On::nothing, {int8s({1})},                    refuses(notChar, notCharText)},
        {"the first argument is a uint16",            On::nothing, {uint16s({115, 121})},           refuses(notChar, notCharText)},
        {"the first argument is logical",             On::nothing, {logicals({true})},              refuses(notChar, notCharText)},
        {"the first argument is a cell with a name",  On::nothing, {cell({"inq_libvers"})},         refuses(notChar, notCharText)},
        {"the first argument is a structure",         On::nothing, {structure()},                   refuses(notChar, notCharText)},
        {"the first argument is a function",          On::nothing, {function()},                    refuses(notChar, notCharText)},
        {"the first argument is of no known class",   On::nothing, {unknown()},                     refuses(notChar, notCharText)},
        {"a name in the second place is not found",   On::nothing, {58, "inq_libvers"},             refuses(notChar, notCharText)},

        {"an unknown name is shown in lower case",    On::nothing, {"Foo"},                         refuses(unknownName, "Unrecognized operation:  \"foo\"")},
        {"every letter of it, and nothing beside them", On::nothing, {"ABCDEFGHIJKLMNOPQRSTUVWXYZ@[`{"},
         refuses(unknownName, "Unrecognized operation:  \"abcdefghijklmnopqrstuvwxyz@[`{\"")},
        {"an unknown name with arguments",            On::nothing, {"foo", 1, 2},                   refuses(unknownName, "Unrecognized operation:  \"foo\"")},
        {"the empty name",                            On::nothing, {""},                            refuses(unknownName, "Unrecognized operation:  \"\"")},
        {"the empty name of 0x0",                     On::nothing, {empty(tsCHAR)},                 refuses(unknownName, "Unrecognized operation:  \"\"")},
        {"parameter has no form with a prefix",       On::nothing, {"nc_param", "NC_BYTE"},         refuses(unknownName, "Unrecognized operation:  \"nc_param\"")},
        {"nor has its long name",                     On::nothing, {"nc_parameter", "NC_BYTE"},     refuses(unknownName, "Unrecognized operation:  \"nc_parameter\"")},
        {"nor has get_constant_names",                On::nothing, {"nc_get_constant_names"},       refuses(unknownName, "Unrecognized operation:  \"nc_get_constant_names\"")},
        {"the beginning of a name",                   On::nothing, {"inq_libver"},                  refuses(unknownName, "Unrecognized operation:  \"inq_libver\"")},
        {"a name with more behind it",                On::nothing, {"inq_libversx"},                refuses(unknownName, "Unrecognized operation:  \"inq_libversx\"")},
        {"a name with a blank behind it",             On::nothing, {"inq_libvers "},                refuses(unknownName, "Unrecognized operation:  \"inq_libvers \"")},
        {"a name with a blank before it",             On::nothing, {" inq_libvers"},                refuses(unknownName, "Unrecognized operation:  \" inq_libvers\"")},
        {"the prefix twice",                          On::nothing, {"nc_nc_inq_libvers"},           refuses(unknownName, "Unrecognized operation:  \"nc_nc_inq_libvers\"")},
        {"the prefix alone",                          On::nothing, {"nc_"},                         refuses(unknownName, "Unrecognized operation:  \"nc_\"")},
        {"a family without a member",                 On::nothing, {"get_var"},                     refuses(unknownName, "Unrecognized operation:  \"get_var\"")},
        {"a member that the library has, and no row", On::nothing, {"get_var_longlong"},            refuses(unknownName, "Unrecognized operation:  \"get_var_longlong\"")},
        {"a library function without a row",          On::nothing, {"nc_inq_varndims"},             refuses(unknownName, "Unrecognized operation:  \"nc_inq_varndims\"")},
        {"an unknown name is no format",              On::nothing, {"%s%n%d %5$s"},                 refuses(unknownName, "Unrecognized operation:  \"%s%n%d %5$s\"")},
        {"an unknown name beyond ASCII",              On::nothing, {"ÖFFNEN 日本"},                 refuses(unknownName, "Unrecognized operation:  \"Öffnen 日本\"")},

        {"a name ends before a NUL",                  On::nothing, {chars(std::string_view("inq_libvers\0x", 13))}, gives({libraryVersion})},
        {"a name in a column",                        On::nothing, {shaped({11, 1}, "inq_libvers")},                gives({libraryVersion})},
        {"a name in a page",                          On::nothing, {shaped({1, 1, 11}, "inq_libvers")},             gives({libraryVersion})},
        {"a name that begins with the underscore",    On::nothing, {"nc__enddef"},
         refuses("TESSEL:netcdf:pEndDef:badParameterCount", "Must supply six input parameters for _ENDDEF operation.")},
    };
}
// clang-format on

/// The rows' own count error is what tells that the right row was found.
Row miscounted(const ListedOperation &operation, const std::string &name, int inputs) {
    Values call = {name.c_str()};
    call.resize(static_cast<std::size_t>(inputs), cell());
    return {name + " with " + std::to_string(inputs) + " inputs", On::nothing, call,
            operation.inputs == 0 ? Outcome(gives({constantNames()}))
                                  : refuses(operation.countIdentifier, operation.countMessage)};
}

std::string withCase(std::string name, int (*letter)(int), std::size_t step) {
    for (std::size_t i = 0; i < name.size(); i += step) {
        name[i] = static_cast<char>(letter(static_cast<unsigned char>(name[i])));
    }
    return name;
}

/// Too few and too many inputs, none of which is of any use: the count comes first.
Rows counts() {
    Rows list;
    for (const ListedOperation &operation : operations) {
        for (int inputs = 1; inputs <= operation.inputs + 2; ++inputs) {
            if (inputs != operation.inputs) {
                list.push_back(miscounted(operation, operation.shortName, inputs));
            }
        }
    }
    return list;
}

/// Both names of every row, in several cases.
Rows spellings() {
    Rows list;
    for (const ListedOperation &operation : operations) {
        std::vector<std::string> names = {operation.longName};
        if (std::string(operation.shortName) != operation.longName) {
            names.emplace_back(operation.shortName);
        }
        for (const std::string &name : names) {
            const int wrongCount = operation.inputs + 1;
            list.push_back(miscounted(operation, name, wrongCount));
            list.push_back(miscounted(operation, withCase(name, std::toupper, 1), wrongCount));
            list.push_back(miscounted(operation, withCase(name, std::toupper, 2), wrongCount));
        }
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(Gateway, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(Counts, Conformance, testing::ValuesIn(counts()), titleOf);
INSTANTIATE_TEST_SUITE_P(Spellings, Conformance, testing::ValuesIn(spellings()), titleOf);

} // namespace
} // namespace tessel::test
