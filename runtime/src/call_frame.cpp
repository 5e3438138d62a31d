// runtime/src/call_frame.cpp: one call in progress, and what it has made so far.
#include "call_frame.hpp"

#include "host_errors.hpp"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <utility>

namespace tessel {
namespace {

// A call begins and ends on one thread, and the module's own threads, if it has any, do not call
// the host. Each function of the host's looks here, so the place is one that the loader fixes.
[[gnu::tls_model("initial-exec")]] thread_local CallFrame *currentFrame = nullptr;

/// Nearly every call needs room for a name or two: blocks up to this size are made as large, and
/// the last one that was freed waits for the next. Calls come one after the other, so that they can
/// share it. In checked mode each block is a new one.
constexpr std::size_t smallBlock = 256;
void *spareBlock = nullptr;

std::size_t count(const Link &ring) noexcept {
    std::size_t n = 0;
    for (const Link *at = ring.next; at != &ring; at = at->next) {
        ++n;
    }
    return n;
}

/// A sum over an input's dimensions and plain data, to tell whether they changed (FNV-1a).
std::uint64_t sumOf(const tsArray &array) noexcept {
    std::uint64_t sum = 14695981039346656037U;
    const auto add = [&](const void *data, std::size_t bytes) {
        const auto *const from = static_cast<const unsigned char *>(data);
        std::for_each(from, from + bytes,
                      [&](unsigned char byte) { sum = (sum ^ byte) * 1099511628211U; });
    };
    add(array.dims, array.ndim * sizeof(std::size_t));
    add(array.data, array.elements * elementSize(array.classID));
    return sum;
}

bool guardsAreIntact(const tsArray &array) noexcept {
    return tessel::guardsAreIntact(array.block) &&
           (!array.extras || tessel::guardsAreIntact(array.extras->imaginary));
}

constexpr const char *guardFault = "it wrote outside of a block or an array";
constexpr const char *inputFault = "it changed an input";
constexpr const char *freeFault = "it freed memory that was not the call's, or freed it twice";

} // namespace

CallFrame::CallFrame(const CallOptions &options) noexcept
    : failAllocation(options.failAllocation), report(options.report) {
    if (report != nullptr) {
        *report = {};
    }
    currentFrame = this;
}

CallFrame::~CallFrame() {
    if (report != nullptr) {
        report->allocations = allocations;
    }
    for (Link *at = arrays.next; at != &arrays;) {
        tsArray *const array = &arrayOf(*at);
        at = at->next;
        delete array;
    }
    for (Link *at = blocks.next; at != &blocks;) {
        void *const block = blockOf(*at);
        at = at->next;
        freeBlock(block);
    }
    currentFrame = nullptr;
}

CallFrame *CallFrame::current() noexcept {
    return currentFrame;
}

CallFrame &CallFrame::wanted() {
    if (currentFrame == nullptr) {
        raise(host_errors::noCall);
    }
    return *currentFrame;
}

tsArray *CallFrame::own(ArrayPointer array) noexcept {
    array->frame = this;
    array->insertBefore(arrays);
    return array.release();
}

/// In checked mode the array is looked for, since a module may hand out one that is no more.
bool CallFrame::owns(const tsArray *array) const noexcept {
    if (!isChecked()) {
        return array->frame == this;
    }
    const Link *at = arrays.next;
    while (at != &arrays && at != array) {
        at = at->next;
    }
    return at != &arrays;
}

Array CallFrame::give(tsArray *array) {
    if (!owns(array)) {
        raise(host_errors::badOwner);
    }
    if (!guardsAreIntact(*array)) {
        note(guardFault);
    }
    array->frame = nullptr;
    array->remove();
    return Array::adopt(array);
}

void CallFrame::giveToCell(tsArray &cell, std::size_t index, tsArray *array) {
    const tsArray *outermost = &cell;
    while (outermost->holder != nullptr) {
        outermost = outermost->holder;
    }
    if (outermost == array || !owns(outermost)) { // no cell is within itself, and no input changes
        raise(host_errors::badOwner);
    }
    Array &place = placeInCell(cell, index);
    putIntoCell(cell, place, array == nullptr ? Array() : give(array));
}

void *CallFrame::allocate(std::size_t bytes, Fill fill) noexcept {
    void *block = nullptr;
    if (bytes > smallBlock || isChecked()) {
        block = allocateBlock(bytes, fill);
    } else if (spareBlock == nullptr) {
        block = allocateBlock(smallBlock, fill);
    } else {
        block = std::exchange(spareBlock, nullptr);
        if (fill == Fill::zero) {
            std::memset(block, 0, bytes);
        }
    }
    if (block != nullptr) {
        linkOf(block).insertBefore(blocks);
    }
    return block;
}

void CallFrame::free(void *block) noexcept {
    if (isChecked()) {
        Link *at = blocks.next;
        while (at != &blocks && blockOf(*at) != block) {
            at = at->next;
        }
        if (at == &blocks) {
            note(freeFault);
            return;
        }
        if (!guardsAreIntact(block)) {
            note(guardFault);
        }
    }
    linkOf(block).remove();
    if (spareBlock == nullptr && sizeOf(block) == smallBlock && !isChecked()) {
        spareBlock = block;
    } else {
        freeBlock(block);
    }
}

void CallFrame::watch(std::span<const tsArray *const> inputs) {
    if (isChecked()) {
        for (const tsArray *input : inputs) {
            watched.push_back({input, sumOf(*input)});
        }
    }
}

void CallFrame::note(const char *what) noexcept {
    if (fault == nullptr) {
        fault = what;
    }
}

const char *CallFrame::inspect() noexcept {
    if (!isChecked()) {
        return nullptr;
    }
    if (report != nullptr) {
        report->blocksLeft = count(blocks);
        report->arraysLeft = count(arrays);
    }
    for (Link *at = blocks.next; at != &blocks; at = at->next) {
        if (!tessel::guardsAreIntact(blockOf(*at))) {
            note(guardFault);
        }
    }
    for (Link *at = arrays.next; at != &arrays; at = at->next) {
        if (!guardsAreIntact(arrayOf(*at))) {
            note(guardFault);
        }
    }
    for (const Watched &one : watched) {
        if (!guardsAreIntact(*one.input)) {
            note(guardFault);
        }
        if (sumOf(*one.input) != one.sum) {
            note(inputFault);
        }
    }
    return fault;
}

} // namespace tessel
