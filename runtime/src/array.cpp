// runtime/src/array.cpp: host arrays as a program that embeds the host makes and reads them.
#include "tessel/runtime/array.hpp"

#include "array_storage.hpp"
#include "host_errors.hpp"
#include "text.hpp"

#include <algorithm>
#include <cstdint>

namespace tessel {
namespace {

constexpr std::array<std::size_t, 2> one = {1, 1};

bool hasPlainData(tsClassID classID) noexcept {
    return elementSize(classID) != 0;
}

template <class T>
double firstAsDouble(const tsArray &array) {
    return static_cast<double>(*static_cast<const T *>(array.data));
}

/// By class id; the rows of classes that are no numbers are empty.
using ReadNumber = double (*)(const tsArray &);
constexpr std::array<ReadNumber, tsFUNCTION + 1> readNumber = [] {
    std::array<ReadNumber, tsFUNCTION + 1> readers{};
    readers[tsDOUBLE] = firstAsDouble<double>;
    readers[tsSINGLE] = firstAsDouble<float>;
    readers[tsINT8] = firstAsDouble<std::int8_t>;
    readers[tsUINT8] = firstAsDouble<std::uint8_t>;
    readers[tsINT16] = firstAsDouble<std::int16_t>;
    readers[tsUINT16] = firstAsDouble<std::uint16_t>;
    readers[tsINT32] = firstAsDouble<std::int32_t>;
    readers[tsUINT32] = firstAsDouble<std::uint32_t>;
    readers[tsINT64] = firstAsDouble<std::int64_t>;
    readers[tsUINT64] = firstAsDouble<std::uint64_t>;
    return readers;
}();

} // namespace

void Array::Destroy::operator()(tsArray *owned) const noexcept {
    delete owned;
}

Array Array::adopt(tsArray *array) noexcept {
    return Array(array);
}

Array Array::numeric(tsClassID classID, Dims dims, bool complex) {
    if (!isNumericClass(classID)) {
        raise(host_errors::badClass);
    }
    return orOutOfMemory([&] {
        ArrayPointer made = makeArray(classID, dims, Fill::none);
        if (complex) {
            void *&imaginary = extrasOf(*made).imaginary;
            imaginary = allocateBlock(made->elements * elementSize(classID), Fill::none);
            if (imaginary == nullptr) {
                raise(host_errors::outOfMemory);
            }
        }
        return Array(made.release());
    });
}

Array Array::logical(Dims dims) {
    return orOutOfMemory([&] { return Array(makeArray(tsLOGICAL, dims, Fill::zero).release()); });
}

Array Array::characters(Dims dims) {
    return orOutOfMemory([&] { return Array(makeArray(tsCHAR, dims, Fill::zero).release()); });
}

Array Array::cell(Dims dims) {
    return orOutOfMemory([&] { return Array(makeCell(dims).release()); });
}

Array Array::scalar(double value) {
    return orOutOfMemory([&] { return Array(makeScalar(value).release()); });
}

Array Array::row(std::initializer_list<double> values) {
    const std::array<std::size_t, 2> dims = {1, values.size()};
    Array made = numeric(tsDOUBLE, dims);
    std::copy(values.begin(), values.end(), static_cast<double *>(made.data()));
    return made;
}

Array Array::text(std::string_view utf8) {
    return orOutOfMemory([&] { return Array(makeText(utf8).release()); });
}

Array Array::structure(Dims dims, std::vector<std::string> fields) {
    return orOutOfMemory([&] {
        ArrayPointer made = makeShape(tsSTRUCT, dims);
        const std::size_t most = std::vector<Array>().max_size();
        if (!fields.empty() && made->elements > most / fields.size()) {
            raise(host_errors::dimensionsTooLarge);
        }
        ArrayExtras &extras = extrasOf(*made);
        extras.cells.resize(made->elements * fields.size());
        extras.names = std::move(fields);
        return Array(made.release());
    });
}

Array Array::function(std::string_view name) {
    return orOutOfMemory([&] {
        ArrayPointer made = makeShape(tsFUNCTION, one);
        extrasOf(*made).names.emplace_back(name);
        return Array(made.release());
    });
}

Array Array::unknown(Dims dims) {
    return orOutOfMemory([&] { return Array(makeShape(tsUNKNOWN, dims).release()); });
}

Array Array::borrowed(tsClassID classID, Dims dims, void *data, std::shared_ptr<void> lender) {
    if (!hasPlainData(classID)) {
        raise(host_errors::badClass);
    }
    return orOutOfMemory([&] {
        ArrayPointer made = makeShape(classID, dims);
        extrasOf(*made).lender = std::move(lender);
        made->data = data;
        return Array(made.release());
    });
}

tsClassID Array::classID() const noexcept {
    return array->classID;
}
const char *Array::className() const noexcept {
    return tessel::className(array->classID);
}
Dims Array::dims() const noexcept {
    return {array->dims, array->ndim};
}
std::size_t Array::size() const noexcept {
    return array->elements;
}
void *Array::data() const noexcept {
    return array->data;
}

void *Array::imaginary() const noexcept {
    return array->extras ? array->extras->imaginary : nullptr;
}

void Array::wantElementSize(std::size_t size) const {
    if (elementSize(array->classID) != size) {
        raise(host_errors::badClass);
    }
}

double Array::number() const {
    const ReadNumber reader = isNumericClass(array->classID) ? readNumber[array->classID] : nullptr;
    if (reader == nullptr || array->elements == 0) {
        raise(host_errors::badClass);
    }
    return reader(*array);
}

std::string Array::utf8() const {
    if (array->classID == tsFUNCTION) {
        return array->extras->names.front();
    }
    return utf8Of(array.get());
}

std::string utf8Of(const tsArray *characters) {
    if (characters->classID != tsCHAR) {
        raise(host_errors::badClass);
    }
    const std::span units(static_cast<const tsChar *>(characters->data), characters->elements);
    return orOutOfMemory([&] {
        std::string text(utf8Length(units), '\0');
        writeUtf8(units, text.data());
        return text;
    });
}

const Array &Array::cellAt(std::size_t index) const {
    return placeInCell(*array, index);
}

void Array::setCell(std::size_t index, Array value) {
    putIntoCell(*array, placeInCell(*array, index), std::move(value));
}

const std::vector<std::string> &Array::fields() const {
    if (array->classID != tsSTRUCT) {
        raise(host_errors::badClass);
    }
    return array->extras->names;
}

} // namespace tessel
