// module/convert/read_buffer.cpp: where the library puts the text it reads.
#include "convert/read_buffer.hpp"

#include "call/catalogue.hpp"

#include <algorithm>

namespace tessel::netcdf {

char *allocateReadBuffer(std::size_t count, std::size_t unit, const OperationEntry *entry) {
    void *const buffer = tsCalloc(count, unit);
    if (buffer == nullptr && count != 0) {
        raiseNamed(entry->shortName, catalogue::readBufferFailure, entry->shortName);
    }
    return static_cast<char *>(buffer);
}

void widenText(const char *bytes, std::size_t count, tsArray *characters) {
    std::transform(bytes, bytes + count, static_cast<tsChar *>(tsGetData(characters)),
                   [](char byte) { return static_cast<tsChar>(static_cast<signed char>(byte)); });
}

} // namespace tessel::netcdf
