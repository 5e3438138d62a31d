// tests/conformance/nothing.cpp: what the library is given of what is empty, by a host that has no
// memory for it. Such a host answers NULL for the data of an empty array, given or made, and for a
// request of no bytes. That every other row ends as it does also by such a host is part of each.
#include "support/conformance.hpp"
#include "support/members.hpp"

namespace tessel::test {
namespace {

// clang-format off
Rows rows() {
    return {
        {"reading an attribute without text: no buffer, and yet memory for the library", On::sample, {"get_att_text", ncid, varid("temp"), "blank"}, gives({""}), {},
         {"nc_inq_att(ncid, 1, \"blank\", out, out)", "tsCalloc(0, 2)", "nc_get_att_text(ncid, 1, \"blank\", memory of its own)",
          "tsCreateString(\"\")"}, nullForNothing()},
        {"writing an attribute without text", On::sampleDefine, {"put_att_text", ncid, varid("grid"), "a", ""}, givesNothing(), {"+ grid:a = char \"\""},
         {"nc_put_att_text(ncid, 6, \"a\", 0, NULL)"}, nullForNothing()},
    };
}

/// Each numeric member of the families that take or give nothing: the library is called all the
/// same, and told that there is no memory.
Rows numbers() {
    Rows list;
    for (const Member &member : numericMembers()) {
        const std::string getAtt = "get_att_" + member.suffix;
        const std::string putAtt = "put_att_" + member.suffix;
        const std::string getVar = "get_var_" + member.suffix;
        const std::string getVara = "get_vara_" + member.suffix;
        const std::string getVars = "get_vars_" + member.suffix;
        list.insert(list.end(), {
            {getAtt, On::sample, {getAtt.c_str(), ncid, varid("temp"), "none"}, gives({empty(member.hostClass)}), {},
             {"nc_inq_att(ncid, 1, \"none\", out, out)", "tsCreateUninitNumericArray({0, 0}, " + member.className + ")",
              "nc_" + getAtt + "(ncid, 1, \"none\", NULL)"}, nullForNothing()},
            {putAtt, On::sampleDefine, {putAtt.c_str(), ncid, varid("grid"), "a", 3, empty(member.hostClass)}, givesNothing(), {"+ grid:a = short "},
             {"nc_" + putAtt + "(ncid, 6, \"a\", 3, 0, NULL)"}, nullForNothing()},
            {getVar, On::noRecords, {getVar.c_str(), ncid, varid("time")}, gives({empty(member.hostClass, {0, 1})}), {},
             {"nc_inq_varndims(ncid, 7, out)", "nc_inq_vardimid(ncid, 7, out)", "nc_inq_dimlen(ncid, 0, out)",
              "tsCreateUninitNumericArray({0, 1}, " + member.className + ")", "nc_" + getVar + "(ncid, 7, NULL)"}, nullForNothing()},
            {getVara, On::sample, {getVara.c_str(), ncid, varid("count"), doubles({0, 0}), doubles({2, 0})}, gives({empty(member.hostClass, {2, 0})}), {},
             {"nc_inq_varndims(ncid, 5, out)", "tsCreateUninitNumericArray({2, 0}, " + member.className + ")",
              "nc_" + getVara + "(ncid, 5, {0, 0}, {0, 2}, NULL)"}, nullForNothing()},
            {getVars, On::sample, {getVars.c_str(), ncid, varid("count"), doubles({0, 0}), doubles({0, 2}), doubles({1, 1})},
             gives({empty(member.hostClass, {0, 2})}), {},
             {"nc_inq_varndims(ncid, 5, out)", "nc_inq_vardimid(ncid, 5, out)", "tsCreateUninitNumericArray({0, 2}, " + member.className + ")",
              "nc_" + getVars + "(ncid, 5, {0, 0}, {2, 0}, {1, 1}, NULL)"}, nullForNothing()},
        });
    }
    return list;
}
// clang-format on

INSTANTIATE_TEST_SUITE_P(Nothing, Conformance, testing::ValuesIn(rows()), titleOf);
INSTANTIATE_TEST_SUITE_P(NothingNumbers, Conformance, testing::ValuesIn(numbers()), titleOf);

} // namespace
} // namespace tessel::test
