// guard/src/guard.cpp: the watcher that refuses what the netCDF library does not survive.
#include "tessel/netcdf_guard.hpp"

#include "bytes.hpp"
#include "datasets.hpp"
#include "header.hpp"
#include "mapping.hpp"
#include "names.hpp"
#include "operations.hpp"
#include "positions.hpp"
#include "refusals.hpp"

#include "tessel/array.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <iterator>
#include <limits>
#include <optional>
#include <span>
#include <string_view>
#include <system_error>

namespace tessel {
namespace guard {
namespace {

// Flags and values of the library's.
constexpr int userFormats = 0x40 | 0x80; // what belongs to them cannot be registered here
constexpr int inMemory = 0x8000;         // the file's name stands for memory that is not there
constexpr int answeredBefore = 0x08 | 0x10 | userFormats; // with these, open fails by itself
constexpr int hdf5 = 0x1000;
constexpr int ofClassicFormats = 0x20 | 0x100 | 0x200; // each of them outweighs the default format
constexpr int data64 = 0x20;
constexpr int noFill = 0x100;
constexpr double tooLong = 0x1p63; // elements, which the library takes for a negative number
constexpr std::uint64_t alignmentThatWraps = std::uint64_t{1} << 63U;
constexpr int share = 0x800;               // others change the file, too
constexpr std::size_t secondDataset = 4;   // among the inputs of copy_att
constexpr std::array hdf5Formats = {3, 4}; // as set_default_format has them
constexpr std::array data64Formats = {5};

Datasets &datasets() {
    static auto &all = *new Datasets; // never destroyed: threads may outlive the end of main
    return all;
}

/// The name without the blanks that the library skips at its beginning.
std::string withoutBlanks(std::string path) {
    const auto isBlank = [](char c) { return c > 0 && c <= ' '; };
    path.erase(path.begin(), std::find_if_not(path.begin(), path.end(), isBlank));
    return path;
}

/// Whether the library would take a file name for an address: "scheme://...", behind any number of
/// parameters in brackets. It drops what is not printable ASCII before it looks, and so does this.
/// On the safe side: not every scheme is one that it knows.
bool isAddress(std::string_view path) {
    if (path.find(':') == std::string_view::npos) { // as nearly all have none
        return false;
    }
    std::string shown;
    std::copy_if(path.begin(), path.end(), std::back_inserter(shown),
                 [](char c) { return c > ' ' && c <= '~'; });
    std::size_t start = 0;
    while (start < shown.size() && shown[start] == '[') {
        std::size_t end = start + 1;
        while (end < shown.size() && shown[end] != ']') {
            end += shown[end] == '\\' ? std::size_t{2} : std::size_t{1};
        }
        if (end >= shown.size()) {
            break;
        }
        start = end + 1;
    }
    const std::size_t end = shown.find("://", start);
    if (end == std::string::npos || end == start) {
        return false;
    }
    return std::all_of(shown.begin() + static_cast<std::ptrdiff_t>(start),
                       shown.begin() + static_cast<std::ptrdiff_t>(end), [](unsigned char c) {
                           return std::isalnum(c) != 0 || c == '+' || c == '-' || c == '.';
                       });
}

std::string inQuotes(std::string_view path) {
    return std::string(1, '"').append(path).append(1, '"');
}

void lookAtName(std::string_view path, const GuardOptions &options) {
    if (!options.remote && isAddress(path)) {
        refuse(remote, inQuotes(path) + " is an address");
    }
}

/// Whether it was the module that raised an error, and not the host.
bool isModules(const Error &error) noexcept {
    return error.identifier().starts_with("TESSEL:netcdf:");
}

/// Looks at what the module answers. Where it refuses, as for a dataset or a variable that there is
/// not, it will refuse the call itself.
template <class Look>
void unlessRefused(const Look &look) {
    try {
        look();
    } catch (const Error &error) {
        if (!isModules(error)) {
            throw;
        }
    }
}

/// What the file is like.
Header lookAtOpening(const std::string &path, int flags) {
    if ((flags & inMemory) != 0 && (flags & answeredBefore) == 0) {
        refuse(mode, "the flag 32768 (NC_INMEMORY) is set");
    }
    Header found = headerOf(path);
    if (found.claim) {
        refuse(header, "the header of " + inQuotes(path) + " " + *found.claim);
    }
    return found;
}

/// Whether a file that is opened with this mode may be written to.
bool opensForWriting(const tsArray *mode) {
    constexpr int write = 1;
    std::optional<std::string> name = text(mode);
    if (!name) {
        return (integer(mode).value_or(0) & write) != 0;
    }
    std::transform(name->begin(), name->end(), name->begin(),
                   [](unsigned char c) { return std::toupper(c); });
    return *name == "WRITE" || *name == "NC_WRITE";
}

/// Synchronising a dataset that is open for reading makes the library read its header again, and so
/// does the redefinition of one that is shared: from the file that it opened. Its name may lead to
/// another one by now.
void lookAtOpenHeader(Dataset &dataset) {
    for (const int descriptor : descriptorsOf(dataset.file)) {
        const Header found = headerOf(descriptor);
        if (found.claim) {
            const std::string link = "/proc/self/fd/" + std::to_string(descriptor);
            std::error_code ignored;
            refuse(header, "the header of " +
                               inQuotes(std::filesystem::read_symlink(link, ignored).string()) +
                               " " + *found.claim);
        }
        if (dataset.readBy > 0) {
            lookAtMappedFile(dataset.writable, dataset.readBy, found);
        }
        take(found, dataset);
    }
}

/// Closing leaves define mode and synchronises first. When the library does so by itself, as a part
/// of closing, and cannot, it has freed the dataset's memory and not its id, or has lost what was
/// in its buffer and says nothing. By itself either leaves all as it is when it fails, so that
/// closing can be repeated. Its error becomes that of closing.
void settle(int ncid, Dataset &dataset, const Ask &ask) {
    const auto step = [&](const char *operation) {
        try {
            ask(operation, ncid);
        } catch (const Error &error) {
            const std::string_view identifier = error.identifier();
            const std::string_view message = error.message();
            const std::string_view word = identifier.substr(identifier.rfind(':') + 1);
            if (!isModules(error)) {
                throw;
            }
            // Nothing to do: the module was called without its guard meanwhile.
            if (word.starts_with("operationNotAllowedIn") || word == "notNetcdfID") {
                return;
            }
            const std::size_t detail = std::min(message.find(", "), message.size());
            throw Error(std::string("TESSEL:netcdf:close:").append(word),
                        std::string("Close operation failed").append(message.substr(detail)));
        }
    };
    if (dataset.defining) {
        dataset.modeInDoubt = true;
        step("enddef");
        dataset.modeInDoubt = false;
        dataset.defining = false;
    }
    step("sync");
}

/// An end of the definitions that fails may have left define mode. Synchronising tells, which in
/// define mode does nothing but fail.
void settleMode(int ncid, Dataset &dataset, const Ask &ask) {
    bool defining = false;
    try {
        ask("sync", ncid);
    } catch (const Error &error) {
        if (!isModules(error)) {
            throw;
        }
        defining = error.identifier().ends_with(":operationNotAllowedInDefineMode");
    }
    dataset.defining = defining;
    dataset.modeInDoubt = false;
}

/// Whether a new file will be of one of these formats, because no flag says otherwise.
bool isByDefault(int flags, std::span<const int> formats) {
    return (flags & (hdf5 | ofClassicFormats)) == 0 &&
           std::find(formats.begin(), formats.end(), datasets().defaultFormat) != formats.end();
}

/// Whether the file will be of a classic format.
bool lookAtCreation(int flags) {
    if ((flags & userFormats) != 0) {
        refuse(mode, "the flag " + std::to_string(flags & userFormats) +
                         " (a user-defined format) is set");
    }
    return (flags & hdf5) == 0 && !isByDefault(flags, hdf5Formats);
}

void lookAtAlignment(Inputs inputs, int ncid, const Dataset *dataset, const Ask &ask) {
    if (dataset != nullptr && (!dataset->classic || !dataset->defining)) {
        return;
    }
    for (const tsArray *const input : {inputs[3], inputs[5]}) {
        const std::uint64_t given = size(input).value_or(1);
        const bool wraps = given >= alignmentThatWraps && given != alignToChunks;
        if ((given == 0 || wraps) && ask("inq", ncid)[1].number() > 0) {
            refuse(alignment, wraps ? "an alignment is 2^63 or more" : "an alignment is 0");
        }
    }
}

/// What there is against a name that a call gives something; "" if nothing. The library refuses one
/// that is too long by itself, and looks at it before it composes it.
std::string growingName(const tsArray *given) {
    constexpr std::size_t mostGrowth = 3;      // of any text
    constexpr std::size_t mostOfCharacter = 3; // bytes
    if (tsGetNumberOfElements(given) * mostOfCharacter * mostGrowth <= longestName) {
        return ""; // as nearly all
    }
    const std::optional<std::string> found = text(given);
    if (!found || found->size() > longestName) {
        return "";
    }
    const std::size_t most = mostComposed(*found);
    return most <= longestName ? ""
                               : "a name of " + std::to_string(found->size()) +
                                     " bytes may become one of " + std::to_string(most);
}

/// Where records have to move, the library counts them with 31 bits: of more it moves none, and no
/// longer finds them.
void lookAtRecordsToMove(int ncid, const Ask &ask) {
    const double unlimited = ask("inq", ncid)[3].number();
    if (unlimited < 0) {
        return;
    }
    const double records = ask("inq_dim", ncid, unlimited)[1].number();
    if (records >= 0x1p31) {
        refuse(redefinition,
               "there are " + std::to_string(static_cast<std::uint64_t>(records)) + " records");
    }
}

/// Looks at the dimensions of a variable that is to be defined, which takes no more bytes than
/// what comes back.
std::uint64_t lookAtLengths(int ncid, const tsArray *dimids, const Ask &ask) {
    std::uint64_t most = sizeof(double);
    for (const std::uint64_t dimid : indices(dimids).value_or(Indices{})) {
        const Results dimension = ask("inq_dim", ncid, static_cast<double>(dimid));
        if (dimension[1].number() >= tooLong) {
            refuse(lengths, inQuotes(dimension[0].utf8()) + " is 2^63 or longer");
        }
        const double length = std::max(dimension[1].number(), 1.0);
        most = product(most, static_cast<std::uint64_t>(length));
    }
    return most;
}

/// Counts that wrap around to what was given. Empty data are the module's to refuse, and so are
/// counts of anything else than what was given: then nothing comes of the call.
bool lookAtCounts(const Indices &count, const tsArray *data) {
    std::uint64_t product = 1;
    bool wraps = false;
    for (const std::uint64_t each : count) {
        wraps = __builtin_mul_overflow(product, each, &product) || wraps;
    }
    const bool none = std::find(count.begin(), count.end(), 0) != count.end();
    if (wraps && !none && !tsIsEmpty(data) && product == tsGetNumberOfElements(data)) {
        refuse(counts, "the counts multiply to more than 64 bits hold");
    }
    return !wraps && product == tsGetNumberOfElements(data);
}

/// Where a write goes, in the library's order.
struct Write {
    Indices start;
    Indices count;
    Indices stride;
};

/// The positions of a write; nothing where the module refuses the call itself.
std::optional<Write> writeOf(Kind kind, Inputs inputs) {
    const auto start = indices(inputs[3]);
    if (!start) {
        return std::nullopt;
    }
    Write write{*start, Indices(start->size(), 1), Indices(start->size(), 1)};
    if (kind != Kind::writeElement) {
        const auto count = indices(inputs[4]);
        if (!count || count->size() != start->size()) {
            return std::nullopt;
        }
        write.count = *count;
        if (!lookAtCounts(*count, inputs[inputs.size() - 1])) {
            return std::nullopt;
        }
    }
    if (kind == Kind::writeStrided) {
        const auto stride = indices(inputs[5]);
        if (!stride || stride->size() != start->size()) {
            return std::nullopt;
        }
        write.stride = *stride;
    }
    return write;
}

/// One more than the last record of a write; 0 if it writes nothing, or is refused by the library
/// for a step below 1.
std::uint64_t endOf(const Write &write) {
    const bool steps = static_cast<std::int64_t>(write.stride[0]) > 0;
    if (!steps || std::find(write.count.begin(), write.count.end(), 0) != write.count.end()) {
        return 0;
    }
    std::uint64_t end = 0;
    if (__builtin_mul_overflow(write.count[0] - 1, write.stride[0], &end) ||
        __builtin_add_overflow(end, write.start[0], &end) ||
        __builtin_add_overflow(end, 1U, &end)) {
        return UINT64_MAX;
    }
    return end;
}

/// Whether it is known that no write of the variable fills records, or lies too far behind them.
bool needsNoLook(const Dataset *dataset, int varid) {
    if (dataset == nullptr) {
        return false;
    }
    if (!dataset->classic || !dataset->writable || dataset->defining ||
        (!dataset->filling && dataset->room < modestRoom && !dataset->mapped)) {
        return true;
    }
    const auto known = dataset->hasRecords.find(varid);
    return known != dataset->hasRecords.end() && !known->second;
}

/// Looks at a write of a variable that may have records. What it learns of the dataset it notes
/// there; the end of the write, if it moves the end of the records, is what it gives back.
std::uint64_t lookAtRecords(const Write &write, int ncid, int varid, Dataset *dataset,
                            const Ask &ask, const GuardOptions &options) {
    const std::uint64_t end = endOf(write);
    const bool fills = dataset == nullptr || dataset->filling;
    // Only what lies between the end of the records and the write's own is filled.
    const auto filled = [&](std::uint64_t number) {
        const std::uint64_t added = fills ? end - std::min(end, number) : 0;
        return added - std::min(added, write.count[0]);
    };
    if (dataset != nullptr && filled(dataset->records) == 0 && liesWithin(*dataset, end) &&
        (!dataset->mapped || end <= dataset->records)) {
        return dataset->hasRecords.contains(varid) ? end : 0;
    }
    const std::optional<Layout> found = recordsOf(ncid, varid, ask);
    if (dataset != nullptr) {
        dataset->hasRecords[varid] = found.has_value();
        dataset->records = found ? found->records : dataset->records;
    }
    if (!found || end == 0) {
        return 0;
    }
    const std::uint64_t records = filled(found->records);
    if (static_cast<double>(records) * found->record > static_cast<double>(options.fillLimit)) {
        refuse(guard::records, "the write ends at record " + std::to_string(end - 1) + ", and " +
                                   std::to_string(records) + " records of " +
                                   inWords(found->record) + " are missing before it");
    }
    lookAtEnd(end, *found, dataset);
    return end;
}

/// The watcher.
class Guard : public Watcher {
  public:
    explicit Guard(const GuardOptions &given) : options(given) {}

