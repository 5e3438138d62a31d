// guard/src/datasets.hpp: what the guard knows of open datasets.
#pragma once

#include "header.hpp"
#include "tessel/runtime/watcher.hpp"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

namespace tessel::guard {

/// What the header of a file claimed, when it was opened, of which the file had less.
struct Shortfall {
    std::uint64_t end = 0;    // where its data were to end; 0 if the file had all of them
    std::uint64_t size = 0;   // of the file
    std::uint64_t record = 0; // bytes of one record
};

/// A dataset between the call that opened it and the one that ends it.
struct Dataset {
    std::string path;
    bool known = false; // it was seen to be opened
    FileIdentity file;
    bool classic = true; // not based on HDF5
    bool data64 = false; // of 64-bit data
    bool writable = true;
    bool mapped = false;      // a new one that is nothing but memory
    std::uint64_t readBy = 0; // of an old one that is mapped: how much of it, if that was said
    bool shared = false;      // its header is read again when it is redefined
    bool defining = false;
    bool modeInDoubt = false; // it may have left define mode
    bool filling = true;
    bool dead = false; // its closing failed

    /// Writes below this record fill nothing. Grows with what is written.
    std::uint64_t records = 0;

    /// Whether variables have records, for those that were asked about.
    std::unordered_map<int, bool> hasRecords;

    /// No less than its header and its variables take, with a single record; and what of it is no
    /// variable's.
    std::uint64_t room = UINT64_MAX;
    std::uint64_t gaps = 0;

    Shortfall shortfall;
};

/// What the variables of a dataset take, as inquiries say. Lengths come as doubles, which hold
/// what no file does.
struct Layout {
    std::uint64_t records = 0;
    double record = 0; // bytes of one record, with every record variable in it
    double fixed = 0;  // bytes of all other variables
    double largest = 0;
};

/// The process's datasets by id. Every function is called while no call of a module runs.
class Datasets {
    using ById = std::map<int, Dataset>;

  public:
    /// A dataset without an id yet. When it has one, there is nothing left to allocate.
    using New = ById::node_type;

    static New make(Dataset dataset) {
        ById one;
        one.emplace(0, std::move(dataset));
        return one.extract(one.begin());
    }

    void add(int ncid, New dataset) noexcept {
        remove(ncid);
        dataset.key() = fileOf(ncid);
        byId.insert(std::move(dataset));
    }
    void remove(int ncid) noexcept { byId.erase(fileOf(ncid)); }

    /// nullptr for a dataset that nobody was seen to open.
    Dataset *find(int ncid) {
        const auto found = byId.find(fileOf(ncid));
        return found == byId.end() ? nullptr : &found->second;
    }

    /// Whether a dead dataset was ever met, which few programs do.
    bool anyDead = false;

    /// What set_default_format gave last.
    int defaultFormat = 1;

  private:
    /// An id is the file's in its upper half, and a group's in its lower half.
    static int fileOf(int ncid) noexcept {
        return static_cast<int>(static_cast<unsigned>(ncid) >> 16U);
    }

    ById byId;
};

Layout layoutOf(int ncid, const Ask &ask);

/// The same, if the variable has records.
std::optional<Layout> recordsOf(int ncid, int varid, const Ask &ask);

} // namespace tessel::guard
