// tests/long/mixed_calls.cpp: very many calls of all kinds, every third of which is an error.
// Memory, descriptors and speed must not change. Usage:
//
//   long_mixed_calls [--calls N] [--hours H] [--guard] [--leak]
//
// The run ends after N calls or H hours, whichever is given and comes last. It is looked at in
// twenty parts. With --guard the module is behind its guard, as it is in Python. With --leak a
// result of every hundredth call is kept, and one descriptor in a part; that must be noticed.
#include "support/process.hpp"
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace {

using tessel::Array;
using tessel::Error;
using tessel::Module;
using tessel::test::openDescriptors;
using tessel::test::residentMegabytes;
using Clock = std::chrono::steady_clock;

struct Options {
    std::size_t calls = 0;
    double hours = 0;
    bool guard = false;
    bool leak = false;
};

Options optionsOf(int argc, char **argv) {
    Options options;
    for (int i = 1; i < argc; ++i) {
        const std::string_view option = argv[i];
        if (option == "--leak") {
            options.leak = true;
        } else if (option == "--guard") {
            options.guard = true;
        } else if (option == "--calls" && i + 1 < argc) {
            options.calls = std::stoul(argv[++i]);
        } else if (option == "--hours" && i + 1 < argc) {
            options.hours = std::stod(argv[++i]);
        } else {
            throw std::invalid_argument("unknown option " + std::string(option));
        }
    }
    if (options.calls == 0 && options.hours == 0) {
        options.calls = 100000;
    }
    return options;
}

constexpr int partCount = 20;
constexpr std::size_t columns = 8;
constexpr std::size_t rows = 4;

Array pair(double first, double second) {
    return Array::row({first, second});
}

/// What calls are made with: a dataset that is open all the time, and a file that is opened and
/// made anew.
struct Scene {
    Module netcdf;
    tessel::test::Folder folder{tessel::test::placeInMemory()}; // the disk is not measured
    std::string file = folder.file("open.nc");
    std::string other = folder.file("other.nc");
    double ncid = 0;
    Array block = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{columns, rows});

    explicit Scene(bool guarded)
        : netcdf(guarded ? Module(TESSEL_NETCDF_MODULE).watchedBy(tessel::netcdfGuard())
                         : Module(TESSEL_NETCDF_MODULE)) {
        for (double &value : block.elements<double>()) {
            value = 21;
        }
        make(other);
        ncid = make(file, true);
    }

    /// A file with the variables v (double), s (short) and c (char) over x and y, and r (double)
    /// over t, which has no end.
    double make(const std::string &path, bool leftOpen = false) const {
        const double made = netcdf("create", path, "CLOBBER")[0].number();
        netcdf("def_dim", made, "x", static_cast<double>(columns));
        netcdf("def_dim", made, "y", static_cast<double>(rows));
        netcdf("def_dim", made, "t", 0);
        netcdf("def_var", made, "v", 6, pair(0, 1));
        netcdf("def_var", made, "s", 3, pair(0, 1));
        netcdf("def_var", made, "c", 2, pair(0, 1));
        netcdf("def_var", made, "r", 6, 2);
        netcdf("put_att_text", made, 0, "units", "degrees");
        netcdf("put_att_double", made, 0, "range", 6, pair(0, 40));
        netcdf("enddef", made);
        netcdf("put_var_double", made, 0, block);
        netcdf("put_var_double", made, 1, block);
        if (!leftOpen) {
            netcdf("close", made);
        }
        return made;
    }
};

void want(bool holds, const char *what) {
    if (!holds) {
        throw std::runtime_error(what);
    }
}

/// One kind of call. An error is what it must raise, or nullptr.
struct Kind {
    const char *error;
    std::size_t calls;
    void (*make)(const Scene &scene, const Module &netcdf);
};

