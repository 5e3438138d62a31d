// module/convert/write_data.cpp: the data that a write hands to the library.
#include "convert/write_data.hpp"

#include "call/catalogue.hpp"
#include "convert/text.hpp"

#include <array>

namespace tessel::netcdf {
namespace {

/// The write operations have consecutive ids: five families, the attributes first.
constexpr int firstWriteID = 59;
constexpr int familyCount = 5;

bool isWrite(int id) {
    return id >= firstWriteID && id < firstWriteID + familyCount * MemoryTypes::size;
}

bool isAttributeWrite(int id) {
    return id >= firstWriteID && id < firstWriteID + MemoryTypes::size;
}

/// What is wanted of the data, by the member's place in its family.
constexpr auto required = []<class... T>(TypeList<T...>) {
    return std::array{memory<T>...};
}(MemoryTypes{});

} // namespace

void validate_write_op_datatype(const tsArray *data, const OperationEntry *entry) {
    if (tsGetNumberOfElements(data) == 0 && !isAttributeWrite(entry->id)) {
        raise(catalogue::emptyVariableData);
    }
    const tsClassID found = tsGetClassID(data);
    if (!isWrite(entry->id)) {
        raise(catalogue::unhandledFuncstr, entry->shortName);
    }
    const auto member = static_cast<std::size_t>((entry->id - firstWriteID) % MemoryTypes::size);
    if (found != required[member].hostClass) {
        raiseNamed(entry->shortName, catalogue::badWriteDatatype, entry->shortName,
                   required[member].description, tsGetClassName(data));
    }
}

char *make_text_write_buffer(const tsArray *data, const OperationEntry *entry) {
    const std::size_t n = tsGetNumberOfElements(data);
    if (n == 0) {
        return nullptr;
    }
    auto *const bytes = static_cast<char *>(tsCalloc(n, 1));
    if (bytes == nullptr) {
        raiseNamed(entry->shortName, catalogue::writeBufferFailure, entry->shortName);
    }
    narrow(elements<tsChar>(data), n, bytes);
    return bytes;
}

} // namespace tessel::netcdf
