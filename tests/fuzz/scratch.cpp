// tests/fuzz/scratch.cpp: where the fuzzers work, and what they may use there.
#include "scratch.hpp"

#include "support/process.hpp"

#include <dirent.h>
#include <fcntl.h>
#include <poll.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <vector>

namespace fuzz {
namespace {

constexpr rlim_t largestFile = rlim_t{1} << 20U;
constexpr rlim_t mostMemory = rlim_t{512} << 20U;

constexpr std::size_t mostOpen = 40; // files at a time

/// Counters of our own, which libFuzzer finds by the name of their section.
constexpr std::size_t counterCount = 8192;
[[gnu::used, gnu::section("__libfuzzer_extra_counters")]] std::array<std::uint8_t, counterCount>
    counters;

/// The descriptors below that number which are open. One question to the system: an execution takes
/// less time than forty.
std::vector<int> openFiles() {
    std::array<pollfd, mostOpen> files{};
    for (std::size_t i = 0; i < files.size(); ++i) {
        files[i].fd = static_cast<int>(i);
    }
    if (poll(files.data(), files.size(), 0) < 0) {
        die("the system does not say what is open");
    }
    std::vector<int> open;
    for (const pollfd &file : files) {
        if ((static_cast<unsigned>(file.revents) & POLLNVAL) == 0) {
            open.push_back(file.fd);
        }
    }
    return open;
}

std::string nameOf(int file) {
    std::array<char, 256> target{};
    const std::string link = "/proc/self/fd/" + std::to_string(file);
    return readlink(link.c_str(), target.data(), target.size() - 1) > 0 ? target.data() : "";
}

void limit(int resource, rlim_t most, rlim_t ever) {
    const rlimit both = {most, ever};
    if (setrlimit(static_cast<__rlimit_resource>(resource), &both) != 0) {
        die("a limit cannot be set");
    }
}

} // namespace

void die(const std::string &what) {
    std::fprintf(stderr, "FOUND: %s\n", what.c_str());
    std::abort();
}

Scratch::Scratch() {
    root = std::filesystem::temp_directory_path() / "tessel-fuzz-XXXXXX";
    if (mkdtemp(root.data()) == nullptr) {
        die("cannot make a folder like " + root);
    }
    folder = root + "/files"; // names with ".." stay within the root
    if (mkdir(folder.c_str(), S_IRWXU) != 0 || chdir(folder.c_str()) != 0) {
        die("cannot use " + folder);
    }
    std::signal(SIGXFSZ, SIG_IGN); // a full disk is an error like any other
    limit(RLIMIT_CORE, 0, 0);
    // What the process has reserved is much, with a sanitizer.
    limit(RLIMIT_DATA, tessel::test::bytesInStatus("VmData:") + mostMemory, RLIM_INFINITY);
    entries = opendir(folder.c_str());
    if (entries == nullptr) {
        die("cannot read " + folder);
    }
}

void Scratch::setFull(bool full) {
    limit(RLIMIT_FSIZE, full ? largestFile : RLIM_INFINITY, RLIM_INFINITY);
}

Scratch::~Scratch() {
    removeFiles();
    closedir(entries);
    rmdir(folder.c_str());
    rmdir(root.c_str());
}

void Scratch::write(const char *name, std::span<const unsigned char> bytes) {
    const int file = ::open(name, O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, S_IRUSR | S_IWUSR);
    const auto size = static_cast<ssize_t>(bytes.size());
    if (file < 0 || ::write(file, bytes.data(), bytes.size()) != size || ::close(file) != 0) {
        die("cannot write a file");
    }
}

void Scratch::clean(Left left) const {
    for (const int file : openFiles()) {
        const std::string name = nameOf(file);
        if (!name.starts_with(folder + "/")) {
            continue;
        }
        if (left == Left::nothing) {
            die("a descriptor is left open: " + name);
        }
        ::close(file);
    }
    removeFiles();
}

void Scratch::removeFiles() const {
    rewinddir(entries);
    while (const dirent *entry = readdir(entries)) {
        if (entry->d_name[0] != '.' || entry->d_type == DT_REG) {
            unlinkat(dirfd(entries), entry->d_name, 0);
        }
    }
}

void note(std::string_view happened) {
    std::uint8_t &counter = counters[std::hash<std::string_view>()(happened) % counterCount];
    counter = static_cast<std::uint8_t>(counter | 1U);
}

} // namespace fuzz
