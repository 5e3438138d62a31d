// tests/threads/stress.cpp: many threads over one module, on files of their own and on the same
// ones. Usage: threads_stress [--guard] [SECONDS]
//
// Every value is a function of where it stands, so each thread can check all that it reads without
// knowing what the others do. With --guard the module is behind its guard, as it is in Python, and
// the threads also make calls that it refuses, each of which must be its own thread's: one would
// end the process if another thread's call took its place. What is wrong is printed, and then the
// program fails.
#include "support/process.hpp"
#include "tessel/netcdf_guard.hpp"
#include "tessel/runtime.hpp"

#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <mutex>
#include <random>
#include <set>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace {

using tessel::Array;
using tessel::Module;
using tessel::Results;

constexpr std::size_t workers = 8;
constexpr std::size_t computers = 2;
constexpr std::size_t columns = 64;
constexpr std::size_t rows = 48;

struct Fault : std::runtime_error {
    using std::runtime_error::runtime_error;
};

void want(bool holds, const std::string &what) {
    if (!holds) {
        throw Fault(what);
    }
}

/// What stands in a column of a row, as written by the given writer.
double valueAt(std::size_t column, std::size_t row, std::size_t writer) {
    return static_cast<double>(column + (1000 * row) + (1000000 * writer));
}

/// All dataset ids that were ever handed out.
class Ids {
  public:
    double note(double id) {
        const std::lock_guard lock(mutex);
        ids.insert(id);
        return id;
    }
    [[nodiscard]] const std::set<double> &all() const { return ids; }

  private:
    std::mutex mutex;
    std::set<double> ids;
};

Array lengths(std::size_t first, std::size_t second) {
    return Array::row({static_cast<double>(first), static_cast<double>(second)});
}

/// What all threads use.
struct Scene {
    explicit Scene(bool behindGuard)
        : guarded(behindGuard),
          netcdf(guarded ? Module(TESSEL_NETCDF_MODULE).watchedBy(tessel::netcdfGuard())
                         : Module(TESSEL_NETCDF_MODULE)) {}

    bool guarded;
    Module netcdf;
    tessel::test::Folder folder;
    Ids ids;
    std::string commonFile = folder.file("common.nc");
    std::string claimingFile = folder.file("claims.nc"); ///< more dimensions than it has bytes
    double readId = 0;                                   ///< commonFile, open for reading
    double writeId = 0; ///< a dataset in which each thread has a row of its own

    /// A file with one variable of double, id 0; open, out of define mode.
    double create(const std::string &path, std::size_t height) {
        const double id = ids.note(netcdf("create", path, "CLOBBER")[0].number());
        const Results x = netcdf("def_dim", id, "x", static_cast<double>(columns));
        const Results y = netcdf("def_dim", id, "y", static_cast<double>(height));
        netcdf("def_var", id, "v", netcdf("parameter", "DOUBLE")[0],
               Array::row({x[0].number(), y[0].number()}));
        netcdf("enddef", id);
        return id;
    }

    double open(const std::string &path) {
        return ids.note(netcdf("open", path, "NOWRITE")[0].number());
    }

    /// Writes a whole variable of `height` rows, as the given writer.
    void fill(double id, std::size_t height, std::size_t writer) const {
        const std::array<std::size_t, 2> dims = {columns, height};
        const Array data = Array::numeric(tsDOUBLE, dims);
        double *to = data.elements<double>().data();
        for (std::size_t row = 0; row < height; ++row) {
            for (std::size_t column = 0; column < columns; ++column) {
                *to++ = valueAt(column, row, writer);
            }
        }
        netcdf("put_var_double", id, 0, data);
    }
};

/// One thread that works, and what it draws by lot.
struct Worker {
    Scene &scene;
    std::size_t number;
    std::mt19937 lot{static_cast<std::mt19937::result_type>(number)};

    std::size_t below(std::size_t limit) {
        return std::uniform_int_distribution<std::size_t>(0, limit - 1)(lot);
    }
};

/// Reads a block by lot and checks each of its elements.
void readBlock(Worker &worker, double id, std::size_t writer) {
    const std::size_t column = worker.below(columns);
    const std::size_t row = worker.below(rows);
    const std::size_t width = 1 + worker.below(columns - column);
    const std::size_t height = 1 + worker.below(rows - row);
    const Results read =
        worker.scene.netcdf("get_vara_double", id, 0, lengths(column, row), lengths(width, height));
    const std::span<double> values = read[0].elements<double>();
    want(values.size() == width * height, "a block has another size");
    for (std::size_t i = 0; i < values.size(); ++i) {
        want(values[i] == valueAt(column + (i % width), row + (i / width), writer),
             "a block has another value");
    }
}

