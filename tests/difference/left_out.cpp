// tests/difference/left_out.cpp: the steps that programs are made without.
//
// The module hands these to the library as it gets them, and the library ends or hangs the process,
// fills the disk, or leaves the two formats that this is about.
#include "model.hpp"
#include "run.hpp"

#include <algorithm>
#include <numeric>
#include <stdexcept>

namespace difference {
namespace {

/// Writes reach no farther than this along a record dimension: each record before it is written.
constexpr std::size_t farRecord = 40;
constexpr std::size_t refusedPosition = std::size_t{1} << 63U;

/// More than this is refused by the library before it does anything.
constexpr std::ptrdiff_t farStride = 8;
constexpr std::ptrdiff_t refusedStride = 0x7FFFFFFF;

/// Reads are small, or so large that the host has no such array.
constexpr std::size_t largeRead = 4096;

/// Paddings and alignments stay small, so that the files do.
constexpr std::size_t largePadding = 4096;

/// The one kind of path that programs spell out; all others would leave the run's own folder.
constexpr const char *elsewhere = "no-such-folder/";

bool isPath(const Value &value) {
    return value.classID != tsCHAR || readName(value, "file").rfind(elsewhere, 0) == 0;
}

bool isOneOf(int value, std::initializer_list<int> list) {
    return std::find(list.begin(), list.end(), value) != list.end();
}

/// 64 and 128 end the process; others make files of other formats or none at all.
bool isCreateMode(int mode) {
    return isOneOf(mode, {NC_CLOBBER, NC_NOCLOBBER, NC_64BIT_OFFSET, NC_64BIT_OFFSET | NC_NOCLOBBER,
                          NC_SHARE, NC_SHARE | NC_64BIT_OFFSET, NC_64BIT_OFFSET | NC_CDF5});
}

/// 32768 ends the process.
bool isOpenMode(int mode) {
    return isOneOf(mode, {NC_NOWRITE, NC_WRITE, NC_SHARE, NC_SHARE | NC_WRITE});
}

bool isDefaultFormat(int format) {
    return !isOneOf(format, {NC_FORMAT_NETCDF4, NC_FORMAT_NETCDF4_CLASSIC, NC_FORMAT_CDF5});
}

bool isWrittenPosition(std::size_t at) {
    return at <= farRecord || at >= refusedPosition;
}

bool isWrittenStride(std::ptrdiff_t stride) {
    return stride <= farStride || stride >= refusedStride;
}

/// Counts that only look like the number of elements because their product wraps: endless with
/// strides above 1.
bool wraps(const std::vector<std::size_t> &counts) {
    std::size_t total = 1;
    return std::any_of(counts.begin(), counts.end(), [&](std::size_t count) {
        return __builtin_mul_overflow(total, count, &total);
    });
}

std::size_t product(const std::vector<std::size_t> &counts) {
    return std::accumulate(counts.begin(), counts.end(), std::size_t{1}, std::multiplies<>());
}

bool isReadCount(const std::vector<std::size_t> &counts) {
    if (std::all_of(counts.begin(), counts.end(), [](std::size_t n) { return n <= largeRead; })) {
        return !wraps(counts) && product(counts) <= largeRead;
    }
    const bool hasNone = std::find(counts.begin(), counts.end(), 0U) != counts.end();
    return !hasNone && (wraps(counts) || product(counts) >= refusedPosition);
}

bool isSurvived(const Operation &operation, const std::vector<Value> &in) {
    const auto all = [](const auto &list, const auto &holds) {
        return std::all_of(list.begin(), list.end(), holds);
    };
    switch (operation.verb) {
    case Verb::create:
    case Verb::createTuned:
        return isPath(in.at(0)) && isCreateMode(readMode(in.at(1))) &&
               (operation.verb == Verb::create || readSize(in.at(2), "") <= largePadding);
    case Verb::open:
    case Verb::openTuned:
        return isPath(in.at(0)) && isOpenMode(readMode(in.at(1))) &&
               (operation.verb == Verb::open || readSize(in.at(2), "") <= largePadding);
    case Verb::setDefaultFormat:
        return isDefaultFormat(readInt(in.at(0), ""));
    case Verb::enddefTuned: {
        const std::size_t align = readSize(in.at(2), "");
        const std::size_t recordAlign = readSize(in.at(4), "");
        return readSize(in.at(1), "") <= largePadding && readSize(in.at(3), "") <= largePadding &&
               align > 0 && align <= largePadding && recordAlign > 0 && recordAlign <= largePadding;
    }
    case Verb::defDim: { // a variable over a huge dimension is a huge file, or a close that fails
        const std::size_t length = readSize(in.at(2), "");
        return length <= farRecord || length >= refusedPosition;
    }
    case Verb::putVar1:
        return all(readPositions(in.at(2), "start"), isWrittenPosition);
    case Verb::putVara:
        return all(readPositions(in.at(2), "start"), isWrittenPosition) &&
               !wraps(readPositions(in.at(3), "count"));
    case Verb::putVars:
        return all(readPositions(in.at(2), "start"), isWrittenPosition) &&
               !wraps(readPositions(in.at(3), "count")) &&
               all(readStrides(in.at(4)), isWrittenStride);
    case Verb::getVara:
    case Verb::getVars:
        return isReadCount(readPositions(in.at(3), "count"));
    default:
        return true;
    }
}

/// The inputs with arrays in the places of files and datasets.
std::vector<Value> arrays(const std::vector<Value> &inputs) {
    std::vector<Value> list;
    std::transform(inputs.begin(), inputs.end(), std::back_inserter(list), [](const Value &value) {
        return value.isArray() ? value : value.kind == Value::Kind::file ? text(elsewhere) : num(0);
    });
    return list;
}

} // namespace

bool isLeftOut(const Step &step) {
    const Operation *const operation = findOperation(step.operation);
    if (operation == nullptr) {
        return false;
    }
    try {
        return !isSurvived(*operation, arrays(step.inputs));
    } catch (const Refusal &) {
        return false; // refused before the library is reached
    } catch (const std::out_of_range &) {
        return false; // refused as well: inputs are missing
    }
}

} // namespace difference
