// runtime/src/call_frame.hpp: one call in progress, and what it has made so far.
#pragma once

#include "array_storage.hpp"
#include "block.hpp"
#include "tessel/runtime/module.hpp"

#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace tessel {

/// Owns all that a call creates, until it is handed out or freed; what is left when the frame ends
/// is reclaimed. A thread has at most one.
class CallFrame {
  public:
    explicit CallFrame(const CallOptions &options) noexcept;
    ~CallFrame();
    CallFrame(const CallFrame &) = delete;
    CallFrame &operator=(const CallFrame &) = delete;

    /// The calling thread's frame; nullptr outside of a call.
    static CallFrame *current() noexcept;

    /// The same; Error "TESSEL:host:noCall" outside of a call.
    static CallFrame &wanted();

    /// Counts an allocation; false if it is the one that is to fail.
    bool admit() noexcept { return ++allocations != failAllocation; }

    /// Makes an array the frame's own.
    tsArray *own(ArrayPointer array) noexcept;

    /// Takes an array out of the frame. Error "TESSEL:host:badOwner" if it is not in it.
    Array give(tsArray *array);

    /// Gives an array, or none, to a cell of the frame's. Raises what `give` and `placeInCell` do,
    /// and then the frame has the array still.
    void giveToCell(tsArray &cell, std::size_t index, tsArray *array);

    /// A block of the frame's own; nullptr where there is no memory.
    void *allocate(std::size_t bytes, Fill fill) noexcept;

    /// Frees a block of the frame's.
    void free(void *block) noexcept;

    /// Remembers, in checked mode, what the inputs are like.
    void watch(std::span<const tsArray *const> inputs);

    /// Looks, in checked mode, for what the call did wrong and left behind. The first fault, or
    /// nullptr.
    const char *inspect() noexcept;

  private:
    struct Watched {
        const tsArray *input;
        std::uint64_t sum;
    };

    [[nodiscard]] bool owns(const tsArray *array) const noexcept;
    void note(const char *what) noexcept;

    Link blocks;
    Link arrays;
    std::size_t allocations = 0;
    std::size_t failAllocation;
    CallReport *report;
    const char *fault = nullptr;
    std::vector<Watched> watched;
};

} // namespace tessel