// clang-format off
const std::vector<Kind> successes = {
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_var_double", s.ncid, 0)[0].size() == columns * rows, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_var_float", s.ncid, 1)[0].elements<float>()[5] == 21, "value"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_var_short", s.ncid, 1)[0].elements<std::int16_t>()[5] == 21, "value"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_var_text", s.ncid, 2)[0].size() == columns * rows, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_var1_int", s.ncid, 0, pair(1, 2))[0].size() == 1, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_vara_uchar", s.ncid, 1, pair(1, 1), pair(3, 2))[0].size() == 6, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_vars_double", s.ncid, 0, pair(0, 0), pair(4, 2), pair(2, 2))[0].size() == 8, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_var_double", s.ncid, 0, s.block); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_var1_double", s.ncid, 1, pair(0, 0), 21); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_vara_double", s.ncid, 0, pair(0, 0), pair(columns, rows), s.block); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_vars_text", s.ncid, 2, pair(0, 0), pair(2, 1), pair(2, 1), "ab"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_att_text", s.ncid, 0, "units")[0].utf8() == "degrees", "text"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("get_att_double", s.ncid, 0, "range")[0].size() == 2, "size"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("inq", s.ncid).size() == 4, "outputs"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("inq_var", s.ncid, 0)[0].utf8() == "v", "name"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("inq_dim", s.ncid, 1)[1].number() == rows, "length"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("inq_att", s.ncid, 0, "units").size() == 2, "outputs"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { want(n("inq_varid", s.ncid, "s")[0].number() == 1, "id"); }},
    {nullptr, 1, [](const Scene &, const Module &n) { want(n("parameter", "DOUBLE")[0].number() == 6, "constant"); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("sync", s.ncid); }},
    {nullptr, 2, [](const Scene &s, const Module &n) { n("close", n("open", s.other, "NOWRITE")[0]); }},
    {nullptr, 4, [](const Scene &s, const Module &n) {
         n("redef", s.ncid);
         n("put_att_text", s.ncid, 0, "units", "degrees"); // as long as it was: nothing moves
         n("put_att_double", s.ncid, 0, "range", 6, pair(0, 40));
         n("enddef", s.ncid); }},
    {nullptr, 14, [](const Scene &s, const Module &) { s.make(s.other); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_var1_double", s.ncid, 3, 7, 21); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_vara_double", s.ncid, 3, 2, 2, pair(21, 22)); }},
    {nullptr, 1, [](const Scene &s, const Module &n) { n("put_vars_double", s.ncid, 3, 1, 2, 3, pair(21, 22)); }},
    {nullptr, 5, [](const Scene &s, const Module &n) { // records that the guard does not know of
         const double ncid = n("open", s.other, "WRITE")[0].number();
         n("put_var1_double", ncid, 3, 1, 21);
         want(n("get_var1_double", ncid, 3, 1)[0].number() == 21, "value");
         want(n("inq_dim", ncid, 2)[1].number() >= 2, "records");
         n("close", ncid); }},
};

const std::vector<Kind> failures = {
    {"TESSEL:netcdf:open:noSuchFileOrDirectory",          1, [](const Scene &s, const Module &n) { n("open", s.file + ".none", "NOWRITE"); }},
    {"TESSEL:netcdf:create:netcdfFileExistsAndNoClobber", 1, [](const Scene &s, const Module &n) { n("create", s.file, "NOCLOBBER"); }},
    {"TESSEL:netcdf:inqVarID:variableNotFound",           1, [](const Scene &s, const Module &n) { n("inq_varid", s.ncid, "none"); }},
    {"TESSEL:netcdf:getVara:indexExceedsDimensionBound",  1, [](const Scene &s, const Module &n) { n("get_vara_double", s.ncid, 0, pair(columns + 1, 0), pair(1, 1)); }},
    {"TESSEL:netcdf:close:notNetcdfID",                   1, [](const Scene &, const Module &n) { n("close", 1e6); }},
    {"TESSEL:netcdf:InvalidOperation",                    1, [](const Scene &, const Module &n) { n("no_such_operation"); }},
    {"TESSEL:netcdf:firstArgNotChar",                     1, [](const Scene &, const Module &n) { n(7); }},
    {"TESSEL:netcdf:emptySetID",                          1, [](const Scene &, const Module &n) { n("sync", Array::row({})); }},
    {"TESSEL:netcdf:putVar:dataSizeMismatch",             1, [](const Scene &s, const Module &n) { n("put_var_double", s.ncid, 0, pair(1, 2)); }},
    {"TESSEL:netcdf:defDim:operationNotAllowedInDataMode", 1, [](const Scene &s, const Module &n) { n("def_dim", s.ncid, "z", 2); }},
};

/// What only the guard refuses.
const std::vector<Kind> refusals = {
    {"TESSEL:guard:mode",      1, [](const Scene &s, const Module &n) { n("create", s.other, 64); }},
    {"TESSEL:guard:mapping",   1, [](const Scene &s, const Module &n) { n("open", s.other, 17); }},
    {"TESSEL:guard:remote",    1, [](const Scene &, const Module &n) { n("open", "https://127.0.0.1:1/a.nc", "NOWRITE"); }},
    {"TESSEL:guard:records",   1, [](const Scene &s, const Module &n) { n("put_var1_double", s.ncid, 3, 0x1p31, 21); }},
    {"TESSEL:guard:counts",    1, [](const Scene &s, const Module &n) { n("put_vara_double", s.ncid, 0, pair(0, 0), pair(-1, -1), 1); }},
};
// clang-format on

std::vector<Kind> failuresOf(bool guarded) {
    std::vector<Kind> all = failures;
    if (guarded) {
        all.insert(all.end(), refusals.begin(), refusals.end());
    }
    return all;
}

/// How things stood at the end of a part of the run.
struct Part {
    std::size_t calls = 0;
    std::size_t errors = 0;
    double cpuSeconds = 0; ///< of this part, whatever other programs did meanwhile
    double megabytes = 0;
    std::size_t descriptors = 0;