    void before(Inputs inputs, const Ask &ask) override {
        kind = kindOf(inputs);
        recordsEnd = 0;
        defined = 0;
        opening = {};
        if (datasets().anyDead) {
            lookForDead(inputs);
        }
        if (kind != Kind::other) {
            look(inputs, ask);
        }
        // After a write that failed, the library takes whatever error the process has met since for
        // one of its next write's.
        errno = 0;
    }

    void after(Inputs inputs, const Results &results, const Error *error) noexcept override {
        // A write that did not move the end of the records leaves nothing to remember.
        if (kind != Kind::other && !(isWrite() && recordsEnd == 0)) {
            remember(inputs, results, error);
        }
    }

  private:
    /// Any operation on a dataset has its id first, and copy_att has a second one.
    void lookForDead(Inputs inputs) const {
        for (const std::size_t i : {std::size_t{1}, secondDataset}) {
            if (i >= inputs.size() || (i == secondDataset && kind != Kind::copyAttribute)) {
                break;
            }
            const auto ncid = integer(inputs[i]);
            const Dataset *const dataset = ncid ? datasets().find(*ncid) : nullptr;
            if (dataset != nullptr && dataset->dead) {
                refuse(closed, "the dataset is that of " + inQuotes(dataset->path));
            }
        }
    }

