// tests/difference/main.cpp: runs programs through the module and by direct calls of the library,
// and wants the same of both, to the last byte of the files.
//
//   difference_test [--programs N] [--seed S] [--self-test] [--operations] [--print]
//
// The variables TESSEL_DIFFERENCE_PROGRAMS and TESSEL_DIFFERENCE_SEED are for runs in which there
// is no command line to write to.
#include "generate.hpp"
#include "pinned.hpp"
#include "run.hpp"
#include "statistics.hpp"
#include "support/process.hpp"

#include <rapidcheck.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>

namespace {

using namespace difference;
namespace fs = std::filesystem;

struct Options {
    std::size_t programs = TESSEL_DIFFERENCE_DEFAULT_PROGRAMS;
    std::size_t seed = 1;
    bool selfTest = false;
    bool operations = false; ///< the counts of every operation
    bool print = false;      ///< each program before it is run, to find one that ends the process
};

std::size_t numberOf(const char *text) {
    return std::stoul(text);
}

Options optionsOf(int argc, char *argv[]) {
    Options options;
    if (const char *programs = std::getenv("TESSEL_DIFFERENCE_PROGRAMS")) {
        options.programs = numberOf(programs);
    }
    if (const char *seed = std::getenv("TESSEL_DIFFERENCE_SEED")) {
        options.seed = numberOf(seed);
    }
    for (int i = 1; i < argc; ++i) {
        const std::string_view option = argv[i];
        const bool hasValue = i + 1 < argc;
        if (option == "--programs" && hasValue) {
            options.programs = numberOf(argv[++i]);
        } else if (option == "--seed" && hasValue) {
            options.seed = numberOf(argv[++i]);
        } else if (option == "--self-test") {
            options.selfTest = true;
        } else if (option == "--operations") {
            options.operations = true;
        } else if (option == "--print") {
            options.print = true;
        } else {
            throw std::invalid_argument("unknown option " + std::string(option));
        }
    }
    return options;
}

/// A folder of this run's own, which is the current one: a program that names a path of its own
/// harms nothing.
class Workplace {
  public:
    Workplace() {
        fs::create_directory(module());
        fs::create_directory(library());
        fs::current_path(root.folder());
    }

    [[nodiscard]] fs::path module() const { return root.file("module"); }
    [[nodiscard]] fs::path library() const { return root.file("library"); }

  private:
    tessel::test::Folder root{tessel::test::placeInMemory()};
};

/// Both sides, and what came of the last program.
class Bench {
  public:
    explicit Bench(Deviation deviation = Deviation::none)
        : module(moduleSide(TESSEL_NETCDF_MODULE)), library(librarySide(deviation)),
          padding(deviation == Deviation::forgottenPadding) {}

    /// The first difference, in words; nothing when both sides agree.
    std::optional<std::string> run(const Program &program) {
        const Trace ours = difference::run(program, module, workplace.module());
        theirs = difference::run(program, library, workplace.library());
        if (padding) {
            for (auto &content : theirs.files) {
                if (content && !content->empty() && content->back() == '\0') {
                    content->pop_back();
                }
            }
        }
        return firstDifference(program, ours, theirs);
    }

    [[nodiscard]] const Trace &libraryTrace() const { return theirs; }

