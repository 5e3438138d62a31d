// tests/support/classes.cpp: a value of every host class.
#include "support/classes.hpp"

#include <algorithm>

namespace tessel::test {
namespace {

Row withClass(Row row, const OfClass &one) {
    row.title += ", " + one.className;
    row.call.back() = one.value;
    const std::string mark = "CLASS";
    const std::size_t at = row.outcome.message.find(mark);
    if (at != std::string::npos) {
        row.outcome.message.replace(at, mark.size(), one.className);
    }
    return row;
}

} // namespace

// clang-format off
std::vector<OfClass> oneOfEachClass() {
    return {
        {"double",          1},
        {"single",          singles({1})},
        {"int8",            int8s({1})},
        {"uint8",           uint8s({1})},
        {"int16",           int16s({1})},
        {"uint16",          uint16s({1})},
        {"int32",           int32s({1})},
        {"uint32",          uint32s({1})},
        {"int64",           int64s({1})},
        {"uint64",          uint64s({1})},
        {"char",            "1"},
        {"logical",         logicals({true})},
        {"cell",            cell({1})},
        {"struct",          structure()},
        {"function_handle", function()},
        {"unknown",         unknown()},
    };
}

std::vector<OfClass> noneOfEachClass() {
    return {
        {"double",  empty(tsDOUBLE)},
        {"single",  empty(tsSINGLE, {1, 0})},
        {"int8",    empty(tsINT8)},
        {"uint8",   empty(tsUINT8)},
        {"int16",   empty(tsINT16, {0, 3})},
        {"uint16",  empty(tsUINT16)},
        {"int32",   empty(tsINT32)},
        {"uint32",  empty(tsUINT32)},
        {"int64",   empty(tsINT64, {2, 0, 4})},
        {"uint64",  empty(tsUINT64)},
        {"char",    ""},
        {"logical", empty(tsLOGICAL)},
        {"cell",    empty(tsCELL)},
        {"struct",  empty(tsSTRUCT)},
        {"unknown", empty(tsUNKNOWN)},
    };
}
// clang-format on

Rows withOtherClasses(const Row &row, const std::vector<std::string> &taken) {
    Rows rows;
    for (const OfClass &one : oneOfEachClass()) {
        if (std::find(taken.begin(), taken.end(), one.className) == taken.end()) {
            rows.push_back(withClass(row, one));
        }
    }
    return rows;
}

} // namespace tessel::test