    void look(Inputs inputs, const Ask &ask) {
        if (kind == Kind::open || kind == Kind::create) {
            auto name = text(inputs[1]);
            if (!name) {
                return;
            }
            lookAtName(*name, options);
            const bool creates = kind == Kind::create;
            Dataset dataset;
            dataset.path = withoutBlanks(*std::move(name));
            dataset.known = true;
            dataset.defining = creates;
            dataset.writable = creates || opensForWriting(inputs[2]);
            // A mode that is given by a name has none of the flags.
            const int flags = integer(inputs[2]).value_or(0);
            dataset.shared = (flags & share) != 0;
            // What a new file begins with, or what an old one is read by.
            const std::uint64_t tuned = inputs.size() > 3 ? size(inputs[3]).value_or(0) : 0;
            if (creates) {
                dataset.room = 0;
                dataset.data64 = (flags & data64) != 0 || isByDefault(flags, data64Formats);
                dataset.classic = lookAtCreation(flags);
                dataset.mapped = dataset.classic && isMapped(flags);
                if (dataset.mapped) {
                    lookAtMappedCreation(flags, tuned);
                }
            } else {
                const Header found = lookAtOpening(dataset.path, flags);
                if (found.classic && isMapped(flags)) {
                    // A number that would be negative the library leaves alone.
                    constexpr std::uint64_t most = std::numeric_limits<std::int64_t>::max();
                    dataset.readBy = tuned <= most ? tuned : 0;
                    lookAtMappedFile(dataset.writable, dataset.readBy, found);
                }
                dataset.file = found.file;
                dataset.classic = found.classic;
                dataset.data64 = found.data64;
                take(found, dataset);
                dataset.shortfall = shortfallOf(found);
            }
            opening = Datasets::make(std::move(dataset));
            return;
        }
        const auto ncid = integer(inputs[1]);
        if (!ncid) {
            return;
        }
        Dataset *const dataset = datasets().find(*ncid);
        if (dataset != nullptr && readsHeaderAgain(*dataset)) {
            lookAtOpenHeader(*dataset);
        }
        if (dataset != nullptr && dataset->modeInDoubt && kind != Kind::abort) {
            settleMode(*ncid, *dataset, ask);
        }
        if (kind == Kind::redefine && dataset != nullptr && dataset->classic && dataset->writable &&
            !dataset->defining) {
            unlessRefused([&] { lookAtRecordsToMove(*ncid, ask); });
            if (dataset->shortfall.end > 0) {
                // What was written, and is still the library's, makes the file longer.
                unlessRefused([&] { ask("sync", *ncid); });
                lookAtShortfall(*dataset, options.fillLimit);
            }
        }
        if (kind == Kind::tunedEndDefinition) {
            unlessRefused([&] { lookAtAlignment(inputs, *ncid, dataset, ask); });
        }
        if (mayEndDefinitions(dataset)) {
            const std::uint64_t tuned =
                kind == Kind::tunedEndDefinition ? tunedRoom(inputs) : std::uint64_t{0};
            unlessRefused([&] { lookAtLayout(tuned, *ncid, dataset, ask, options.fillLimit); });
            if (dataset != nullptr) { // whatever comes of it: the library keeps the room
                dataset->room = sum(dataset->room, tuned);
                dataset->gaps = sum(dataset->gaps, tuned);
            }
        }
        if (kind == Kind::close && dataset != nullptr && dataset->classic && dataset->writable) {
            settle(*ncid, *dataset, ask);
        }
        if (isEnd() && dataset == nullptr) {
            datasets().add(
                *ncid, Datasets::make({})); // so that there is memory to note that its end failed
        }
        if (const auto place = placeOfNewName(kind)) {
            lookAtNewName(inputs, *place, ask);
        }
        if (kind == Kind::defineVariable && tsGetClassID(inputs[4]) == tsDOUBLE) {
            unlessRefused([&] { defined = lookAtLengths(*ncid, inputs[4], ask); });
        } else if (isWrite()) {
            const auto varid = integer(inputs[2]);
            const bool harmless = varid && needsNoLook(dataset, *varid);
            if (harmless && kind == Kind::writeElement) {
                return; // an element has no counts that could wrap around, either
            }
            if (const auto write = writeOf(kind, inputs); write && varid && !harmless) {
                unlessRefused([&] {
                    recordsEnd = lookAtRecords(*write, *ncid, *varid, dataset, ask, options);
                });
            }
        }
    }

