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

/// A dataset between the call that opened it and the one that ends it.
struct Dataset {
    std::string path;
    bool known = false; // it was seen to be opened
    FileIdentity file;
    bool classic = true; // not based on HDF5
    bool writable = true;
    bool shared = false; // its header is read again when it is redefined
    bool defining = false;
    bool modeInDoubt = false; // it may have left define mode
    bool filling = true;
    bool dead = false; // its closing failed

    /// Writes below this record fill nothing. Grows with what is written.
    std::uint64_t records = 0;

    /// Whether variables have records, for those that were asked about.
    std::unordered_map<int, bool> hasRecords;
};

/// Where the records of a dataset stand, as inquiries say.
struct Records {
    std::uint64_t number;
    std::uint64_t bytes; // of one record, with every record variable in it
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

/// The records of the dataset, if the variable has any.
std::optional<Records> recordsOf(int ncid, int varid, const Ask &ask);

} // namespace tessel::guard
