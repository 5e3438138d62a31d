// guard/src/header.cpp: what a file of the classic formats claims about itself.
#include "header.hpp"

#include "bytes.hpp"
#include "external_types.hpp"
#include "names.hpp"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <optional>
#include <string_view>
#include <vector>

namespace tessel::guard {
namespace {

// The library's limits.
constexpr std::uint64_t maxDimensions = 1024;
constexpr std::uint64_t maxLength = std::numeric_limits<std::int64_t>::max();

/// The lists of a header, by their tags.
enum : std::uint32_t { dimensionList = 10, variableList = 11, attributeList = 12 };

/// The last type, which is none.
constexpr std::uint64_t typeWithoutSize = typeSizes.size() - 1;

/// Nothing more can be said: the file is not of these formats, or cannot be read. The library says
/// so itself.
struct Ended {};

/// The claim that is not to be trusted.
struct Distrusted {
    std::string claim;
};

/// Reads a file from its beginning on. Most headers fit into the buffer: then opening, one look at
/// what is open, one read and closing are all that it costs.
class Reader {
  public:
    explicit Reader(int descriptor) : file(descriptor) {
        if (file >= 0) {
            known = fstat(file, &status) == 0;
            fill();
        }
    }

    [[nodiscard]] FileIdentity identity() const noexcept { return {status.st_dev, status.st_ino}; }

    /// Of what is no regular file, nothing more can be said.
    [[nodiscard]] std::uint64_t size() const {
        if (!known || !S_ISREG(status.st_mode)) {
            throw Ended{};
        }
        return static_cast<std::uint64_t>(status.st_size);
    }

    [[nodiscard]] bool has(std::uint64_t bytes) const {
        return bytes <= ahead() || bytes <= left();
    }

    [[nodiscard]] std::uint64_t left() const { return size() - std::min(position, size()); }

    std::uint64_t number(std::size_t bytes) {
        std::uint64_t value = 0;
        for (std::size_t i = 0; i < bytes; ++i) {
            value = value << 8U | byte();
        }
        return value;
    }

    /// Whether there is anything where something is to be.
    [[nodiscard]] bool goesOn() {
        const bool any = has(1);
        lacking = lacking || !any;
        return any;
    }

    /// The library reads on behind the end of the file, where it finds zeros.
    void skip(std::uint64_t bytes) {
        const bool all = has(bytes);
        lacking = lacking || !all;
        position += all ? bytes : left();
    }

    /// Whether something was to be there, and was not.
    [[nodiscard]] bool wasShort() const noexcept { return lacking; }

  private:
    unsigned char byte() {
        if (ahead() == 0) {
            if (left() == 0) {
                lacking = true;
                return 0;
            }
            fill();
            if (buffered == 0) {
                throw Ended{};
            }
        }
        return buffer[static_cast<std::size_t>(position++ - start)];
    }

    /// How much of the buffer is still to be read; what is skipped may lie behind it.
    [[nodiscard]] std::uint64_t ahead() const noexcept {
        return start + buffered - std::min(position, start + buffered);
    }

    void fill() {
        const ssize_t got = pread(file, buffer.data(), buffer.size(), static_cast<off_t>(position));
        start = position;
        buffered = got > 0 ? static_cast<std::uint64_t>(got) : 0;
    }

    int file;
    struct stat status {};
    bool known = false;
    bool lacking = false;
    std::uint64_t position = 0;
    std::uint64_t start = 0;
    std::uint64_t buffered = 0;
    std::array<unsigned char, 4096> buffer; // of which `buffered` bytes have values
};

/// Walks through a header and looks at its claims.
class Walk {
  public:
    explicit Walk(int file) : reader(file) {}

    void go(Header &found) {
        found.file = reader.identity();
        if (reader.number(3) != 0x434446) { // "CDF"
            throw Ended{};
        }
        const std::uint64_t version = reader.number(1);
        countSize = version == 5 ? 8 : 4;
        offsetSize = version == 1 ? 4 : 8;
        if (version != 1 && version != 2 && version != 5) {
            throw Ended{};
        }
        found.classic = true;
        found.data64 = version == 5;
        found.size = reader.size();
        const std::uint64_t records = reader.number(countSize);
        for (std::uint64_t n = list(dimensionList, "dimensions"); n > 0 && reader.goesOn(); --n) {
            name();
            lengths.push_back(reader.number(countSize));
        }
        attributes();
        for (std::uint64_t n = list(variableList, "variables"); n > 0 && reader.goesOn(); --n) {
            variable();
        }
        found.extent = extent(records);
        found.whole = !reader.wasShort();
        if (found.extent.end > maxLength) {
            throw Distrusted{"claims data that end behind 2^63 bytes, where no file reaches"};
        }
    }

  private:
    std::uint64_t count(std::string_view what) {
        const std::uint64_t n = reader.number(countSize);
        if (!reader.has(n)) {
            throw Distrusted{"has " + std::to_string(n) + " " + std::string(what) +
                             ", where the file has " + std::to_string(reader.left()) +
                             " bytes left"};
        }
        return n;
    }

    std::uint64_t list(std::uint32_t tag, std::string_view what) {
        const std::uint64_t found = reader.number(4);
        const std::uint64_t n = count(what);
        if (found != tag && n != 0) { // of an empty list the library looks at no tag
            throw Ended{};
        }
        return n;
    }

    void name() {
        const std::uint64_t length = count("characters in a name");
        if (length > longestName) {
            throw Distrusted{"has a name of " + std::to_string(length) + " characters, where " +
                             std::to_string(longestName) + " are the most"};
        }
        reader.skip(padded(length));
    }