    /// A name that is given to something. Outside of define mode it may not be longer than the one
    /// that it takes the place of, and files based on HDF5 refuse it.
    void lookAtNewName(Inputs inputs, std::size_t place, const Ask &ask) const {
        const std::string refusable = growingName(inputs[place]);
        const auto ncid = integer(inputs[kind == Kind::copyAttribute ? secondDataset : 1]);
        if (refusable.empty() || !ncid) {
            return;
        }
        const Dataset *const dataset = datasets().find(*ncid);
        if (dataset != nullptr && (!dataset->classic || !dataset->defining)) {
            return;
        }
        unlessRefused([&] {
            ask("inq", *ncid); // is it there?
            refuse(name, refusable);
        });
    }

    /// Allocates nothing: what it notes must not be lost.
    void remember(Inputs inputs, const Results &results, const Error *error) noexcept {
        if (kind == Kind::open || kind == Kind::create) {
            if (error == nullptr && !opening.empty()) {
                Dataset &dataset = opening.mapped();
                if (kind == Kind::create) { // it is there only now
                    dataset.file = identityOf(dataset.path);
                }
                const auto ncid = static_cast<int>(results[results.size() - 1].number());
                datasets().add(ncid, std::move(opening));
            }
            return;
        }
        if (kind == Kind::setDefaultFormat) {
            if (error == nullptr) {
                datasets().defaultFormat = code(inputs[1]).value_or(datasets().defaultFormat);
            }
            return;
        }
        const auto first = integer(inputs[1]);
        if (!first) {
            return;
        }
        Dataset *const dataset = datasets().find(*first);
        if (dataset == nullptr) {
            return;
        }
        if (isEnd()) {
            rememberEnd(*first, *dataset, error);
        } else if (error == nullptr) {
            rememberChange(inputs, *dataset);
        } else if (endsDefinitions()) {
            dataset->modeInDoubt = dataset->defining && dataset->classic;
        }
    }

