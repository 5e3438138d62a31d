// tests/support/probe.cpp: what a module asks of the library and of the host, seen and answered.
#include "support/probe.hpp"

#include "support/text.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <cstring>

namespace tessel::test {
namespace {

Probe *alive = nullptr;

constexpr std::array<std::string_view, 4> openers = {"nc_open", "nc__open", "nc_create",
                                                     "nc__create"};

bool opens(std::string_view function) {
    return std::find(openers.begin(), openers.end(), function) != openers.end();
}

/// The typed families: the last argument is the data.
bool movesData(std::string_view function) {
    return function.starts_with("nc_get_") || function.starts_with("nc_put_");
}

bool onlyReads(std::string_view function) {
    return function.starts_with("nc_get_") || function.starts_with("nc_inq");
}

/// Index vectors are as long as the variable has dimensions; 0 for a variable that is not there.
std::size_t dimensionCount(const std::vector<Argument> &arguments) {
    int count = 0;
    nc_inq_varndims(static_cast<int>(std::get<long long>(arguments[0])),
                    static_cast<int>(std::get<long long>(arguments[1])), &count);
    return static_cast<std::size_t>(count);
}

/// The memory that an argument points to.
const void *memoryOf(const Argument &argument) {
    return std::visit(
        [](const auto &value) -> const void * {
            if constexpr (std::is_pointer_v<std::remove_cvref_t<decltype(value)>>) {
                return value;
            } else {
                return nullptr;
            }
        },
        argument);
}

template <class T>
std::string shownVector(const T *values, std::size_t size) {
    std::string text = "{";
    for (std::size_t i = 0; i < size; ++i) {
        text += (i == 0 ? "" : ", ") + shown(values[i]);
    }
    return text + "}";
}

} // namespace

Probe::Probe() {
    alive = this;
}

Probe::~Probe() {
    alive = nullptr;
}

Probe *Probe::watching() {
    return alive != nullptr && alive->pauses == 0 ? alive : nullptr;
}

void Probe::answer(std::string_view function, int status, int n) {
    answers.push_back({std::string(function), status, n});
}

std::string Probe::shownArgument(const std::vector<Argument> &arguments, std::size_t at,
                                 bool inOut) const {
    const Argument &argument = arguments[at];
    if (const auto *number = std::get_if<long long>(&argument)) {
        const auto id = ids.find(static_cast<int>(*number));
        return id == ids.end() ? shown(*number) : id->second;
    }
    if (const auto *number = std::get_if<unsigned long long>(&argument)) {
        return shown(*number);
    }
    if (const auto *text = std::get_if<const char *>(&argument)) {
        std::string_view name = *text;
        if (!folder.empty() && name.starts_with(folder)) {
            name.remove_prefix(folder.size());
        }
        return quoted(std::span<const char>(name));
    }
    if (const auto *dimids = std::get_if<const int *>(&argument)) {
        return shownVector(*dimids,
                           static_cast<std::size_t>(std::get<long long>(arguments[at - 1])));
    }
    if (const auto *vector = std::get_if<const std::size_t *>(&argument)) {
        return shownVector(*vector, dimensionCount(arguments));
    }
    if (const auto *vector = std::get_if<const std::ptrdiff_t *>(&argument)) {
        return shownVector(*vector, dimensionCount(arguments));
    }
    if (const auto *size = std::get_if<std::size_t *>(&argument); size != nullptr && inOut) {
        return std::string("&").append(shown(**size));
    }
    return memoryOf(argument) == nullptr ? "NULL" : "out";
}

void Probe::begin(std::string_view function, const std::vector<Argument> &arguments) {
    const std::size_t plain = arguments.size() - (movesData(function) ? 1 : 0);
    Note line = {std::string(function) + "(", nullptr};
    for (std::size_t at = 0; at < plain; ++at) {
        line.text += (at == 0 ? "" : ", ") + shownArgument(arguments, at, opens(function));
    }
    if (movesData(function)) {
        line.text += ", ";
        line.memory = memoryOf(arguments.back());
        if (line.memory == nullptr) {
            line.text += "NULL";
        }
    }
    notes.push_back(std::move(line));
}

std::optional<int> Probe::answerTo(std::string_view function,
                                   const std::vector<Argument> &arguments) {
    const int n = ++counts[std::string(function)];
    const auto found = std::find_if(answers.begin(), answers.end(), [&](const Answer &one) {
        return one.function == function && one.n == n;
    });
    if (found == answers.end()) {
        return std::nullopt;
    }
    if (function.starts_with("nc_get_")) {
        std::memcpy(const_cast<void *>(memoryOf(arguments.back())), left.data(), left.size());
    }
    return found->status;
}

void Probe::end(std::string_view function, int status, const std::vector<Argument> &arguments) {
    if (status != NC_NOERR) {
        return;
    }
    effect = effect || !onlyReads(function);
    if (opens(function)) {
        openedIDs.push_back(*std::get<int *>(arguments.back()));
    }
}

void Probe::noteBlock(std::string call, const void *block) {
    note(std::move(call));
    if (block != nullptr) {
        blocks.push_back(block);
        name(block, "block");
    }
}

void Probe::noteFree(const void *block) {
    const auto found = std::find(blocks.begin(), blocks.end(), block);
    if (found != blocks.end()) {
        blocks.erase(found);
        note("tsFree(block)");
    }
}

std::vector<std::string> Probe::trace() const {
    std::vector<std::string> lines;
    for (const Note &one : notes) {
        std::string line = one.text;
        if (one.memory != nullptr) {
            const auto found = memory.find(one.memory);
            line += found == memory.end() ? "memory of its own" : found->second;
        }
        lines.push_back(line + (line.ends_with(')') ? "" : ")"));
    }
    return lines;
}

} // namespace tessel::test