void ownFile(Worker &worker) {
    Scene &scene = worker.scene;
    const std::string path = scene.folder.file(std::to_string(worker.number) + ".nc");
    const std::size_t writer = worker.below(1000);
    const double written = scene.create(path, rows);
    scene.fill(written, rows, writer);
    readBlock(worker, written, writer);
    scene.netcdf("close", written);
    const double read = scene.open(path);
    readBlock(worker, read, writer);
    scene.netcdf("close", read);
}

void commonDataset(Worker &worker) {
    readBlock(worker, worker.scene.readId, 0);
}

void commonFile(Worker &worker) {
    const double id = worker.scene.open(worker.scene.commonFile);
    const Results varid = worker.scene.netcdf("inq_varid", id, "v");
    want(varid[0].number() == 0, "the variable has another id");
    readBlock(worker, id, 0);
    worker.scene.netcdf("close", id);
}

/// Each thread writes rows of its own into the common dataset. A write is one call, so nobody ever
/// reads a row that is half of one write and half of another.
void commonRows(Worker &worker) {
    Scene &scene = worker.scene;
    const std::size_t writer = worker.below(1000);
    const std::array<std::size_t, 2> dims = {columns, 1};
    const Array data = Array::numeric(tsDOUBLE, dims);
    for (std::size_t column = 0; column < columns; ++column) {
        data.elements<double>()[column] = valueAt(column, worker.number, writer);
    }
    scene.netcdf("put_vara_double", scene.writeId, 0, lengths(0, worker.number),
                 lengths(columns, 1), data);
    for (const std::size_t row : {worker.number, worker.below(workers)}) {
        const Results read =
            scene.netcdf("get_vara_double", scene.writeId, 0, lengths(0, row), lengths(columns, 1));
        const std::span<double> values = read[0].elements<double>();
        const double first = values.front();
        want(std::fmod(first, 1000000) == valueAt(0, row, 0), "a row is another one");
        want(row != worker.number || first == valueAt(0, row, writer), "a row was not written");
        for (std::size_t column = 0; column < values.size(); ++column) {
            want(values[column] == first + static_cast<double>(column), "a row is two halves");
        }
    }
}

/// Runs something that must raise the error of that identifier.
template <class Run>
void wantError(const std::string &identifier, const Run &run) {
    std::string raised = "nothing";
    try {
        run();
    } catch (const tessel::Error &error) {
        raised = error.identifier();
    }
    want(raised == identifier, "raised " + raised + " instead of " + identifier);
}

void errors(Worker &worker) {
    Scene &scene = worker.scene;
    const Module &netcdf = scene.netcdf;
    wantError("TESSEL:netcdf:open:noSuchFileOrDirectory",
              [&] { netcdf("open", scene.folder.file("none.nc"), "NOWRITE"); });
    wantError("TESSEL:netcdf:inqVarID:variableNotFound",
              [&] { netcdf("inq_varid", scene.readId, "none"); });
    wantError("TESSEL:netcdf:getVara:indexExceedsDimensionBound", [&] {
        netcdf("get_vara_double", scene.readId, 0, lengths(columns + 1, 0), lengths(1, 1));
    });
    wantError("TESSEL:netcdf:InvalidOperation", [&] { netcdf("no_such_operation"); });
}

/// What the guard refuses, some of it by what it knows of a dataset of this thread's.
void refusals(Worker &worker) {
    Scene &scene = worker.scene;
    const Module &netcdf = scene.netcdf;
    const std::string path = scene.folder.file(std::to_string(worker.number) + "-records.nc");
    constexpr double userFormat = 64;
    wantError("TESSEL:guard:mode", [&] { netcdf("create", path, userFormat); });
    wantError("TESSEL:guard:header", [&] { scene.open(scene.claimingFile); });

    const double id = scene.ids.note(netcdf("create", path, "CLOBBER")[0].number());
    const Results t = netcdf("def_dim", id, "t", 0);
    const Results v = netcdf("def_var", id, "v", netcdf("parameter", "DOUBLE")[0], t[0]);
    wantError("TESSEL:guard:alignment", [&] { netcdf("_enddef", id, 0, 0, 0, 4); });
    netcdf("enddef", id);
    wantError("TESSEL:guard:records", [&] { netcdf("put_var1_double", id, v[0], 4e9, 1); });
    const auto record = static_cast<double>(worker.below(100));
    netcdf("put_var1_double", id, v[0], record, record);
    want(netcdf("inq_dim", id, t[0])[1].number() == record + 1, "there are other records");

    netcdf("close", id);

    // Definitions that cannot be ended: there are two fill values instead of one.
    const double other = scene.ids.note(netcdf("create", path, "CLOBBER")[0].number());
    const Results x = netcdf("def_dim", other, "x", 3);
    netcdf("def_var", other, "v", netcdf("parameter", "INT")[0], x[0]);
    netcdf("put_att_double", other, 0, "_FillValue", netcdf("parameter", "INT")[0],
           Array::row({1, 2}));
    for (int times = 0; times < 2; ++times) {
        wantError("TESSEL:netcdf:close:invalidDataType", [&] { netcdf("close", other); });
    }
    netcdf("abort", other);
}