    /// A dataset whose closing failed may be used when it is as it was: a classic one that was
    /// settled before it was closed. An abort that the library was asked for ends one in any case.
    void rememberEnd(int ncid, Dataset &dataset, const Error *error) const noexcept {
        const bool reached = error != nullptr && isModules(*error);
        const bool gone = error == nullptr || error->identifier().ends_with(":notNetcdfID") ||
                          (kind == Kind::abort && reached);
        if (!gone && reached && (!dataset.known || !dataset.classic)) {
            dataset.dead = true;
            datasets().anyDead = true;
        } else if (gone || !dataset.known) {
            datasets().remove(ncid);
        }
    }

    void rememberChange(Inputs inputs, Dataset &dataset) const {
        if (isWrite()) {
            dataset.records = std::max(dataset.records, recordsEnd);
        } else if (kind == Kind::defineVariable) {
            dataset.room = sum(dataset.room, defined);
        } else if (kind == Kind::redefine) {
            dataset.defining = true;
            dataset.hasRecords.clear(); // variables may come, and dimensions be known anew
        } else if (endsDefinitions()) {
            dataset.defining = false;
        } else if (kind == Kind::setFill) {
            dataset.filling = code(inputs[2]) != noFill;
        }
    }

    [[nodiscard]] bool readsHeaderAgain(const Dataset &dataset) const noexcept {
        return dataset.classic && ((kind == Kind::sync && !dataset.writable) ||
                                   (kind == Kind::redefine && dataset.shared));
    }

