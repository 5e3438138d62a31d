// tests/fuzz/fields.cpp: where the numbers of a classic file's header are.
#include "fields.hpp"

#include <algorithm>
#include <array>
#include <cstdint>

namespace fuzz {
namespace {

constexpr std::size_t mostFields = 4096;
constexpr std::array<std::size_t, 12> typeSizes = {1, 1, 1, 2, 4, 4, 8, 1, 2, 4, 8, 8};

struct Ended {};

class Walk {
  public:
    explicit Walk(std::span<const std::uint8_t> given) : file(given) {}

    std::vector<Field> fields() {
        try {
            header();
        } catch (const Ended &) {
            // what was found until then is what there is
        }
        return std::move(found);
    }

  private:
    void header() {
        const std::uint64_t version = file.size() < at ? 0 : file[at - 1];
        wide = version == 5 ? 8 : 4;
        offset = version == 1 ? 4 : 8;
        number(Field::Kind::length, wide); // of the records
        each([&] {
            name();
            number(Field::Kind::length, wide);
        });
        attributes();
        each([&] {
            name();
            for (std::uint64_t n = number(Field::Kind::count, wide); n > 0; --n) {
                number(Field::Kind::dimension, wide);
            }
            attributes();
            number(Field::Kind::type, 4);
            number(Field::Kind::size, wide);
            number(Field::Kind::place, offset);
        });
    }

    template <class Entry>
    void each(const Entry &entry) {
        number(Field::Kind::tag, 4);
        for (std::uint64_t n = number(Field::Kind::count, wide); n > 0; --n) {
            entry();
        }
    }

    void attributes() {
        each([&] {
            name();
            const std::uint64_t type = number(Field::Kind::type, 4);
            const std::uint64_t values = number(Field::Kind::count, wide);
            const std::size_t size = typeSizes[std::min<std::uint64_t>(type, typeSizes.size() - 1)];
            skip(std::min<std::uint64_t>(values, file.size()) * size);
        });
    }

    void name() {
        const std::uint64_t length = number(Field::Kind::count, wide);
        const std::size_t from = at;
        skip(std::min<std::uint64_t>(length, file.size()));
        found.push_back({Field::Kind::name, from, static_cast<std::size_t>(length)});
    }

    std::uint64_t number(Field::Kind kind, std::size_t bytes) {
        const Field field{kind, at, bytes};
        if (file.size() - at < bytes || found.size() == mostFields) {
            throw Ended{};
        }
        found.push_back(field);
        at += bytes;
        return read(file, field);
    }

    void skip(std::size_t bytes) {
        const std::size_t padded = (bytes + 3) / 4 * 4;
        if (file.size() - at < padded) {
            throw Ended{};
        }
        at += padded;
    }

    std::span<const std::uint8_t> file;
    std::size_t at = 4; // behind the magic
    std::size_t wide = 4;
    std::size_t offset = 4;
    std::vector<Field> found;
};

} // namespace

std::vector<Field> fieldsOf(std::span<const std::uint8_t> file) {
    return file.size() < 8 ? std::vector<Field>() : Walk(file).fields();
}

std::uint64_t read(std::span<const std::uint8_t> file, const Field &field) {
    std::uint64_t value = 0;
    for (const std::uint8_t byte : file.subspan(field.at, field.bytes)) {
        value = value << 8U | byte;
    }
    return value;
}

void write(std::span<std::uint8_t> file, const Field &field, std::uint64_t value) {
    for (std::size_t i = field.bytes; i > 0; --i) {
        file[field.at + i - 1] = static_cast<std::uint8_t>(value);
        value >>= 8U;
    }
}

} // namespace fuzz
