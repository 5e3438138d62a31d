// runtime/src/module.cpp: loading modules and calling them.
#include "tessel/runtime/module.hpp"

#include "call_frame.hpp"
#include "host_errors.hpp"
#include "tessel/extension.h"
#include "tessel/runtime/watcher.hpp"

#include <cxxabi.h>
#include <dlfcn.h>
#include <pthread.h>

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <mutex>
#include <optional>
#include <string>
#include <system_error>

namespace tessel {
namespace {

using EntryPoint = decltype(tsxFunction);

constexpr const char *entryPointName = "tsxFunction";
constexpr const char *moduleSuffix = ".tsx";
constexpr const char *moduleFolder = "tessel";
constexpr const char *pathVariable = "TESSEL_MODULE_PATH";

/// One lock for all calls of the process: what a module stands on may be shared with another one.
/// Loading and unloading take it too, since they run the initialisers of both.
constinit std::mutex callLock;

/// The lock, unless the thread is within a call and has it already.
std::unique_lock<std::mutex> serialised() {
    return CallFrame::current() == nullptr ? std::unique_lock(callLock)
                                           : std::unique_lock<std::mutex>();
}

/// A fork waits for the call in progress, so that no child begins with a lock that nobody will open
/// or with a library that has stopped halfway. A thread that forks within its own call has the
/// lock.
void lockForFork() {
    if (CallFrame::current() == nullptr) {
        callLock.lock();
    }
}
void unlockAfterFork() {
    if (CallFrame::current() == nullptr) {
        callLock.unlock();
    }
}
[[maybe_unused]] const int forkHandlers =
    pthread_atfork(lockForFork, unlockAfterFork, unlockAfterFork);

[[noreturn]] void raiseLoadError(const HostError &error, const std::string &name,
                                 std::string_view detail = {}) {
    std::string message = "Cannot load module \"" + name + "\": " + error.message;
    if (!detail.empty()) {
        message.append(" (").append(detail).append(")");
    }
    throw Error(error.identifier, message);
}

/// The file that this host was loaded from: a library, or the program that it is linked into. A
/// program is known by the name that it was called by, which without a folder says nothing.
std::filesystem::path ownFile() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<void *>(&tsGetClassID), &info) == 0 || info.dli_fname == nullptr) {
        return {};
    }
    const std::filesystem::path file = info.dli_fname;
    std::error_code ignored;
    return file.has_parent_path() ? file : std::filesystem::read_symlink("/proc/self/exe", ignored);
}

/// Its folder, found when the host is loaded: the name that it was loaded by may be relative to the
/// current folder of that time. Never destroyed, because threads may outlive the end of main.
const std::filesystem::path &ownFolder = *[] {
    std::error_code ignored;
    return new const auto(std::filesystem::absolute(ownFile(), ignored).parent_path());
}();

/// Makes the host's functions visible to modules also when this library was loaded privately, as by
/// an interpreter. Where it is linked into the program there is nothing to do, and the call fails.
void showOwnFunctions() {
    if (void *self = dlopen(ownFile().c_str(), RTLD_NOW | RTLD_NOLOAD | RTLD_GLOBAL)) {
        dlclose(self);
    }
}

std::vector<std::filesystem::path> searchFolders() {
    std::vector<std::filesystem::path> folders;
    if (const char *variable = std::getenv(pathVariable)) {
        std::string_view rest = variable;
        while (!rest.empty()) {
            const std::size_t end = std::min(rest.find(':'), rest.size());
            const std::filesystem::path folder = rest.substr(0, end);
            if (folder.is_absolute()) {
                folders.push_back(folder);
            }
            rest.remove_prefix(std::min(end + 1, rest.size()));
        }
    }
    folders.push_back(ownFolder / moduleFolder);
    return folders;
}

/// What left the module and is no Error, as one. Called while the exception is being handled.
Error translated() {
    try {
        throw;
    } catch (const std::bad_alloc &) {
        return {host_errors::outOfMemory.identifier, host_errors::outOfMemory.message};
    } catch (const std::exception &error) {
        return completed(host_errors::foreignException, {": ", error.what()});
    } catch (const abi::__forced_unwind &) {
        throw; // the thread is being cancelled, which is not an error and must go on
    } catch (...) {
        return completed(host_errors::foreignException, {"."});
    }
}

} // namespace