    /// Closing ends definitions as well. Whether a dataset that nobody was seen to open has any is
    /// not known: its closing is let be.
    [[nodiscard]] bool mayEndDefinitions(const Dataset *dataset) const noexcept {
        return dataset == nullptr ? endsDefinitions()
                                  : dataset->classic && dataset->defining &&
                                        (endsDefinitions() || kind == Kind::close);
    }

    [[nodiscard]] bool endsDefinitions() const noexcept {
        return kind == Kind::endDefinition || kind == Kind::tunedEndDefinition;
    }

    [[nodiscard]] bool isEnd() const noexcept { return kind == Kind::close || kind == Kind::abort; }

    [[nodiscard]] bool isWrite() const noexcept {
        return kind == Kind::writeElement || kind == Kind::writeBlock || kind == Kind::writeStrided;
    }

    GuardOptions options;
    Kind kind = Kind::other;      // of the call in progress
    Datasets::New opening;        // what it opens
    std::uint64_t recordsEnd = 0; // where it ends, if it writes records
    std::uint64_t defined = 0;    // bytes at most of the variable that it defines
};

} // namespace
} // namespace guard

std::shared_ptr<Watcher> netcdfGuard(const GuardOptions &options) {
    return std::make_shared<guard::Guard>(options);
}

} // namespace tessel