  private:
    Workplace workplace;
    Side module;
    Side library;
    bool padding;
    Trace theirs;
};

/// A program on which the sides differ, made as simple as it gets.
struct Found {
    Program program;
    std::string difference;
};

/// Runs programs until one shows a difference. `agreed` is told of those that do not.
template <class Agreed>
std::optional<Found> search(Bench &bench, bool print, const Agreed &agreed) {
    std::optional<Found> found; // the last that differs is the simplest
    bool stopped = false;
    std::ostringstream report;
    std::streambuf *const errors = std::cerr.rdbuf(report.rdbuf());
    const bool passed = rc::check([&] {
        const Program program = *programs();
        if (stopped) {
            return;
        }
        if (print) {
            std::cout << program << std::endl;
        }
        std::optional<std::string> difference;
        try {
            difference = bench.run(program);
        } catch (const LeftOpen &error) {
            difference = std::string("a dataset could not be closed: ") + error.what();
            stopped = true;
        }
        if (difference) {
            found = Found{program, *difference};
            RC_FAIL(*difference);
        }
        agreed(program);
    });
    std::cerr.rdbuf(errors);
    if (!passed && !found) {
        throw std::runtime_error(report.str());
    }
    return found;
}

void configure(std::size_t programs, std::size_t seed) {
    const std::string parameters =
        "max_success=" + std::to_string(programs) + " seed=" + std::to_string(seed);
    setenv("RC_PARAMS", parameters.c_str(), 1);
}

int failures(const std::vector<std::string> &complaints) {
    for (const std::string &complaint : complaints) {
        std::cout << "FAILED: " << complaint << '\n';
    }
    return complaints.empty() ? EXIT_SUCCESS : EXIT_FAILURE;
}

std::vector<std::string> runPinned(Bench &bench) {
    std::vector<std::string> complaints;
    for (const Pinned &pinned : pinnedPrograms()) {
        if (const auto difference = bench.run(pinned.program)) {
            complaints.push_back(std::string(pinned.name) + ": " + *difference);
        }
        const auto &outcomes = bench.libraryTrace().outcomes;
        const auto succeeded = static_cast<std::size_t>(
            std::count_if(outcomes.begin(), outcomes.end(),
                          [](const Outcome &outcome) { return outcome.identifier.empty(); }));
        if (succeeded != pinned.succeeding) {
            complaints.push_back(std::string(pinned.name) + ": " + std::to_string(succeeded) +
                                 " steps succeeded, not " + std::to_string(pinned.succeeding));
        }
    }
    return complaints;
}

int compare(const Options &options) {
    const auto begun = std::chrono::steady_clock::now();
    configure(options.programs, options.seed);
    Bench bench;
    std::vector<std::string> complaints = runPinned(bench);
    Statistics statistics;
    const auto found = search(bench, options.print, [&](const Program &program) {
        statistics.add(program, bench.libraryTrace());
    });
    if (found) {
        std::ostringstream out;
        out << found->difference << "\nin this program, as simple as it gets:\n" << found->program;
        complaints.push_back(out.str());
    } else {
        if (statistics.programs() != options.programs) {
            complaints.emplace_back("not all programs were run");
        }
        const std::vector<std::string> missing = statistics.complaints();
        complaints.insert(complaints.end(), missing.begin(), missing.end());
    }
    if (options.operations) {
        statistics.printOperations(std::cout);
    }
    statistics.print(std::cout);
    const std::chrono::duration<double> took = std::chrono::steady_clock::now() - begun;
    std::cout << "seed " << options.seed << ", " << pinnedPrograms().size() << " pinned programs, "
              << took.count() << " s\n";
    return failures(complaints);
}

/// A deviation of the direct side, and how simple the program gets that shows it.
struct Planted {
    const char *name;
    Deviation deviation;
    std::size_t mostSteps;
};
// What is left of a program depends on where the search began: these are the most of 25 seeds.
constexpr std::array plantings = {
    Planted{"two values that change places", Deviation::swappedValues, 8},
    Planted{"dimensions that are not turned", Deviation::dimensionsAsIs, 5},
    Planted{"text that is read without its sign", Deviation::unsignedText, 10},
    Planted{"another word for a status", Deviation::otherWord, 8},
    Planted{"checks in another order", Deviation::laterChecks, 1},
    Planted{"a file without its last byte", Deviation::forgottenPadding, 1},
};

int selfTest(const Options &options) {
    configure(options.programs, options.seed);
    std::vector<std::string> complaints;
    for (const Planted &planted : plantings) {
        Bench bench(planted.deviation);
        std::size_t agreed = 0;
        const auto found = search(bench, false, [&](const Program &) { ++agreed; });
        if (!found) {
            complaints.push_back(std::string(planted.name) + " was not noticed");
            continue;
        }
        std::cout << planted.name << ", noticed after " << agreed << " programs that agree:\n"
                  << found->difference << '\n'
                  << found->program << "\n\n";
        if (found->program.size() > planted.mostSteps) {
            complaints.push_back(std::string(planted.name) + " was not made simple");
        }
        if (Bench().run(found->program)) {
            complaints.push_back(std::string(planted.name) + " is noticed where it is not");
        }
    }
    return failures(complaints);
}

} // namespace

int main(int argc, char *argv[]) {
    try {
        const Options options = optionsOf(argc, argv);
        return options.selfTest ? selfTest(options) : compare(options);
    } catch (const std::exception &error) {
        std::cerr << error.what() << '\n';
        return EXIT_FAILURE;
    }
}
