// module/convert/read_buffer.cpp: where the library puts the text it reads.
#include "convert/read_buffer.hpp"

#include "call/catalogue.hpp"

namespace tessel::netcdf {

char *allocateReadBuffer(std::size_t count, std::size_t unit, const OperationEntry *entry) {
    void *const buffer = tsCalloc(count, unit);
    if (buffer == nullptr && count != 0) {
        raiseNamed(entry->shortName, catalogue::readBufferFailure, entry->shortName);
    }
    return static_cast<char *>(buffer);
}

} // namespace tessel::netcdf