struct Module::Loaded {
    Loaded(std::filesystem::path path) : file(std::move(path)) {
        std::error_code ignored;
        if (!std::filesystem::exists(file, ignored)) {
            raiseLoadError(host_errors::moduleNotFound, file.string());
        }
        showOwnFunctions();
        const std::unique_lock lock = serialised();
        handle = dlopen(std::filesystem::absolute(file).c_str(), RTLD_NOW | RTLD_LOCAL);
        if (handle == nullptr) {
            const char *const reason = dlerror();
            raiseLoadError(host_errors::notAModule, file.string(), reason == nullptr ? "" : reason);
        }
        entryPoint = reinterpret_cast<EntryPoint *>(dlsym(handle, entryPointName));
        if (entryPoint == nullptr) {
            dlclose(handle);
            raiseLoadError(host_errors::noEntryPoint, file.string());
        }
    }
    ~Loaded() {
        const std::unique_lock lock = serialised();
        dlclose(handle);
    }
    Loaded(const Loaded &) = delete;
    Loaded &operator=(const Loaded &) = delete;

    std::filesystem::path file;
    void *handle = nullptr;
    EntryPoint *entryPoint = nullptr;
};

Module::Module(const std::filesystem::path &file)
    : loaded(orOutOfMemory([&] { return std::make_shared<const Loaded>(file); })) {}

Module Module::find(std::string_view name) {
    const std::string wanted = std::string(name) + moduleSuffix;
    if (name.find_first_of(std::string_view("/\0", 2)) != std::string_view::npos) {
        raiseLoadError(host_errors::moduleNotFound, wanted, "a module's name has no folder in it");
    }
    std::string searched;
    for (const std::filesystem::path &folder : searchFolders()) {
        const std::filesystem::path file = folder / wanted;
        std::error_code ignored;
        if (std::filesystem::exists(file, ignored)) {
            return Module(file);
        }
        searched += (searched.empty() ? "searched " : ", ") + folder.string();
    }
    raiseLoadError(host_errors::moduleNotFound, wanted, searched);
}

const std::filesystem::path &Module::file() const noexcept {
    return loaded->file;
}

/// Tells a watcher how a call ended, also when it ends by the end of its thread, which is
/// cancelled.
class Module::Told {
  public:
    Told(Watcher &watching, Inputs watched) : watcher(watching), inputs(watched) {}
    ~Told() {
        if (!told) {
            const Error cancelled =
                completed(host_errors::foreignException, {": the thread was cancelled."});
            watcher.after(inputs, Results(), &cancelled);
        }
    }
    Told(const Told &) = delete;
    Told &operator=(const Told &) = delete;

    void tell(const Results &results, const std::optional<Error> &error) noexcept {
        told = true;
        watcher.after(inputs, results, error ? &*error : nullptr);
    }

  private:
    Watcher &watcher;
    Inputs inputs;
    bool told = false;
};

Results Module::call(std::span<const tsArray *> inputs, const CallOptions &options) const {
    if (CallFrame::current() != nullptr) {
        raise(host_errors::nestedCall);
    }
    if (options.outputs < 0 || options.outputs > static_cast<int>(Results::slots)) {
        raise(host_errors::badOutputCount);
    }
    if (inputs.size() > static_cast<std::size_t>(std::numeric_limits<int>::max())) {
        raise(host_errors::tooManyInputs);
    }
    if (std::find(inputs.begin(), inputs.end(), nullptr) != inputs.end()) {
        raise(host_errors::missingInput);
    }
    const std::lock_guard lock(callLock);
    Results results;
    std::optional<Error> error;
    if (!watcher) {
        error = run(inputs, options, results);
    } else {
        orOutOfMemory([&] { watcher->before(inputs, Ask(*this)); });
        Told told(*watcher, inputs);
        error = run(inputs, options, results);
        told.tell(results, error);
    }
    if (error) {
        throw *error;
    }
    return results;
}

Module Module::watchedBy(std::shared_ptr<Watcher> next) const {
    Module watched = *this;
    watched.watcher = std::move(next);
    return watched;
}

Results Ask::call(std::span<const tsArray *> inputs) const {
    Results results;
    if (const std::optional<Error> error = module.run(inputs, {}, results)) {
        throw *error;
    }
    return results;
}

/// One call, by a thread that has the lock: its results, or the error that it ended with, which is
/// to be raised once all is tidy.
std::optional<Error> Module::run(std::span<const tsArray *> inputs, const CallOptions &options,
                                 Results &results) const {
    std::optional<Error> failure;
    CallFrame frame(options);
    std::array<tsArray *, Results::slots> slots{};
    const auto enter = [&] {
        frame.watch(inputs);
        loaded->entryPoint(options.outputs, slots.data(), static_cast<int>(inputs.size()),
                           inputs.data());
        for (std::size_t i = 0; i < slots.size(); ++i) {
            if (slots[i] != nullptr) {
                results.arrays[i] = frame.give(slots[i]);
                results.count = i + 1;
            }
        }
    };
    try {
        enter();
    } catch (const Error &error) {
        failure = error;
    } catch (...) {
        failure = translated();
    }
    if (const char *fault = frame.inspect()) {
        failure = completed(host_errors::violation, {": ", fault});
    }
    if (failure) {
        results = Results();
    }
    return failure;
}

} // namespace tessel
