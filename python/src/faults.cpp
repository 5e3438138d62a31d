// python/src/faults.cpp: the extension `tessel._faults`: reading of mapped files that others cut
// off.
//
// Where a file is mapped into memory, and is made shorter by somebody else, the system answers a
// look at what is gone with the signal SIGBUS, which ends the process. Between begin() and end(),
// the calling thread gets zeros there instead, and end() says that it happened, so that the call in
// between can be made an error. Signals for everything else go where they went before.
//
// The zeros take the place of the whole mapping from the fault on, by one call. A page of them for
// each fault would be a mapping more for each, of which a process may have some 65,000, and a
// column of a large file touches more pages than that.
#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <algorithm>
#include <bit>
#include <cerrno>
#include <csignal>
#include <cstdint>
#include <fcntl.h>
#include <span>
#include <sys/mman.h>
#include <unistd.h>
#include <vector>

namespace tessel::python {

namespace py = pybind11;

namespace {

/// What the handler knows of the thread that it runs in. The memory for it must be there before,
/// because none can be allocated within a handler.
struct Watch {
    volatile std::sig_atomic_t active = 0;
    volatile std::sig_atomic_t faulted = 0;
};
[[gnu::tls_model("initial-exec")]] thread_local constinit Watch watch;

struct sigaction previous = {};
volatile std::sig_atomic_t passedOn = 0;
std::uintptr_t pageSize = 0;

/// Takes the system's list of mappings byte by byte, and finds where the one ends that an address
/// is in. Its lines are "begin-end ...", in hexadecimal digits.
class MappingFinder {
  public:
    explicit MappingFinder(std::uintptr_t address) : address_(address) {}

    void take(char byte) {
        if (byte == '\n') {
            field_ = 0;
            bounds_[0] = bounds_[1] = 0;
        } else if (field_ > 1) {
            return;
        } else if (byte == '-' || byte == ' ') {
            ++field_;
            if (field_ == 2 && bounds_[0] <= address_ && address_ < bounds_[1]) {
                end_ = bounds_[1];
            }
        } else {
            const int digit = byte <= '9' ? byte - '0' : byte - 'a' + 10;
            bounds_[field_] = bounds_[field_] * 16 + static_cast<std::uintptr_t>(digit);
        }
    }

    /// 0 if it has not been found.
    [[nodiscard]] std::uintptr_t end() const { return end_; }

  private:
    std::uintptr_t address_;
    std::uintptr_t bounds_[2] = {};
    std::uintptr_t end_ = 0;
    int field_ = 0;
};

/// Where the mapping ends that an address is in; 0 if the system does not tell. A signal handler
/// may do all of this: it allocates nothing and takes no lock.
std::uintptr_t endOfMapping(std::uintptr_t address) {
    const int descriptor = open("/proc/self/maps", O_RDONLY | O_CLOEXEC);
    if (descriptor < 0) {
        return 0;
    }
    MappingFinder finder(address);
    char bytes[1024];
    ssize_t count = 0;
    while (finder.end() == 0 && (count = read(descriptor, bytes, sizeof bytes)) > 0) {
        std::for_each_n(bytes, count, [&finder](char each) { finder.take(each); });
    }
    close(descriptor);
    return finder.end();
}

/// Zeros instead of what is gone: from the page of the fault to the end of its mapping, or in that
/// page alone where the system does not tell the end.
bool replaceRest(void *address) {
    const auto fault = reinterpret_cast<std::uintptr_t>(address);
    const std::uintptr_t within = fault % pageSize;
    const std::uintptr_t end = endOfMapping(fault);
    const std::size_t length = end > fault ? end - fault + within : pageSize;
    char *const page = static_cast<char *>(address) - within;
    return mmap(page, length, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0) == page;
}

void onBusError(int number, siginfo_t *info, void * /*context*/) {
    const int code = errno; // of whatever was interrupted
    const bool ofMemory = info->si_code == BUS_ADRERR || info->si_code == BUS_OBJERR;
    if (ofMemory && watch.active != 0 && replaceRest(info->si_addr)) {
        watch.faulted = 1;
        errno = code;
        return;
    }
    // Somebody else's: the one before gets it, from where it was raised. One that hands it back
    // here has nothing to do about it.
    if (passedOn != 0) {
        std::signal(number, SIG_DFL);
    } else {
        passedOn = 1;
        sigaction(number, &previous, nullptr);
    }
    if (!ofMemory) {
        std::raise(number);
    }
}

void begin() {
    struct sigaction now = {};
    sigaction(SIGBUS, nullptr, &now);
    if ((now.sa_flags & SA_SIGINFO) == 0 || now.sa_sigaction != onBusError) {
        previous = now;
        passedOn = 0;
        struct sigaction ours = {};
        ours.sa_sigaction = onBusError;
        ours.sa_flags = SA_SIGINFO | SA_ONSTACK;
        sigemptyset(&ours.sa_mask);
        sigaction(SIGBUS, &ours, nullptr);
    }
    watch.faulted = 0;
    watch.active = 1;
}

bool end() {
    watch.active = 0;
    return watch.faulted != 0;
}

/// Asks for what is at an address, and as many steps further along each of the dimensions.
void fetchEach(std::uintptr_t address, std::span<const std::size_t> counts,
               std::span<const std::size_t> steps) {
    if (counts.empty()) {
        __builtin_prefetch(std::bit_cast<const void *>(address));
        return;
    }
    for (std::size_t i = 0; i < counts.front(); ++i) {
        fetchEach(address + i * steps.front(), counts.subspan(1), steps.subspan(1));
    }
}

void fetch(std::uintptr_t address, const std::vector<std::size_t> &counts,
           const std::vector<std::size_t> &steps) {
    if (counts.size() != steps.size()) {
        throw py::value_error("As many counts as steps are wanted.");
    }
    fetchEach(address, counts, steps);
}

} // namespace

PYBIND11_MODULE(_faults, extension) {
    extension.doc() = "Reading of mapped files that others may cut off; see tessel.xarray.opening.";
    pageSize = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
    extension.def("begin", begin,
                  "From now on, what is gone from a mapped file is read as zeros by this thread.");
    extension.def("end", end, "Until now. Whether anything was gone.");
    extension.def("fetch", fetch,
                  "Has the processor bring memory into its caches. A hint: where there is none, "
                  "nothing happens.");
}

} // namespace tessel::python
