// tests/conformance/write_data.cpp: the data that a write takes, and those that it refuses.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

struct Data {
    std::string className;
    Value value;
};

// clang-format off
std::vector<Data> oneOfEachClass() {
    return {
        {"double", 1},          {"single", singles({1})},   {"int8",  int8s({1})},   {"uint8", uint8s({1})},
        {"int16", int16s({1})}, {"uint16", uint16s({1})},   {"int32", int32s({1})},  {"uint32", uint32s({1})},
        {"int64", int64s({1})}, {"uint64", uint64s({1})},   {"char", "1"},           {"logical", logicals({true})},
        {"cell", cell({1})},    {"struct", structure()},    {"unknown", unknown()},  {"function_handle", function()},
    };
}

std::vector<Data> noneOfEachClass() {
    return {
        {"double", empty(tsDOUBLE)},       {"single", empty(tsSINGLE, {1, 0})}, {"int8", empty(tsINT8)},       {"uint8", empty(tsUINT8)},
        {"int16", empty(tsINT16, {0, 3})}, {"uint16", empty(tsUINT16)},         {"int32", empty(tsINT32)},     {"uint32", empty(tsUINT32)},
        {"int64", empty(tsINT64)},         {"uint64", empty(tsUINT64)},         {"char", ""},                  {"logical", empty(tsLOGICAL)},
        {"cell", empty(tsCELL)},           {"struct", empty(tsSTRUCT)},         {"unknown", empty(tsUNKNOWN)},
    };
}

/// The arguments before the data, by family.
struct Family {
    std::string name;
    Values arguments;
    bool takesNone;
};

std::vector<Family> families() {
    return {
        {"put_att_",  {5, 0, "a", 6}, true},
        {"put_var_",  {5, 0},         false},
        {"put_var1_", {5, 0, 0},      false},
        {"put_vara_", {5, 0, 0, 1},   false},
        {"put_vars_", {5, 0, 0, 1, 1}, false},
    };
}
// clang-format on

Values callOf(const Family &family, const Member &member, const Value &data, const char *prefix) {
    Values call = {(prefix + family.name + member.suffix).c_str()};
    call.insert(call.end(), family.arguments.begin(), family.arguments.end());
    if (family.name + member.suffix == "put_att_text") {
        call.pop_back(); // its type is known
    }
    call.push_back(data);
    return call;
}

Outcome wrongClass(const std::string &operation, const Member &member, const std::string &found) {
    return refuses("TESSEL:netcdf:" + operation + ":badDatatype",
                   "The input datatype for " + operation + " must be " + member.wanted + ", not " +
                       found + ".");
}

/// Every member refuses every class but its own, and names itself by its short name, also when it
/// is called by its long one.
Rows otherClasses() {
    Rows list;
    for (const Family &family : families()) {
        for (const Member &member : members) {
            const std::string operation = family.name + member.suffix;
            for (const Data &data : oneOfEachClass()) {
                if (data.className != member.className) {
                    list.push_back({operation + " of " + data.className, On::nothing,
                                    callOf(family, member, data.value, "nc_"),
                                    wrongClass(operation, member, data.className)});
                }
            }
        }
    }
    return list;
}

/// Variables are not written without data, of whatever class these are not; attributes are, if they
/// would be of the right class.
Rows noData() {
    const Outcome noVariableData =
        refuses("TESSEL:netcdf:emptyVariableData", "Variable data must not be empty.");
    Rows list;
    for (const Family &family : families()) {
        for (const Member &member : members) {
            const std::string operation = family.name + member.suffix;
            for (const Data &data : noneOfEachClass()) {
                if (!family.takesNone || data.className != member.className) {
                    list.push_back({operation + " of no " + data.className, On::nothing,
                                    callOf(family, member, data.value, ""),
                                    family.takesNone ? wrongClass(operation, member, data.className)
                                                     : noVariableData});
                }
            }
        }
    }
    return list;
}

INSTANTIATE_TEST_SUITE_P(OtherClasses, Conformance, testing::ValuesIn(otherClasses()), titleOf);
INSTANTIATE_TEST_SUITE_P(NoData, Conformance, testing::ValuesIn(noData()), titleOf);

} // namespace
} // namespace tessel::test