    [[nodiscard]] double speed() const { return static_cast<double>(calls) / cpuSeconds; }
};

class Run {
  public:
    explicit Run(const Options &wanted) : options(wanted) {}

    /// The parts of the run; prints each as it ends.
    std::vector<Part> finish() {
        const auto begun = Clock::now();
        std::vector<Part> parts;
        std::size_t calls = 0;
        std::printf("     calls     errors   calls/s of CPU     MB  descriptors\n");
        const auto elapsed = [&] { return Clock::now() - begun; };
        while (calls < options.calls || elapsed() < hours) {
            const auto began = Clock::now();
            const bool counted = calls < options.calls;
            Part part = next([&](const Part &now) {
                return counted ? now.calls >= partCalls
                               : Clock::now() - began >= hours / partCount || elapsed() >= hours;
            });
            calls += part.calls;
            std::printf("%10zu %10zu %16.0f %6.1f %12zu\n", calls, part.errors, part.speed(),
                        part.megabytes, part.descriptors);
            std::fflush(stdout);
            parts.push_back(part);
        }
        std::printf("%.0f s\n", std::chrono::duration<double>(elapsed()).count());
        return parts;
    }

  private:
    template <class Ended>
    Part next(const Ended &ended) {
        Part part;
        const std::clock_t before = std::clock();
        while (!ended(part)) {
            for (int i = 0; i < 200; ++i) {
                one(part);
            }
        }
        part.cpuSeconds = static_cast<double>(std::clock() - before) / CLOCKS_PER_SEC;
        if (options.leak) {
            open("/dev/null", O_RDONLY);
        }
        part.megabytes = residentMegabytes();
        part.descriptors = openDescriptors();
        return part;
    }

    /// Makes a call of a kind by lot: an error whenever they are less than a third.
    void one(Part &part) {
        const bool fail = 3 * part.errors < part.calls;
        const std::vector<Kind> &kinds = fail ? failing : successes;
        const Kind &kind =
            kinds[std::uniform_int_distribution<std::size_t>(0, kinds.size() - 1)(lot)];
        std::string raised;
        try {
            kind.make(scene, scene.netcdf);
        } catch (const Error &error) {
            raised = error.identifier();
        }
        if (raised != (fail ? kind.error : "")) {
            throw std::runtime_error("raised \"" + raised + "\" instead of \"" +
                                     (fail ? kind.error : "") + "\"");
        }
        part.calls += kind.calls;
        part.errors += fail ? 1 : 0;
        if (options.leak && part.calls % 100 == 0) {
            kept.push_back(Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1000, 1}));
            std::fill_n(kept.back().elements<double>().data(), 1000, 1.0);
        }
    }

    Options options;
    Scene scene{options.guard};
    std::vector<Kind> failing = failuresOf(options.guard);
    std::mt19937 lot{1};
    std::vector<Array> kept;
    std::chrono::duration<double> hours{options.hours * 3600};
    std::size_t partCalls = std::max<std::size_t>(options.calls / partCount, 1000);
};

/// The mean over some of the parts.
template <class Of>
double mean(const std::vector<Part> &parts, std::size_t from, std::size_t to, const Of &of) {
    double sum = 0;
    for (std::size_t i = from; i < to; ++i) {
        sum += of(parts[i]);
    }
    return sum / static_cast<double>(to - from);
}

/// True where a sanitizer keeps what was freed for a while, which is memory too.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool sanitized = true;
#else
constexpr bool sanitized = false;
#endif

/// The first part is for warming up. Of the others the second half is compared with the first.
int judge(const std::vector<Part> &parts) {
    want(parts.size() >= 5, "the run is too short to be judged");
    const std::size_t middle = (parts.size() + 1) / 2;
    const auto grown = [&](const auto &of) {
        return mean(parts, middle, parts.size(), of) / mean(parts, 1, middle, of);
    };
    const double memory = grown([](const Part &part) { return part.megabytes; });
    const double speed = grown([](const Part &part) { return part.speed(); });
    std::printf("second half to first: memory %.4f, speed %.3f\n", memory, speed);
    bool flat = true;
    const auto check = [&](bool holds, const char *what) {
        if (!holds) {
            std::printf("FAILED: %s\n", what);
        }
        flat = flat && holds;
    };
    check(sanitized || memory < 1.01, "memory grows");
    check(speed > 0.7, "calls become slower"); // the machine has other things to do as well
    check(parts.front().descriptors == parts.back().descriptors, "descriptors are left open");
    for (const Part &part : parts) {
        check(3 * part.errors + 100 > part.calls, "less than a third are errors");
    }
    return flat ? EXIT_SUCCESS : EXIT_FAILURE;
}

} // namespace

int main(int argc, char **argv) try {
    return judge(Run(optionsOf(argc, argv)).finish());
} catch (const std::exception &error) {
    std::fprintf(stderr, "%s\n", error.what());
    return EXIT_FAILURE;
}
