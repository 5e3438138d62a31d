// python/src/faults.cpp: the extension `tessel._faults`: reading of mapped files that others cut
// off.
//
// Where a file is mapped into memory, and is made shorter by somebody else, the system answers a
// look at what is gone with the signal SIGBUS, which ends the process. Between begin() and end(),
// the calling thread gets a page of zeros there instead, and end() says that it happened, so that
// the call in between can be made an error. Signals for everything else go where they went before.
#include <pybind11/pybind11.h>

#include <csignal>
#include <cstdint>
#include <sys/mman.h>
#include <unistd.h>

namespace tessel::python {
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

/// A page of zeros instead of the one that is gone.
bool replacePage(void *address) {
    const std::uintptr_t within = reinterpret_cast<std::uintptr_t>(address) % pageSize;
    char *const page = static_cast<char *>(address) - within;
    return mmap(page, pageSize, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0) == page;
}

void onBusError(int number, siginfo_t *info, void * /*context*/) {
    const bool ofMemory = info->si_code == BUS_ADRERR || info->si_code == BUS_OBJERR;
    if (ofMemory && watch.active != 0 && replacePage(info->si_addr)) {
        watch.faulted = 1;
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

} // namespace

PYBIND11_MODULE(_faults, extension) {
    extension.doc() = "Reading of mapped files that others may cut off; see tessel.xarray.opening.";
    pageSize = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
    extension.def("begin", begin,
                  "From now on, what is gone from a mapped file is read as zeros by this thread.");
    extension.def("end", end, "Until now. Whether anything was gone.");
}

} // namespace tessel::python
