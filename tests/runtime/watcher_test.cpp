// tests/runtime/watcher_test.cpp: what a watcher sees of each call, and what comes of its
// exceptions.
#include "support.hpp"

#include <memory>
#include <new>
#include <stdexcept>
#include <thread>
#include <utility>

namespace tessel::test {
namespace {

/// Notes what it sees; calls of certain actions it refuses.
class Notes : public Watcher {
  public:
    void before(Inputs inputs, const Ask &ask) override {
        seen.push_back(utf8Of(inputs[0]));
        if (asks) {
            asked = ask("count_calls")[0].number();
        }
        if (seen.back() == "refuse") {
            throw Error("test:refused", "No.");
        }
        if (seen.back() == "no memory") {
            throw std::bad_alloc();
        }
        if (seen.back() == "mistake") {
            throw std::logic_error("a mistake of the watcher's");
        }
    }
    void after(Inputs inputs, const Results &results, const Error *error) noexcept override {
        const std::string action = utf8Of(inputs[0]);
        ended.emplace_back(action,
                           error == nullptr ? std::to_string(results.size()) : error->identifier());
    }

    std::vector<std::string> seen;
    std::vector<std::pair<std::string, std::string>> ended;
    bool asks = true;
    double asked = 0;
};

class Watching : public testing::Test {
  protected:
    std::shared_ptr<Notes> notes = std::make_shared<Notes>();
    Module plain{testModule("raising")};
    Module watched = plain.watchedBy(notes);
    using Ended = std::vector<std::pair<std::string, std::string>>;
};

TEST_F(Watching, SeesCallsAndNotThoseOfOthers) {
    watched("take_destroyed");
    plain("take_destroyed");
    watched.watchedBy(nullptr)("take_destroyed");
    EXPECT_EQ(notes->seen, (std::vector<std::string>{"take_destroyed"}));
    EXPECT_EQ(notes->ended, (Ended{{"take_destroyed", "1"}}));
}

TEST_F(Watching, AsksTheModuleUnwatched) {
    const double calls = plain("count_calls")[0].number();
    watched("count_calls");
    EXPECT_EQ(notes->asked, calls + 1);
    EXPECT_EQ(notes->seen.size(), 1U);
}

TEST_F(Watching, IsToldOfEveryWayOut) {
    const std::string foreign = "TESSEL:host:foreignException";
    const Ended ends = {
        {"plain", "test:plain"}, {"no_such_action", "test:noSuchAction"},
        {"int", foreign},        {"runtime_error", foreign},
        {"local", foreign},      {"bad_alloc", "TESSEL:host:outOfMemory"},
    };
    for (const auto &end : ends) {
        EXPECT_EQ(identifierOf([&] { watched(end.first); }), end.second);
    }
    EXPECT_EQ(notes->ended, ends);
}

TEST_F(Watching, IsToldOfABrokenPromise) {
    const Checked checked;
    const Module faulty = Module(testModule("faulty")).watchedBy(notes);
    notes->asks = false;
    const Ended end = {{"overrun_then_raise", "TESSEL:host:violation"}};
    EXPECT_EQ(identifierOf([&] { faulty(end[0].first); }), end[0].second);
    EXPECT_EQ(notes->ended, end);
}

TEST_F(Watching, IsToldOfTheEndOfTheThread) {
    if (sanitized) {
        GTEST_SKIP() << "the sanitizers do not unwind a thread that ends like this";
    }
    std::thread([&] { watched("exit_thread"); }).join();
    EXPECT_EQ(notes->ended, (Ended{{"exit_thread", "TESSEL:host:foreignException"}}));
    watched("take_destroyed"); // the next call works
    EXPECT_EQ(notes->ended.size(), 2U);
}

TEST_F(Watching, RefusesByAnyExceptionAndIsNotToldOfTheEnd) {
    const double calls = plain("count_calls")[0].number();
    EXPECT_EQ(identifierOf([&] { watched("refuse"); }), "test:refused");
    EXPECT_EQ(identifierOf([&] { watched("no memory"); }), "TESSEL:host:outOfMemory");
    EXPECT_THROW(watched("mistake"), std::logic_error);
    EXPECT_EQ(plain("count_calls")[0].number(), calls + 4) << "what was asked, and this";
    EXPECT_EQ(notes->ended, Ended{});
    watched("take_destroyed"); // the next call works
    EXPECT_EQ(notes->ended, (Ended{{"take_destroyed", "1"}}));
}

} // namespace
} // namespace tessel::test
