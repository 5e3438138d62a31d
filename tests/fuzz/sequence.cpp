// tests/fuzz/sequence.cpp: sequences of calls as values, and as text.
#include "sequence.hpp"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <numeric>
#include <optional>

namespace fuzz {
namespace {

struct ClassName {
    tsClassID classID;
    std::string_view name;
};

constexpr std::array classNames = {
    ClassName{tsDOUBLE, "double"}, ClassName{tsSINGLE, "single"},
    ClassName{tsINT8, "int8"},     ClassName{tsUINT8, "uint8"},
    ClassName{tsINT16, "int16"},   ClassName{tsUINT16, "uint16"},
    ClassName{tsINT32, "int32"},   ClassName{tsUINT32, "uint32"},
    ClassName{tsINT64, "int64"},   ClassName{tsUINT64, "uint64"},
    ClassName{tsCHAR, "char"},     ClassName{tsLOGICAL, "logical"},
    ClassName{tsCELL, "cell"},     ClassName{tsFUNCTION, "function"},
    ClassName{tsSTRUCT, "struct"}, ClassName{tsUNKNOWN, "unknown"},
};

constexpr int hexadecimal = 16;
constexpr std::size_t codeDigits = 4;

bool isPlain(double unit) {
    return (unit >= '0' && unit <= '9') || (unit >= 'A' && unit <= 'Z') ||
           (unit >= 'a' && unit <= 'z') || unit == '_' || unit == '.' || unit == '-';
}

/// Up to the next `end`, which is taken as well.
std::string_view taken(std::string_view &text, char end) {
    const std::size_t at = std::min(text.find(end), text.size());
    const std::string_view part = text.substr(0, at);
    text.remove_prefix(std::min(at + 1, text.size()));
    return part;
}

template <class T>
std::optional<T> numberIn(std::string_view text) {
    T value{};
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    return error == std::errc() && end == text.data() + text.size() ? std::optional(value)
                                                                    : std::nullopt;
}

std::optional<Value> charactersIn(std::string_view text) {
    Value value{.classID = tsCHAR, .dims = {1, 0}};
    while (!text.empty()) {
        const std::size_t length = text[0] == '%' ? 1 + codeDigits : 1;
        if (length == 1) {
            value.elements.push_back(static_cast<unsigned char>(text[0]));
        } else {
            std::uint16_t code = 0;
            const std::string_view digits = text.substr(1, codeDigits);
            std::from_chars(digits.data(), digits.data() + digits.size(), code, hexadecimal);
            value.elements.push_back(code);
        }
        text.remove_prefix(std::min(length, text.size()));
    }
    value.dims[1] = value.elements.size();
    return value.elements.size() <= mostElements ? std::optional(value) : std::nullopt;
}

std::optional<Value> arrayIn(std::string_view text) {
    Value value{.dims = {}};
    std::string_view name = taken(text, '[');
    value.complex = name.ends_with('*');
    name.remove_suffix(value.complex ? 1 : 0);
    const auto *const known = std::find_if(classNames.begin(), classNames.end(),
                                           [&](const ClassName &row) { return row.name == name; });
    std::string_view dims = taken(text, ']');
    while (!dims.empty()) {
        value.dims.push_back(numberIn<std::size_t>(taken(dims, ',')).value_or(1));
    }
    if (known == classNames.end() || value.dims.empty() || value.dims.size() > mostDims ||
        std::any_of(value.dims.begin(), value.dims.end(),
                    [](std::size_t n) { return n > mostElements; }) ||
        sizeOf(value) > mostElements) {
        return std::nullopt;
    }
    value.classID = known->classID;
    if (text.starts_with('{')) {
        text.remove_prefix(1);
        std::string_view elements = taken(text, '}');
        while (!elements.empty() && value.elements.size() < mostElements) {
            value.elements.push_back(numberIn<double>(taken(elements, ',')).value_or(0));
        }
    }
    return value;
}

std::optional<Value> valueIn(std::string_view text) {
    if (text.starts_with('@')) {
        const auto slot = numberIn<std::size_t>(text.substr(1));
        return slot ? std::optional(Value{.kind = Value::Kind::dataset, .slot = *slot})
                    : std::nullopt;
    }
    if (text.starts_with('\'')) {
        text.remove_prefix(1);
        return charactersIn(taken(text, '\''));
    }
    if (const auto value = numberIn<double>(text)) {
        return number(*value);
    }
    return arrayIn(text);
}

std::string spelled(double value) {
    std::array<char, 32> digits{};
    char *const end = std::to_chars(digits.data(), digits.data() + digits.size(), value).ptr;
    return {digits.data(), end};
}

std::string spelledCharacters(const Value &value) {
    std::string text = "'";
    for (const double unit : value.elements) {
        if (isPlain(unit)) {
            text += static_cast<char>(unit);
        } else {
            constexpr std::string_view digits = "0123456789abcdef";
            const auto code = unit > 0 ? static_cast<unsigned>(std::min(unit, 65535.0)) : 0U;
            text += '%';
            for (const unsigned shift : {12U, 8U, 4U, 0U}) {
                text += digits[code >> shift & 0xFU];
            }
        }
    }
    return text + "'";
}

std::string spelled(const Value &value) {
    if (value.kind == Value::Kind::dataset) {
        return std::string(1, '@').append(std::to_string(value.slot));
    }
    const bool single = value.dims == std::vector<std::size_t>{1, 1};
    if (value.classID == tsDOUBLE && single && !value.complex && value.elements.size() == 1) {
        return spelled(value.elements[0]);
    }
    if (value.classID == tsCHAR && !value.complex &&
        value.dims == std::vector<std::size_t>{1, value.elements.size()}) {
        return spelledCharacters(value);
    }
    const auto *const known =
        std::find_if(classNames.begin(), classNames.end(),
                     [&](const ClassName &row) { return row.classID == value.classID; });
    std::string text(known->name);
    text += value.complex ? "*[" : "[";
    for (const std::size_t length : value.dims) {
        text += std::to_string(length) + ",";
    }
    text.back() = ']';
    if (!value.elements.empty()) {
        text += '{';
        for (const double element : value.elements) {
            text += spelled(element) + ",";
        }
        text.back() = '}';
    }
    return text;
}

} // namespace

Value number(double value) {
    return {.elements = {value}};
}

Value row(std::vector<double> values) {
    const std::size_t n = values.size();
    return {.dims = {1, n}, .elements = std::move(values)};
}

Value characters(std::string_view bytes) {
    Value value = row({});
    value.classID = tsCHAR;
    value.dims[1] = bytes.size();
    std::transform(bytes.begin(), bytes.end(), std::back_inserter(value.elements),
                   [](char c) { return static_cast<unsigned char>(c); });
    return value;
}

std::size_t sizeOf(const Value &value) {
    return std::accumulate(value.dims.begin(), value.dims.end(), std::size_t{1},
                           std::multiplies<>());
}

Sequence parsed(std::string_view text) {
    Sequence sequence;
    sequence.reserve(mostSteps);
    while (!text.empty() && sequence.size() < mostSteps) {
        std::string_view line = taken(text, '\n');
        Step step{std::string(taken(line, ' ')), {}};
        step.inputs.reserve(mostInputs);
        while (!line.empty() && step.inputs.size() < mostInputs) {
            const std::string_view word = taken(line, ' ');
            if (word.starts_with('>')) {
                step.outputs = numberIn<int>(word.substr(1)).value_or(1);
            } else if (auto value = valueIn(word)) {
                step.inputs.push_back(*std::move(value));
            }
        }
        if (!step.operation.empty() && !step.operation.starts_with('#')) {
            sequence.push_back(std::move(step));
        }
    }
    return sequence;
}

std::string printed(const Sequence &sequence) {
    std::string text;
    for (const Step &step : sequence) {
        text += step.operation;
        for (const Value &value : step.inputs) {
            text.append(1, ' ').append(spelled(value));
        }
        if (step.outputs != 1) {
            text += " >" + std::to_string(step.outputs);
        }
        text += '\n';
    }
    return text;
}

} // namespace fuzz
