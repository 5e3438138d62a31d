// tests/runtime/modules/raising.cpp: a module that ends its calls in every way there is.
#include "action.hpp"

#include <pthread.h>

#include <atomic>
#include <new>
#include <stdexcept>
#include <string>
#include <thread>

namespace {

int destroyed = 0;
int calls = 0;

/// Counts that its destructor ran.
struct Witness {
    Witness() = default;
    ~Witness() { ++destroyed; }
    Witness(const Witness &) = delete;
    Witness &operator=(const Witness &) = delete;
};

/// Throws and catches an exception of its own while another one is on its way.
struct BusyWitness : Witness {
    BusyWitness() = default;
    ~BusyWitness() {
        try {
            throw std::runtime_error("inner");
        } catch (const std::runtime_error &) {
            tsFree(tsCalloc(1, 1)); // the host is usable during unwinding
        }
    }
    BusyWitness(const BusyWitness &) = delete;
    BusyWitness &operator=(const BusyWitness &) = delete;
};

void throwInt(const Call &) {
    const Witness witness;
    throw 5;
}
void throwRuntimeError(const Call &) {
    const Witness witness;
    throw std::runtime_error("the library is unhappy");
}
void throwBadAlloc(const Call &) {
    const Witness witness;
    throw std::bad_alloc();
}
void throwLengthError(const Call &) {
    const Witness witness;
    std::string().resize(std::string().max_size() + 1);
}
struct Local : std::exception {
    [[nodiscard]] const char *what() const noexcept override { return "bytes \xff and \xc3\xa9"; }
};
void throwLocal(const Call &) {
    const BusyWitness witness;
    throw Local();
}
void raisePlain(const Call &) {
    const BusyWitness witness;
    tsxErrMsgIdAndTxt("test:plain", "Plain.");
}
/// Identifier and text are inputs; the text is an argument of the format.
void raiseText(const Call &call) {
    const Witness witness;
    const char *const identifier = tsArrayToString(call.prhs[1]);
    tsxErrMsgIdAndTxt(identifier, "<%s>", tsArrayToString(call.prhs[2]));
}
void raiseLatin1(const Call &) {
    tsxErrMsgIdAndTxt("test:\xe9", "caf\xe9 and caf\xc3\xa9");
}
void raiseLong(const Call &call) {
    tsxErrMsgIdAndTxt("test:long", "%*d", static_cast<int>(call.number(1)), 7);
}
void raiseFormat(const Call &) {
    tsxErrMsgIdAndTxt("test:format", "%d of %zu, %5.2f%% \"%s\" %c", -3, sizeof(double) * 2, 12.345,
                      "100% %s", 'x');
}
void exitThread(const Call &) {
    const Witness witness;
    pthread_exit(nullptr);
}

/// What the host answers on a thread that is in no call: 1 if it raises and gives no memory.
void otherThread(const Call &call) {
    std::atomic<bool> refused = false;
    std::thread([&] {
        tsFree(nullptr);
        const bool noMemory = tsCalloc(1, 1) == nullptr;
        try {
            tsCreateDoubleScalar(1);
        } catch (const std::exception &error) {
            refused = noMemory && std::string(error.what()) ==
                                      "The function is for a module that is being called.";
        }
    }).join();
    call.plhs[0] = tsCreateDoubleScalar(refused ? 1 : 0);
}

void takeDestroyed(const Call &call) {
    call.plhs[0] = tsCreateDoubleScalar(destroyed);
    destroyed = 0;
}

/// How many calls there were since the module was loaded.
void countCalls(const Call &call) {
    call.plhs[0] = tsCreateDoubleScalar(calls);
}

/// Counts itself in and out of a number that the test lends; raises when it is not alone.
void exclusive(const Call &call) {
    std::atomic<int> &inside = **static_cast<std::atomic<int> **>(tsGetData(call.prhs[1]));
    if (inside.fetch_add(1) != 0) {
        tsxErrMsgIdAndTxt("test:overlap", "Two calls at once.");
    }
    std::this_thread::yield();
    inside.fetch_sub(1);
    call.plhs[0] = tsCreateDoubleScalar(call.number(2) * 2);
}

constexpr Action actions[] = {
    {"int", throwInt},
    {"runtime_error", throwRuntimeError},
    {"bad_alloc", throwBadAlloc},
    {"length_error", throwLengthError},
    {"local", throwLocal},
    {"plain", raisePlain},
    {"text", raiseText},
    {"latin1", raiseLatin1},
    {"long", raiseLong},
    {"format", raiseFormat},
    {"exit_thread", exitThread},
    {"other_thread", otherThread},
    {"take_destroyed", takeDestroyed},
    {"count_calls", countCalls},
    {"exclusive", exclusive},
};

} // namespace

void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    ++calls;
    runAction(actions, {plhs, nrhs, prhs});
}
