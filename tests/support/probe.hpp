// tests/support/probe.hpp: what a module asks of the library and of the host, seen and answered.
//
// The test program defines the functions of both that a module calls (library_functions.cpp,
// host_functions.cpp). Being in the program, they come before those of the libraries. Each hands
// the call on to the function that it hides; while a probe is alive, the call is noted, and the
// probe may answer in the library's place. What the library asks of itself on the way is not noted.
#pragma once

#include <dlfcn.h>

#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <variant>
#include <vector>

namespace tessel::test {

/// An argument of a library function, as it was given.
using Argument =
    std::variant<long long, unsigned long long, const char *, const int *, int *,
                 const std::size_t *, std::size_t *, const std::ptrdiff_t *, const void *>;

template <class T>
Argument argumentOf(T value) {
    if constexpr (std::is_constructible_v<Argument, std::in_place_type_t<T>, T>) {
        return Argument(std::in_place_type<T>, value);
    } else if constexpr (std::is_pointer_v<T>) {
        return static_cast<const void *>(value);
    } else if constexpr (std::is_signed_v<T>) {
        return static_cast<long long>(value);
    } else {
        return static_cast<unsigned long long>(value);
    }
}

/// Notes what one call of a module asks, in order. At most one is alive.
class Probe {
  public:
    Probe();
    ~Probe();
    Probe(const Probe &) = delete;
    Probe &operator=(const Probe &) = delete;

    /// The n-th call of the library's function answers the status, and the library is not asked.
    void answer(std::string_view function, int status, int n = 1);

    /// What the answered calls of the library's that read leave in the memory they are given.
    void leave(std::string bytes) { left = std::move(bytes); }

    /// The library's text for every status.
    void explain(std::string text) { explanation = std::move(text); }

    /// The n-th tsArrayToString answers NULL.
    void denyText(int n) { textDenied = n; }

    /// tsIsNumeric answers true, whatever the class.
    void claimNumeric() { numericClaimed = true; }

    /// tsCalloc answers a request for no bytes with NULL, tsGetData one for the data of an array
    /// without elements. A host may do either.
    void refuseNoBytes() { noBytesRefused = true; }
    void hideNoData() { noDataHidden = true; }

    /// Names for a dataset id and for memory, and a folder that paths are shown without.
    void name(int id, std::string text) { ids[id] = std::move(text); }
    void name(const void *data, std::string text) { memory[data] = std::move(text); }
    void leaveOut(std::string prefix) { folder = std::move(prefix); }

    /// The calls, a line each: "nc_get_vara_double(ncid, 1, {0, 2}, {1, 2}, result)". Outputs are
    /// "out". Of the host's functions, those that give and take back memory.
    [[nodiscard]] std::vector<std::string> trace() const;

    /// True if a call of the library succeeded that does more than inquire or read.
    [[nodiscard]] bool sawEffect() const { return effect; }

    /// The datasets that the library opened or created.
    [[nodiscard]] const std::vector<int> &opened() const { return openedIDs; }

    // For the functions that hide others.

    /// The probe that is to note a call that is made now; nullptr where there is none.
    static Probe *watching();

    /// While it is alive, the probe watches nothing.
    class Pause {
      public:
        explicit Pause(Probe &watcher) : probe(watcher) { ++probe.pauses; }
        ~Pause() { --probe.pauses; }
        Pause(const Pause &) = delete;
        Pause &operator=(const Pause &) = delete;

      private:
        Probe &probe;
    };

    void begin(std::string_view function, const std::vector<Argument> &arguments);
    std::optional<int> answerTo(std::string_view function, const std::vector<Argument> &arguments);
    void end(std::string_view function, int status, const std::vector<Argument> &arguments);
    [[nodiscard]] const std::optional<std::string> &explained() const { return explanation; }
    bool deniesText() { return ++textsAsked == textDenied; }
    [[nodiscard]] bool claimsNumeric() const { return numericClaimed; }
    [[nodiscard]] bool refusesNoBytes() const { return noBytesRefused; }
    [[nodiscard]] bool hidesNoData() const { return noDataHidden; }
    void note(std::string call) { notes.push_back({std::move(call), nullptr}); }
    void noteBlock(std::string call, const void *block);
    void noteFree(const void *block);

  private:
    struct Answer {
        std::string function;
        int status;
        int n;
    };

    /// A line of the trace; memory is named at its end when all is over.
    struct Note {
        std::string text;
        const void *memory;
    };

    [[nodiscard]] std::string shownArgument(const std::vector<Argument> &arguments, std::size_t at,
                                            bool inOut) const;

    std::vector<Note> notes;
    std::vector<Answer> answers;
    std::map<std::string, int, std::less<>> counts;
    std::string left;
    std::optional<std::string> explanation;
    int textDenied = 0;
    int textsAsked = 0;
    bool numericClaimed = false;
    bool noBytesRefused = false;
    bool noDataHidden = false;
    bool effect = false;
    std::vector<int> openedIDs;
    std::map<int, std::string> ids;
    std::map<const void *, std::string> memory;
    std::vector<const void *> blocks;
    std::string folder;
    int pauses = 0;
};

/// The function that a function of the program hides.
template <class R, class... P>
auto hidden(const char *function) {
    return reinterpret_cast<R (*)(P...)>(dlsym(RTLD_NEXT, function));
}

/// Hands a call of a library function on, or has the probe answer it.
template <class... P>
int probed(const char *function, P... arguments) {
    Probe *const probe = Probe::watching();
    if (probe == nullptr) {
        return hidden<int, P...>(function)(arguments...);
    }
    const std::vector<Argument> seen{argumentOf(arguments)...};
    const Probe::Pause pause(*probe);
    probe->begin(function, seen);
    if (const std::optional<int> answer = probe->answerTo(function, seen)) {
        return *answer;
    }
    const int status = hidden<int, P...>(function)(arguments...);
    probe->end(function, status, seen);
    return status;
}

} // namespace tessel::test
