// tests/conformance/write_data.cpp: the data that a write takes, and those that it refuses.
#include "support/classes.hpp"
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

/// The arguments before the data, by family.
struct Family {
    std::string name;
    Values arguments;
    bool takesNone;
};

// clang-format off
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

/// Every member refuses every class but its own, and names itself by its short name, also when it
/// is called by its long one.
Rows otherClasses() {
    Rows list;
    for (const Family &family : families()) {
        for (const Member &member : members) {
            const std::string operation = family.name + member.suffix;
            for (const OfClass &data : oneOfEachClass()) {
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
            for (const OfClass &data : noneOfEachClass()) {
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
