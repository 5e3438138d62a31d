// runtime/src/interface.cpp: the functions that modules call.
#include "array_storage.hpp"
#include "call_frame.hpp"
#include "host_errors.hpp"
#include "tessel/host.h"
#include "text.hpp"

#include <array>
#include <cmath>
#include <cstdarg>
#include <cstdio>
#include <span>
#include <string>

using namespace tessel;

namespace {

/// The frame of the call, after an allocation was counted; raises when it is the one to fail.
CallFrame &admitted() {
    CallFrame &frame = CallFrame::wanted();
    if (!frame.admit()) {
        raise(host_errors::outOfMemory);
    }
    return frame;
}

/// A new array of the call's own.
template <class Make>
tsArray *created(const Make &make) {
    CallFrame &frame = admitted();
    return frame.own(orOutOfMemory(make));
}

std::string formatted(const char *format, va_list arguments) {
    va_list again;
    va_copy(again, arguments);
    const int length = std::vsnprintf(nullptr, 0, format, again);
    va_end(again);
    if (length < 0) {
        return format; // which cannot be formatted, and tells more than nothing
    }
    std::string text(static_cast<std::size_t>(length), '\0');
    std::vsnprintf(text.data(), text.size() + 1, format, arguments);
    return text;
}

} // namespace

tsClassID tsGetClassID(const tsArray *array) {
    return array->classID;
}
const char *tsGetClassName(const tsArray *array) {
    return className(array->classID);
}
bool tsIsNumeric(const tsArray *array) {
    return isNumericClass(array->classID);
}
bool tsIsEmpty(const tsArray *array) {
    return array->elements == 0;
}
size_t tsGetNumberOfElements(const tsArray *array) {
    return array->elements;
}
size_t tsGetNumberOfDimensions(const tsArray *array) {
    return array->ndim;
}
const size_t *tsGetDimensions(const tsArray *array) {
    return array->dims;
}
void *tsGetData(const tsArray *array) {
    return array->data;
}
bool tsIsInf(double value) {
    return std::isinf(value);
}
bool tsIsNaN(double value) {
    return std::isnan(value);
}

tsArray *tsCreateDoubleScalar(double value) {
    return created([&] { return makeScalar(value); });
}

tsArray *tsCreateString(const char *text) {
    return created([&] { return makeText(text); });
}

tsArray *tsCreateUninitNumericArray(size_t ndim, const size_t *dims, tsClassID classID) {
    if (!isNumericClass(classID)) {
        raise(host_errors::badClass);
    }
    return created([&] { return makeArray(classID, {dims, ndim}, Fill::none); });
}

tsArray *tsCreateCharArray(size_t ndim, const size_t *dims) {
    return created([&] { return makeArray(tsCHAR, {dims, ndim}, Fill::zero); });
}

tsArray *tsCreateCellArray(size_t ndim, const size_t *dims) {
    return created([&] { return makeCell({dims, ndim}); });
}

void tsSetCell(tsArray *cell, size_t index, tsArray *value) {
    CallFrame::wanted().giveToCell(*cell, index, value);
}

void *tsCalloc(size_t count, size_t size) {
    CallFrame *const frame = CallFrame::current();
    std::size_t bytes = 0;
    if (frame == nullptr || !frame->admit() || __builtin_mul_overflow(count, size, &bytes)) {
        return nullptr;
    }
    return frame->allocate(bytes, Fill::zero);
}

void tsFree(void *memory) {
    CallFrame *const frame = CallFrame::current();
    if (memory != nullptr && frame != nullptr) {
        frame->free(memory);
    }
}

char *tsArrayToString(const tsArray *array) {
    if (array->classID != tsCHAR) {
        return nullptr;
    }
    CallFrame &frame = admitted();
    const auto terminated = [&frame](std::size_t length) {
        auto *const text = static_cast<char *>(frame.allocate(length + 1, Fill::none));
        if (text == nullptr) {
            raise(host_errors::outOfMemory);
        }
        text[length] = '\0';
        return text;
    };
    const std::span characters(static_cast<const tsChar *>(array->data), array->elements);
    char *text = terminated(characters.size());
    if (!copyIfAscii(characters, text)) {
        frame.free(text);
        text = terminated(utf8Length(characters));
        writeUtf8(characters, text);
    }
    return text;
}

void tsxErrMsgIdAndTxt(const char *identifier, const char *format, ...) {
    va_list arguments;
    va_start(arguments, format);
    const std::string message = orOutOfMemory([&] { return formatted(format, arguments); });
    va_end(arguments);
    throw Error(identifier, message);
}
