// tests/conformance/constants.cpp: the library's named constants.
#include "support/constants.hpp"
#include "support/conformance.hpp"

#include <algorithm>
#include <cctype>

namespace tessel::test {
namespace {

constexpr const char *unknownName = "TESSEL:netcdf:unrecognizedCharParameter";

// clang-format off
Rows rows() {
    return {
        {"all names",                             On::nothing, {"get_constant_names"},                           gives({constantNames()})},
        {"all names, whatever else is given",     On::nothing, {"GET_CONSTANT_NAMES", cell(), 1, "x", unknown()}, gives({constantNames()})},

        {"the long operation name",               On::nothing, {"parameter", "NC_BYTE"},       gives({1})},
        {"the short operation name",              On::nothing, {"param", "NC_BYTE"},           gives({1})},
        {"lower case with prefix",                On::nothing, {"param", "nc_byte"},           gives({1})},
        {"lower case without prefix",             On::nothing, {"param", "byte"},              gives({1})},
        {"mixed case",                            On::nothing, {"param", "Byte"},              gives({1})},
        {"a name in a column",                    On::nothing, {"param", shaped({4, 1}, "byte")}, gives({1})},
        {"a name ends before a NUL",              On::nothing, {"param", chars(std::string_view("byte\0x", 6))}, gives({1})},
        {"the one name with another prefix",      On::nothing, {"param", "nc2_err"},           gives({-1})},

        {"it has no short form",                  On::nothing, {"param", "ERR"},               refuses(unknownName, "Unrecognized operation:  \"ERR\"")},
        {"an unknown name is shown in upper case", On::nothing, {"param", "foo"},              refuses(unknownName, "Unrecognized operation:  \"FOO\"")},
        {"the empty name",                        On::nothing, {"param", ""},                  refuses(unknownName, "Unrecognized operation:  \"\"")},
        {"the beginning of a name",               On::nothing, {"param", "NC_BYT"},            refuses(unknownName, "Unrecognized operation:  \"NC_BYT\"")},
        {"a name with more behind it",            On::nothing, {"param", "NC_BYTES"},          refuses(unknownName, "Unrecognized operation:  \"NC_BYTES\"")},
        {"the prefix alone",                      On::nothing, {"param", "nc_"},               refuses(unknownName, "Unrecognized operation:  \"NC_\"")},
        {"the prefix twice",                      On::nothing, {"param", "NC_NC_BYTE"},        refuses(unknownName, "Unrecognized operation:  \"NC_NC_BYTE\"")},
        {"a constant of a later format",          On::nothing, {"param", "NC_NETCDF4"},        refuses(unknownName, "Unrecognized operation:  \"NC_NETCDF4\"")},
        {"an unknown name is no format",          On::nothing, {"param", "%s%n"},              refuses(unknownName, "Unrecognized operation:  \"%S%N\"")},
        {"an unknown name beyond ASCII",          On::nothing, {"param", "größe"},             refuses(unknownName, "Unrecognized operation:  \"GRößE\"")},

        {"a name that is a number",               On::nothing, {"param", 1},                   refuses("TESSEL:netcdf:argumentWasNotChar", "parameter name argument must be character")},
        {"a name that is a cell",                 On::nothing, {"param", cell({"NC_BYTE"})},   refuses("TESSEL:netcdf:argumentWasNotChar", "parameter name argument must be character")},
        {"a name that is an empty double",        On::nothing, {"param", empty(tsDOUBLE)},     refuses("TESSEL:netcdf:argumentWasNotChar", "parameter name argument must be character")},
    };
}
// clang-format on

std::string lower(std::string name) {
    std::transform(name.begin(), name.end(), name.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return name;
}

/// Every name, long and short, in both cases.
Rows values() {
    Rows list;
    for (const ListedConstant &constant : constants) {
        std::vector<std::string> names = {constant.longName};
        if (std::string(constant.shortName) != constant.longName) {
            names.emplace_back(constant.shortName);
        }
        for (const std::string &name : names) {
            list.push_back({name, On::nothing, {"param", name.c_str()}, gives({constant.value})});
            list.push_back({lower(name),
                            On::nothing,
                            {"param", lower(name).c_str()},
                            gives({constant.value})});
        }
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(Constants, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(ConstantValues, Conformance, testing::ValuesIn(values()), titleOf);

} // namespace
} // namespace tessel::test
