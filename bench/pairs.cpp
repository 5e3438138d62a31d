// bench/pairs.cpp: measuring something beside its reference, in one run.
#include "pairs.hpp"

#include <netcdf.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <utility>

namespace tessel::bench {
namespace {

constexpr double shortestTime = 0.02; ///< of a repetition of something short, in seconds

double shortest(const std::vector<double> &all) {
    return *std::min_element(all.begin(), all.end());
}

/// The statistics of all benchmarks, in seconds, by "NAME/STATISTIC". It is the time of the
/// processor, in the program and in the system, that counts: nothing here waits for a device, and
/// other work on the machine takes little of it away.
class Statistics : public benchmark::ConsoleReporter {
  public:
    void ReportRuns(const std::vector<Run> &runs) override {
        ConsoleReporter::ReportRuns(runs);
        for (const Run &run : runs) {
            seconds[run.run_name.function_name + "/" + run.aggregate_name] =
                run.GetAdjustedCPUTime() / benchmark::GetTimeUnitMultiplier(run.time_unit);
        }
    }

    /// One statistic of a pair: "120 | 150 | +30 | 1.250"; empty where it was not measured.
    [[nodiscard]] std::string compared(const Pair &pair, const std::string &statistic) const {
        const auto reference = seconds.find(pair.name + "/reference/" + statistic);
        const auto module = seconds.find(pair.name + "/module/" + statistic);
        if (reference == seconds.end() || module == seconds.end()) {
            return {};
        }
        return number(pair, reference->second) + " | " + number(pair, module->second) + " | " +
               compared(pair, reference->second, module->second);
    }

    /// The shortest time of the second reference and how the module's compares: "130 | +20
    /// | 1.154".
    [[nodiscard]] std::string comparedWithSteps(const Pair &pair) const {
        const auto steps = seconds.find(pair.name + "/steps/shortest");
        if (steps == seconds.end()) {
            return "– | – | –";
        }
        return number(pair, steps->second) + " | " +
               compared(pair, steps->second, seconds.at(pair.name + "/module/shortest"));
    }

  private:
    static std::string number(const Pair &pair, double time, const char *format = "%.*f") {
        std::array<char, 40> text{};
        std::snprintf(text.data(), text.size(), format, pair.block ? 1 : 0,
                      time * (pair.block ? 1e3 : 1e9));
        return text.data();
    }

    static std::string compared(const Pair &pair, double reference, double module) {
        std::array<char, 40> ratio{};
        std::snprintf(ratio.data(), ratio.size(), "%.3f", module / reference);
        return number(pair, module - reference, "%+.*f") + " | " + ratio.data();
    }

    std::map<std::string, double> seconds;
};

/// All repetitions of all groups in one file, for whoever wants more than the table has: by itself
/// Google Benchmark begins its file anew with each group.
class File : public benchmark::JSONReporter {
  public:
    explicit File(const std::string &name) : out(name) {}
    ~File() override {
        if (begun) {
            JSONReporter::Finalize();
        }
    }
    File(const File &) = delete;
    File &operator=(const File &) = delete;

    bool ReportContext(const Context &context) override {
        SetOutputStream(&out);
        return std::exchange(begun, true) || JSONReporter::ReportContext(context);
    }
    void Finalize() override {}

