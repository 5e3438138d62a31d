// module/gateway/lookup.cpp: from the name of an operation to its row.
#include "gateway/lookup.hpp"

#include "call/catalogue.hpp"
#include "call/name_index.hpp"
#include "gateway/operation_table.hpp"

#include <cctype>

namespace tessel::netcdf {
namespace {

constexpr NameIndex operations(operationTable);

/// As names are compared. The letters that they are made of do not depend on the locale, and what
/// else there is in ASCII has no case.
char lowerCase(char c) {
    const auto code = static_cast<unsigned char>(c);
    if (code >= 0x80) {
        return static_cast<char>(std::tolower(code));
    }
    return static_cast<char>(code + (code >= 'A' && code <= 'Z' ? 'a' - 'A' : 0));
}

} // namespace

const OperationEntry *findOperation(char *name) {
    // As a rule the name is in lower case already; the rows' names are, so that what is found
    // before it was made so is what would be found after. To make and compare it in one go takes
    // half as long again: the comparison waits for the letters that were just written.
    if (const OperationEntry *const entry = operations.find(name)) {
        return entry;
    }
    for (char *at = name; *at != '\0'; ++at) {
        *at = lowerCase(*at);
    }
    if (const OperationEntry *const entry = operations.find(name)) {
        return entry;
    }
    raise(catalogue::invalidOperation, name);
}

} // namespace tessel::netcdf
