// tests/support/scene.hpp: the files and datasets that a row plays with, made anew for each run.
#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace tessel::test {

/// What is there when the call begins.
enum class On {
    nothing,      ///< no file at all
    textFile,     ///< "text.nc", a file that is no dataset
    sampleFile,   ///< "sample.nc", the sample, not open
    newDataset,   ///< "sample.nc", just created: nothing in it, in define mode
    sample,       ///< the sample in data mode
    sampleDefine, ///< the sample in define mode
    sampleRead,   ///< the sample open for reading only
    noRecords,    ///< the sample in data mode before any record was written
    twoDatasets,  ///< the sample, and a second dataset, "other.nc", both in define mode
};

/// Throws if a call of the library's by the tests themselves does not succeed.
void want(int status);

/// A folder with what is there. Everything in it is made by direct calls of the library.
///
/// The sample has the dimensions t (unlimited, 2 records), y = 3, x = 4, five = 5, ten = 10 and
/// twenty = 20, and a variable of each kind that matters; see sample.cpp, or what describe() says.
class Scene {
  public:
    explicit Scene(On what);
    ~Scene();
    Scene(const Scene &) = delete;
    Scene &operator=(const Scene &) = delete;

    [[nodiscard]] int ncid() const { return dataset; }
    [[nodiscard]] int otherNcid() const { return otherDataset; }
    [[nodiscard]] std::string path(const std::string &name) const;

    /// Datasets that the call under test opened: closed when the scene ends.
    void addOpened(const std::vector<int> &ids);
    [[nodiscard]] int openedByCall() const { return openedIDs.empty() ? -1 : openedIDs.back(); }

    /// All that can be told about the scene, a line each, by direct calls of the library. Leaves
    /// define mode: the last thing to do with a scene.
    [[nodiscard]] std::vector<std::string> describe() const;

  private:
    On on;
    std::filesystem::path folder;
    int dataset = -1;
    int otherDataset = -1;
    std::vector<int> openedIDs;
};

/// What differs between two descriptions, as "- line" for each that went and "+ line" for each that
/// came.
std::vector<std::string> changes(const std::vector<std::string> &before,
                                 const std::vector<std::string> &after);

} // namespace tessel::test