  private:
    std::ofstream out;
    bool begun = false;
};

/// How often each side does its work in a repetition: equally often, so that what is done for the
/// first time, or once in a while, weighs as much for both; and so often that a repetition is long
/// enough to be measured. Both sides have been used before anything counts.
std::int64_t iterationsOf(const Pair &pair, bool quick) {
    if (pair.before) {
        pair.before();
    }
    const auto seconds = [&pair](std::int64_t times) {
        const auto start = std::chrono::steady_clock::now();
        for (std::int64_t i = 0; i < times; ++i) {
            pair.reference();
            pair.module();
        }
        return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    };
    seconds(1);
    std::int64_t times = 1;
    for (const double enough = 2 * shortestTime / (quick ? 10 : 1); !pair.block;) {
        const double taken = seconds(times);
        if (taken >= enough) {
            break;
        }
        const double more = std::min(1.1 * enough / taken, 10.0);
        times = static_cast<std::int64_t>(std::ceil(static_cast<double>(times) * more));
    }
    return times;
}

/// Registers the sides of a pair that the command line wants; says whether there are any.
bool addSides(const Pair &pair, const std::regex &wanted, bool quick) {
    std::vector<std::pair<std::string, const Work *>> sides;
    for (const auto &[side, work] :
         {std::pair("reference", &pair.reference), std::pair("module", &pair.module),
          std::pair("steps", &pair.steps)}) {
        const std::string name = pair.name + "/" + side;
        if (*work && std::regex_search(name + "/", wanted)) {
            sides.emplace_back(name, work);
        }
    }
    const std::int64_t iterations = sides.empty() ? 0 : iterationsOf(pair, quick);
    for (const auto &[name, work] : sides) {
        auto *const registered = benchmark::RegisterBenchmark(
            name.c_str(), [work = work, &pair](benchmark::State &state) {
                if (pair.before) {
                    pair.before();
                }
                for ([[maybe_unused]] auto _ : state) {
                    (*work)();
                }
            });
        registered->Iterations(iterations)->Repetitions(quick ? 2 : pair.repetitions);
        registered->DisplayAggregatesOnly()->UseRealTime();
        registered->ComputeStatistics("shortest", shortest);
        if (pair.block) {
            registered->Unit(benchmark::kMillisecond);
        }
    }
    return !sides.empty();
}

std::string table(const std::vector<Pair> &pairs, const Statistics &statistics) {
    const bool anySteps =
        std::any_of(pairs.begin(), pairs.end(), [](const Pair &pair) { return bool(pair.steps); });
    std::string text =
        std::string("| operation | unit | library, median | module | difference | ratio | "
                    "library, shortest | module | difference | ratio |") +
        (anySteps ? " all steps, shortest | difference | ratio |" : "") +
        "\n|---|---|---|---|---|---|---|---|---|---|" + (anySteps ? "---|---|---|" : "") + "\n";
    for (const Pair &pair : pairs) {
        const std::string median = statistics.compared(pair, "median");
        if (!median.empty()) {
            text.append("| ").append(pair.name).append(pair.block ? " | ms | " : " | ns | ");
            text.append(median).append(" | ").append(statistics.compared(pair, "shortest"));
            text.append(" |");
            if (anySteps) {
                text.append(1, ' ').append(statistics.comparedWithSteps(pair)).append(" |");
            }
            text.append(1, '\n');
        }
    }
    return text;
}

/// Puts the text between the marks of the title.
void write(const std::string &document, const std::string &title, const std::string &text) {
    std::ifstream in(document);
    std::stringstream buffer;
    buffer << in.rdbuf();
    std::string all = buffer.str();
    const std::string begin = "<!-- " + title + ": begin -->\n";
    const std::size_t from = all.find(begin);
    const std::size_t to = all.find("<!-- " + title + ": end -->");
    if (from == std::string::npos || to == std::string::npos) {
        throw std::runtime_error(document + " has no marks for " + title);
    }
    all.replace(from + begin.size(), to - from - begin.size(), text);
    std::ofstream(document) << all;
}

/// Takes an option and its value out of the command line; gives the value, or nothing.
std::string taken(std::vector<char *> &arguments, std::string_view option) {
    const auto found = std::find(arguments.begin(), arguments.end(), option);
    if (found == arguments.end() || found + 1 == arguments.end()) {
        return {};
    }
    std::string value = *(found + 1);
    arguments.erase(found, found + 2);
    return value;
}

/// Lets perf look at what is done while this is there (profiles.py), if it waits by the pipes of a
/// folder.
class Perf {
  public:
    explicit Perf(const std::string &folder) {
        if (!folder.empty()) {
            control.open(std::filesystem::path(folder) / "control");
            answer.open(std::filesystem::path(folder) / "answer");
            tell("enable");
        }
    }
    ~Perf() {
        if (control.is_open()) {
            tell("disable");
        }
    }
    Perf(const Perf &) = delete;
    Perf &operator=(const Perf &) = delete;

  private:
    void tell(const char *what) {
        control << what << std::endl;
        std::string line;
        std::getline(answer, line);
    }

    std::ofstream control;
    std::ifstream answer;
};

} // namespace

bool isQuick(int argc, char **argv) {
    return std::find(argv, argv + argc, std::string_view("--quick")) != argv + argc;
}

int measure(int argc, char **argv, const std::string &title, const std::vector<Pair> &pairs) {
    std::vector<char *> arguments(argv, argv + argc);
    const std::string document = taken(arguments, "--write");
    const std::string json = taken(arguments, "--json");
    const std::string pipes = taken(arguments, "--perf");
    const bool quick = isQuick(argc, argv);
    std::erase(arguments, std::string_view("--quick"));
    std::string interleaving = "--benchmark_enable_random_interleaving=true";
    std::string nowhere = "--benchmark_out=/dev/null"; // or else no reporter of ours may be used
    arguments.insert(arguments.begin() + 1, {interleaving.data(), nowhere.data()});
    int count = static_cast<int>(arguments.size());
    benchmark::Initialize(&count, arguments.data());
    if (benchmark::ReportUnrecognizedArguments(count, arguments.data())) {
        return 1;
    }
    const std::string filter = benchmark::GetBenchmarkFilter();
    if ((quick || !filter.empty()) && !document.empty()) {
        std::fprintf(stderr, "A document has all rows, and none that is no measurement.\n");
        return 1;
    }
    const std::regex wanted(filter);
    Statistics statistics;
    {
        File file(json);
        for (auto first = pairs.begin(); first != pairs.end();) {
            const auto end = std::find_if(
                first, pairs.end(), [=](const Pair &pair) { return pair.group != first->group; });
            const auto any = std::count_if(
                first, end, [&](const Pair &pair) { return addSides(pair, wanted, quick); });
            if (any > 0) {
                const Perf perf(pipes);
                benchmark::RunSpecifiedBenchmarks(&statistics, &file);
                benchmark::ClearRegisteredBenchmarks();
            }
            first = end;
        }
    }
    benchmark::Shutdown();
    const std::string text = table(pairs, statistics);
    std::printf("\n%s", text.c_str());
    if (quick) {
        std::printf("\nTwice only: these numbers are no measurement.\n");
    }
    if (!document.empty()) {
        write(document, title, text);
    }
    return 0;
}

void check(int status) {
    if (status != NC_NOERR) {
        throw std::runtime_error(nc_strerror(status));
    }
}

TemporaryFolder::TemporaryFolder() {
    std::string pattern = (std::filesystem::temp_directory_path() / "bench-XXXXXX").string();
    if (mkdtemp(pattern.data()) == nullptr) {
        throw std::runtime_error("cannot make a temporary folder");
    }
    path = pattern;
}

TemporaryFolder::~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(path, ignored);
}

} // namespace tessel::bench
