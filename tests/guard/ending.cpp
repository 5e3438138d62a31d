// tests/guard/ending.cpp: how a process ends that makes calls which it may not survive.
#include "ending.hpp"

#include "tessel/runtime.hpp"

#include <sys/resource.h>
#include <sys/time.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <cstring>

namespace tessel::test {
namespace {

constexpr int survivedCode = 100;
constexpr int raisedCode = 101;

} // namespace

std::string endOf(const std::function<void(const Folder &)> &calls) {
    const Folder folder;
    const pid_t child = fork();
    if (child == 0) {
        std::freopen("/dev/null", "w", stderr);
        for (const int signal : {SIGSEGV, SIGBUS, SIGFPE, SIGABRT}) {
            std::signal(signal, SIG_DFL); // a sanitizer would exit
        }
        const rlimit room = {std::size_t{64} << 20U, std::size_t{64} << 20U};
        const rlimit none = {0, 0};
        setrlimit(RLIMIT_FSIZE, &room);
        setrlimit(RLIMIT_CORE, &none);
        const itimerval twoSeconds = {{}, {2, 0}}; // of the processor, whatever else it does
        setitimer(ITIMER_PROF, &twoSeconds, nullptr);
        try {
            calls(folder);
        } catch (const Error &) {
            _exit(raisedCode);
        }
        _exit(survivedCode);
    }
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status)) {
        return strsignal(WTERMSIG(status));
    }
    return "exit with " + std::to_string(WEXITSTATUS(status));
}

} // namespace tessel::test