    void attributes() {
        for (std::uint64_t n = list(attributeList, "attributes"); n > 0 && reader.goesOn(); --n) {
            name();
            const std::uint64_t type = reader.number(4);
            const std::uint64_t values = count("values in an attribute");
            if (type >= typeSizes.size()) {
                throw Ended{};
            }
            reader.skip(padded(values * typeSizes[static_cast<std::size_t>(type)]));
        }
    }

    void variable() {
        name();
        const std::uint64_t dimensions = count("dimensions in a variable");
        if (dimensions > maxDimensions) {
            throw Distrusted{"has a variable of " + std::to_string(dimensions) +
                             " dimensions, where " + std::to_string(maxDimensions) +
                             " are the most"};
        }
        std::uint64_t elements = 1; // of a record, where there are any
        bool hasRecords = false;
        for (std::uint64_t i = 0; i < dimensions; ++i) {
            const std::uint64_t dimid = reader.number(countSize);
            const std::uint64_t length = dimid < lengths.size() ? lengths[dimid] : 1;
            if (length > maxLength) {
                throw Distrusted{"has a variable over a dimension of " + std::to_string(length) +
                                 " elements, where " + std::to_string(maxLength) + " are the most"};
            }
            hasRecords = hasRecords || (i == 0 && length == 0);
            elements = product(elements, std::max<std::uint64_t>(length, 1));
        }
        attributes();
        const std::uint64_t type = reader.number(4);
        if (type == typeWithoutSize) {
            throw Distrusted{"has a variable of the type " + std::to_string(typeWithoutSize) +
                             ", which has no size"};
        }
        if (type >= typeSizes.size()) {
            throw Ended{};
        }
        reader.skip(countSize); // the size, which the library computes itself, as is done here
        const std::uint64_t bytes = product(elements, typeSizes[static_cast<std::size_t>(type)]);
        const std::uint64_t begin = reader.number(offsetSize);
        (hasRecords ? inRecords : fixed).add(begin, bytes);
    }

    /// Where so many records end.
    [[nodiscard]] Extent extent(std::uint64_t records) const noexcept {
        Extent found;
        found.record = inRecords.variables == 1 ? inRecords.packed : inRecords.bytes;
        found.room = std::max(fixed.end, inRecords.end);
        found.gaps = found.room - std::min(found.room, sum(fixed.bytes, inRecords.bytes));
        found.end = fixed.end;
        if (records > 0 && inRecords.variables > 0) {
            const std::uint64_t last = product(records - 1, found.record);
            found.end = std::max(found.end, sum(inRecords.end, last));
        }
        return found;
    }

    /// The variables with records, or those without.
    struct Part {
        void add(std::uint64_t begin, std::uint64_t given) noexcept {
            const std::uint64_t rounded = padded(given);
            ++variables;
            packed = given;
            bytes = sum(bytes, rounded);
            end = std::max(end, sum(begin, rounded));
        }

        std::uint64_t variables = 0;
        std::uint64_t packed = 0; // a single one with records is not filled up
        std::uint64_t bytes = 0;
        std::uint64_t end = 0; // of the first record
    };

    Reader reader;
    std::vector<std::uint64_t> lengths; // of the dimensions
    Part fixed;
    Part inRecords;
    std::size_t countSize = 4;
    std::size_t offsetSize = 4;
};

/// Whether a path leads to a regular file. To open anything else may wait, as a pipe does for
/// whoever writes to it, or do something.
bool isRegular(const std::string &path) noexcept {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode);
}

/// A regular file that is open for reading, if it can be. It may be something else by the time that
/// it is opened, which then does not wait.
struct File {
    explicit File(const std::string &path)
        : descriptor(isRegular(path) ? ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK)
                                     : -1) {}
    ~File() {
        if (descriptor >= 0) {
            ::close(descriptor);
        }
    }
    File(const File &) = delete;
    File &operator=(const File &) = delete;

    int descriptor;
};

struct CloseFolder {
    void operator()(DIR *folder) const noexcept { closedir(folder); }
};

} // namespace

bool claimsMore(const Header &found) noexcept {
    constexpr std::uint64_t filling = 3; // the most that is no value, and nobody has to write
    return found.extent.end > sum(found.size, filling);
}

bool isShort(const Header &found) noexcept {
    return !found.whole || claimsMore(found);
}

Header headerOf(const std::string &path) {
    const File file(path);
    return headerOf(file.descriptor);
}

Header headerOf(int descriptor) {
    Header found;
    try {
        Walk(descriptor).go(found);
    } catch (const Ended &) {
        return found;
    } catch (const Distrusted &distrusted) {
        found.claim = distrusted.claim;
    }
    return found;
}

FileIdentity identityOf(const std::string &path) noexcept {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 ? FileIdentity{status.st_dev, status.st_ino}
                                            : FileIdentity{};
}

std::vector<int> descriptorsOf(const FileIdentity &file) {
    std::vector<int> found;
    const auto look = [&](int descriptor) {
        struct stat status {};
        if (fstat(descriptor, &status) == 0 && S_ISREG(status.st_mode) &&
            file == FileIdentity{status.st_dev, status.st_ino}) {
            found.push_back(descriptor);
        }
    };
    const std::unique_ptr<DIR, CloseFolder> entries(opendir("/proc/self/fd"));
    if (!entries) { // as when no descriptor is left for it: any may be open
        for (int descriptor = 0; descriptor < getdtablesize(); ++descriptor) {
            look(descriptor);
        }
        return found;
    }
    while (const dirent *entry = readdir(entries.get())) {
        const std::string_view name = entry->d_name;
        int descriptor = -1;
        std::from_chars(name.data(), name.data() + name.size(), descriptor);
        if (descriptor >= 0) {
            look(descriptor);
        }
    }
    return found;
}

} // namespace tessel::guard
