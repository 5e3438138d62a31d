// tests/support/process.hpp: a folder for a test, and what a process holds.
#pragma once

#include <unistd.h>

#include <cstddef>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>
#include <system_error>

namespace tessel::test {

/// A place in memory where the system has one, for tests in which the disk does not matter.
inline std::filesystem::path placeInMemory() {
    const std::filesystem::path memory = "/dev/shm";
    return access(memory.c_str(), W_OK) == 0 ? memory : std::filesystem::temp_directory_path();
}

/// A new folder that is removed with what is in it.
class Folder {
  public:
    explicit Folder(const std::filesystem::path &place = std::filesystem::temp_directory_path()) {
        std::string pattern = (place / "tessel-XXXXXX").string();
        if (mkdtemp(pattern.data()) == nullptr) {
            throw std::runtime_error("cannot make a folder like " + pattern);
        }
        path = pattern;
    }
    ~Folder() {
        std::error_code ignored;
        std::filesystem::remove_all(path, ignored);
    }
    Folder(const Folder &) = delete;
    Folder &operator=(const Folder &) = delete;

    [[nodiscard]] const std::filesystem::path &folder() const noexcept { return path; }

    /// The name of a file in it.
    [[nodiscard]] std::string file(std::string_view name) const { return path / name; }

  private:
    std::filesystem::path path;
};

/// How many files this process has open; the one that lists them is among them.
inline std::size_t openDescriptors() {
    const std::filesystem::directory_iterator descriptors("/proc/self/fd");
    return static_cast<std::size_t>(std::distance(begin(descriptors), end(descriptors)));
}

/// A line of what the system says of this process, in bytes: "VmData:", or another of memory.
inline std::size_t bytesInStatus(std::string_view name) {
    std::ifstream status("/proc/self/status");
    std::string word;
    while (status >> word && word != name) {
    }
    std::size_t kilobytes = 0;
    status >> kilobytes;
    return kilobytes << 10U;
}

/// The memory of this process that is there, in megabytes.
inline double residentMegabytes() {
    std::size_t total = 0;
    std::size_t resident = 0;
    std::ifstream("/proc/self/statm") >> total >> resident;
    return static_cast<double>(resident) * static_cast<double>(sysconf(_SC_PAGESIZE)) / 1e6;
}

} // namespace tessel::test
