// tests/fuzz/scratch.hpp: where the fuzzers work, and what they may use there.
#pragma once

#include <dirent.h>

#include <cstddef>
#include <span>
#include <string>
#include <string_view>

namespace fuzz {

/// Ends the process with a message, which is how a fuzzer is told of a find.
[[noreturn]] void die(const std::string &what);

/// A folder of the process's own in that for temporary files. It is the current folder from then
/// on, so that names without a folder lead nowhere else. Requests for much memory fail.
class Scratch {
  public:
    Scratch();
    ~Scratch();
    Scratch(const Scratch &) = delete;
    Scratch &operator=(const Scratch &) = delete;

    /// Writes a file.
    static void write(const char *name, std::span<const unsigned char> bytes);

    enum class Left { nothing, files };

    /// Removes every file of the folder, and dies if one is open. Where some are known to be left,
    /// it closes them.
    void clean(Left left = Left::nothing) const;

    /// Whether the disk is full for files above a MiB. The fuzzer's own files are larger.
    static void setFull(bool full);

  private:
    void removeFiles() const;

    std::string root;
    std::string folder;
    DIR *entries = nullptr; // of the folder
};

/// Tells the fuzzer that something of this description happened, so that it keeps inputs that make
/// new things happen inside of the library, which counts no branches.
void note(std::string_view happened);

} // namespace fuzz
