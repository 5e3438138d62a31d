// tests/faults/system_calls.cpp: the system calls that the library makes on files, counted, and
// made to fail.
//
// The functions ask the kernel themselves: the C library's are hidden by them, and the sanitizers'
// would look for them here.
#include "system_calls.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdarg>

namespace tessel::test {
namespace {

struct Planted {
    bool active = false;
    SystemCall call = SystemCall::open;
    std::size_t n = 0;
    Fault fault;
    bool met = false;
};

constinit Planted planted;
constinit std::array<std::size_t, systemCallCount> counts{};

/// Counts a call, and tells what it is to do instead.
Fault admitted(SystemCall call) {
    const std::size_t n = ++counts[static_cast<std::size_t>(call)];
    const bool meant = planted.active && planted.call == call &&
                       (planted.fault.all ? n >= planted.n : n == planted.n);
    planted.met = planted.met || meant;
    return meant ? planted.fault : Fault();
}

/// Only what is done to ordinary files is counted.
bool onFile(int descriptor) {
    struct stat status {};
    return syscall(SYS_fstat, descriptor, &status) == 0 && S_ISREG(status.st_mode);
}

/// Makes the call on a descriptor, unless it is to fail.
template <class Make>
auto made(SystemCall call, int descriptor, const Make &make) -> decltype(make(Fault())) {
    if (!onFile(descriptor)) {
        return make(Fault());
    }
    const Fault fault = admitted(call);
    if (fault.error != 0) {
        errno = fault.error;
        return -1;
    }
    return make(fault);
}

std::size_t moved(std::size_t bytes, const Fault &fault) {
    return fault.half ? (bytes + 1) / 2 : bytes;
}

} // namespace

const char *nameOf(SystemCall call) {
    constexpr std::array<const char *, systemCallCount> names = {"open", "stat",  "seek",
                                                                 "read", "write", "close"};
    return names[static_cast<std::size_t>(call)];
}

void plant(SystemCall call, std::size_t n, const Fault &fault) {
    counts = {};
    planted = {true, call, n, fault, false};
}

std::size_t countOf(SystemCall call) {
    return counts[static_cast<std::size_t>(call)];
}

void noFault() {
    counts = {};
    planted.active = false;
}

bool faultMet() {
    return planted.met;
}

} // namespace tessel::test

using namespace tessel::test;

// NOLINTBEGIN(readability-inconsistent-declaration-parameter-name): the system's own are reserved
extern "C" {

int open64(const char *path, int flags, ...) {
    va_list rest;
    va_start(rest, flags);
    const mode_t mode = (flags & O_CREAT) != 0 ? va_arg(rest, mode_t) : 0;
    va_end(rest);
    const Fault fault = admitted(SystemCall::open);
    if (fault.error != 0) {
        errno = fault.error;
        return -1;
    }
    return static_cast<int>(syscall(SYS_openat, AT_FDCWD, path, flags, mode));
}

int fstat64(int descriptor, struct stat64 *status) noexcept {
    return made(SystemCall::stat, descriptor, [&](const Fault &) {
        return static_cast<int>(syscall(SYS_fstat, descriptor, status));
    });
}

off64_t lseek64(int descriptor, off64_t offset, int from) noexcept {
    return made(SystemCall::seek, descriptor, [&](const Fault &) {
        return static_cast<off64_t>(syscall(SYS_lseek, descriptor, offset, from));
    });
}

ssize_t read(int descriptor, void *data, std::size_t bytes) {
    return made(SystemCall::read, descriptor, [&](const Fault &fault) {
        return static_cast<ssize_t>(syscall(SYS_read, descriptor, data, moved(bytes, fault)));
    });
}

ssize_t write(int descriptor, const void *data, std::size_t bytes) {
    return made(SystemCall::write, descriptor, [&](const Fault &fault) {
        return static_cast<ssize_t>(syscall(SYS_write, descriptor, data, moved(bytes, fault)));
    });
}

int close(int descriptor) {
    return made(SystemCall::close, descriptor, [&](const Fault &fault) {
        // A descriptor is gone also when the system reports an error of its last data.
        return static_cast<int>(syscall(SYS_close, descriptor)) | (fault.error == 0 ? 0 : -1);
    });
}
}
// NOLINTEND(readability-inconsistent-declaration-parameter-name)
