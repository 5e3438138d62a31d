// guard/src/datasets.hpp: what the guard knows of open datasets.
#pragma once

#include "header.hpp"
#include "tessel/runtime/watcher.hpp"

#include <cstdint>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace tessel::guard {

/// A dataset between the call that opened it and the one that ends it.
struct Dataset {
    std::string path;
    FileIdentity file;   // of those that exist when they are opened
    bool classic = true; // not based on HDF5
    bool writable = true;
    bool defining = false;
    bool filling = true;
    bool dead = false; // its end failed

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
  public:
    void add(int ncid, Dataset dataset) { byId[fileOf(ncid)] = std::move(dataset); }
    void remove(int ncid) { byId.erase(fileOf(ncid)); }

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

    std::unordered_map<int, Dataset> byId;
};

/// The records of the dataset, if the variable has any.
std::optional<Records> recordsOf(int ncid, int varid, const Ask &ask);

} // namespace tessel::guard