struct Action {
    const char *name;
    void (*run)(Worker &);
};
constexpr std::array allActions = {
    Action{"ownFile", ownFile},       Action{"commonDataset", commonDataset},
    Action{"commonFile", commonFile}, Action{"commonRows", commonRows},
    Action{"errors", errors},         Action{"refusals", refusals}, // by the guard
};

/// Arrays made, moved and destroyed without any call, as other threads of a program do.
double compute() {
    std::vector<Array> arrays;
    for (const double value : {1.0, 2.0, 3.0}) {
        arrays.push_back(Array::scalar(value));
        arrays.push_back(Array::text("text"));
    }
    double sum = 0;
    for (const Array &array : arrays) {
        sum += array.classID() == tsDOUBLE ? array.number() : static_cast<double>(array.size());
    }
    return sum;
}

/// The threads, the time they have, and what they count and find wrong.
class Run {
  public:
    Run(Scene &shared, std::chrono::duration<double> time)
        : scene(shared), limit(time),
          actions(std::span(allActions).first(allActions.size() - (scene.guarded ? 0U : 1U))) {}

    /// True if nothing was wrong and each action was done.
    bool finish() {
        std::vector<std::thread> threads;
        for (std::size_t number = 0; number < workers; ++number) {
            threads.emplace_back([this, number] { guarded([&] { work(number); }); });
        }
        for (std::size_t number = 0; number < computers; ++number) {
            threads.emplace_back([this] { guarded([&] { computeUntilDone(); }); });
        }
        std::this_thread::sleep_for(limit);
        done = true;
        for (std::thread &thread : threads) {
            thread.join();
        }
        for (const std::string &fault : faults) {
            std::printf("fault: %s\n", fault.c_str());
        }
        bool all = computed > 0;
        for (std::size_t i = 0; i < actions.size(); ++i) {
            std::printf("%-14s %10zu times\n", actions[i].name, counts[i].load());
            all = all && counts[i] > 0;
        }
        std::printf("%-14s %10zu times\n", "compute", computed.load());
        return all && faults.empty();
    }

  private:
    template <class Body>
    void guarded(const Body &body) {
        try {
            body();
        } catch (const std::exception &error) {
            const std::lock_guard lock(mutex);
            faults.emplace_back(error.what());
        }
    }

    void work(std::size_t number) {
        Worker worker{scene, number};
        while (!done) {
            const std::size_t chosen = worker.below(actions.size());
            actions[chosen].run(worker);
            ++counts[chosen];
        }
    }

    void computeUntilDone() {
        while (!done) {
            want(compute() == 18, "computed another sum");
            ++computed;
        }
    }

    Scene &scene;
    std::chrono::duration<double> limit;
    std::span<const Action> actions;
    std::atomic<bool> done = false;
    std::array<std::atomic<std::size_t>, allActions.size()> counts{};
    std::atomic<std::size_t> computed = 0;
    std::mutex mutex;
    std::vector<std::string> faults;
};

/// No dataset is open: each id that was ever handed out is a bad one.
void wantAllClosed(Scene &scene) {
    want(!scene.ids.all().empty(), "no dataset was opened");
    for (const double id : scene.ids.all()) {
        wantError("TESSEL:netcdf:inq:notNetcdfID", [&] { scene.netcdf("inq", id); });
    }
}

bool stress(bool guarded, double seconds) {
    Scene scene(guarded);
    constexpr std::string_view claims("CDF\1\0\0\0\0\0\0\0\x0A\x7F\xFF\xFF\xFF", 16);
    std::ofstream(scene.claimingFile, std::ios::binary) << claims;
    const std::size_t before = tessel::test::openDescriptors();
    const double made = scene.create(scene.commonFile, rows);
    scene.fill(made, rows, 0);
    scene.netcdf("close", made);
    scene.readId = scene.open(scene.commonFile);
    scene.writeId = scene.create(scene.folder.file("written.nc"), workers);
    scene.fill(scene.writeId, workers, 0);

    const bool good = Run(scene, std::chrono::duration<double>(seconds)).finish();

    scene.netcdf("close", scene.writeId);
    scene.netcdf("close", scene.readId);
    wantAllClosed(scene);
    want(tessel::test::openDescriptors() == before, "descriptors are open that were not");
    return good;
}

} // namespace

int main(int argc, char **argv) try {
    const bool guarded = argc > 1 && std::string_view(argv[1]) == "--guard";
    const int seconds = guarded ? 2 : 1;
    return stress(guarded, argc > seconds ? std::stod(argv[seconds]) : 5) ? 0 : 1;
} catch (const std::exception &error) {
    std::printf("fault: %s\n", error.what());
    return 1;
}
