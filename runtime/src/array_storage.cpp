// runtime/src/array_storage.cpp: what a host array is made of.
#include "array_storage.hpp"

#include "host_errors.hpp"
#include "tessel/runtime/module.hpp"
#include "text.hpp"

#include <algorithm>
#include <optional>

namespace tessel {
namespace {

struct ClassFacts {
    const char *name;
    std::size_t elementSize; ///< 0: no plain data
    bool numeric;
};

/// By class id.
constexpr std::array<ClassFacts, tsFUNCTION + 1> classes = {{
    {"unknown", 0, false},
    {"cell", 0, false},
    {"struct", 0, false},
    {"logical", 1, false},
    {"char", sizeof(tsChar), false},
    {"double", 8, true},
    {"single", 4, true},
    {"int8", 1, true},
    {"uint8", 1, true},
    {"int16", 2, true},
    {"uint16", 2, true},
    {"int32", 4, true},
    {"uint32", 4, true},
    {"int64", 8, true},
    {"uint64", 8, true},
    {"function_handle", 0, false},
}};

const ClassFacts &factsOf(tsClassID classID) noexcept {
    const auto index = static_cast<std::size_t>(classID);
    return classes[index < classes.size() ? index : std::size_t{tsUNKNOWN}];
}

/// The number of elements, zero where a dimension is; nothing when it or the size in bytes is
/// beyond what there can be.
std::optional<std::size_t> countElements(Dims dims, std::size_t elementSize) noexcept {
    std::size_t elements = 1;
    bool tooMany = false;
    for (const std::size_t length : dims) {
        if (length == 0) {
            return 0;
        }
        tooMany |= __builtin_mul_overflow(elements, length, &elements);
    }
    std::ptrdiff_t bytes = 0;
    tooMany |= __builtin_mul_overflow(elements, std::max<std::size_t>(elementSize, 1), &bytes);
    return tooMany ? std::nullopt : std::optional(elements);
}

} // namespace

std::size_t elementSize(tsClassID classID) noexcept {
    return factsOf(classID).elementSize;
}
bool isNumericClass(tsClassID classID) noexcept {
    return factsOf(classID).numeric;
}
const char *className(tsClassID classID) noexcept {
    return factsOf(classID).name;
}

ArrayPointer makeShape(tsClassID classID, Dims dims) {
    if (dims.empty()) {
        raise(host_errors::badDimensions);
    }
    const std::optional<std::size_t> elements = countElements(dims, elementSize(classID));
    if (!elements) {
        raise(host_errors::dimensionsTooLarge);
    }
    auto array = std::make_unique_for_overwrite<tsArray>(); // small data are not cleared
    array->classID = classID;
    array->elements = *elements;
    array->ndim = std::max<std::size_t>(dims.size(), 2);
    std::size_t *room = array->fewDims.data();
    if (array->ndim > array->fewDims.size()) {
        array->manyDims = std::make_unique<std::size_t[]>(array->ndim);
        room = array->manyDims.get();
    }
    room[0] = dims[0]; // as a rule there are two, for which a call of the library's is long
    room[1] = dims.size() > 1 ? dims[1] : 1;
    for (std::size_t i = 2; i < dims.size(); ++i) {
        room[i] = dims[i];
    }
    array->dims = room;
    return array;
}

ArrayPointer makeArray(tsClassID classID, Dims dims, Fill fill) {
    ArrayPointer array = makeShape(classID, dims);
    const std::size_t bytes = array->elements * elementSize(classID);
    if (bytes <= sizeof(array->smallData) && !isChecked()) {
        array->data = array->smallData.data();
        if (fill == Fill::zero) {
            array->smallData.fill(std::byte{0});
        }
        return array;
    }
    array->block = allocateBlock(bytes, fill);
    if (array->block == nullptr) {
        raise(host_errors::outOfMemory);
    }
    array->data = array->block;
    return array;
}

/// Most results are one number. With all that it calls within it, what is known of the dimensions
/// need not be worked out again.
[[gnu::flatten]] ArrayPointer makeScalar(double value) {
    constexpr std::array<std::size_t, 2> dims = {1, 1};
    ArrayPointer array = makeArray(tsDOUBLE, dims, Fill::none);
    *static_cast<double *>(array->data) = value;
    return array;
}

ArrayExtras &extrasOf(tsArray &array) {
    if (!array.extras) {
        array.extras = std::make_unique<ArrayExtras>();
    }
    return *array.extras;
}

ArrayPointer makeText(std::string_view utf8) {
    const auto rowOf = [](std::size_t length) {
        return makeArray(tsCHAR, std::array<std::size_t, 2>{1, length}, Fill::none);
    };
    ArrayPointer array = rowOf(utf8.size());
    if (!copyIfAscii(utf8, static_cast<tsChar *>(array->data))) {
        array.reset();
        array = rowOf(utf16Length(utf8));
        writeUtf16(utf8, static_cast<tsChar *>(array->data));
    }
    return array;
}

ArrayPointer makeCell(Dims dims) {
    ArrayPointer array = makeShape(tsCELL, dims);
    if (array->elements > std::vector<Array>().max_size()) {
        raise(host_errors::dimensionsTooLarge);
    }
    extrasOf(*array).cells.resize(array->elements);
    return array;
}

Array &placeInCell(tsArray &cell, std::size_t index) {
    if (cell.classID != tsCELL && cell.classID != tsSTRUCT) {
        raise(host_errors::badClass);
    }
    if (index >= cell.extras->cells.size()) {
        raise(host_errors::badIndex);
    }
    return cell.extras->cells[index];
}

void putIntoCell(tsArray &cell, Array &place, Array &&value) noexcept {
    if (value) {
        value.get()->holder = &cell;
    }
    place = std::move(value);
}

} // namespace tessel

/// Cells may be nested deeper than the stack is, so what is in them is not destroyed from within
/// them but taken out, one after the other.
tsArray::~tsArray() {
    tessel::Link pending;
    const auto takeOut = [&pending](const tsArray &from) {
        if (from.extras) {
            for (tessel::Array &cell : from.extras->cells) {
                if (cell) {
                    cell.release()->insertBefore(pending);
                }
            }
        }
    };
    takeOut(*this);
    while (!pending.alone()) {
        tsArray &inner = tessel::arrayOf(*pending.next);
        takeOut(inner);
        delete &inner; // takes itself out of the ring
    }
    tessel::freeBlock(block);
    if (extras) {
        tessel::freeBlock(extras->imaginary);
    }
    remove();
}
