// tests/fuzz/calls_mutator.cpp: how libFuzzer changes sequences: as calls and inputs, and now and
// then as text.
#include "change.hpp"

#include <algorithm>
#include <cstdint>

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t *data, std::size_t size, std::size_t most);

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t *data, std::size_t size,
                                               std::size_t most, unsigned seed) {
    fuzz::Chance chance(seed);
    if (chance.percent(3)) {
        return LLVMFuzzerMutate(data, size, most);
    }
    fuzz::Sequence sequence =
        fuzz::parsed(std::string_view(reinterpret_cast<const char *>(data), size));
    for (std::size_t changes = 1 + chance.below(4); changes > 0; --changes) {
        fuzz::change(sequence, chance);
    }
    std::string text = fuzz::printed(sequence);
    while (text.size() > most) {
        sequence.pop_back();
        text = fuzz::printed(sequence);
    }
    std::copy(text.begin(), text.end(), data);
    return text.size();
}
