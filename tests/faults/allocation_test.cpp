// tests/faults/allocation_test.cpp: every row of the conformance tests with each `operator new` of
// its call failing in turn: the ones of the module, of the host and of the guard.
//
// The operators are those of failing_new.cpp, and count and fail within calls only. (That the
// host's blocks and arrays fail in turn is part of the conformance tests themselves.)
#include "support/at_rest.hpp"
#include "support/conformance.hpp"
#include "support/failing_new.hpp"
#include "support/operations.hpp"
#include "support/text.hpp"
#include "tessel/netcdf_guard.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <map>
#include <set>

namespace tessel::test {
namespace {

/// The datasets that are open: the library numbers them from 1 on, in the upper half of an int.
std::vector<int> openDatasets() {
    std::vector<int> open;
    for (int number = 1; number < 16; ++number) {
        const int ncid = number << 16;
        if (nc_inq_format(ncid, nullptr) == NC_NOERR) {
            open.push_back(ncid);
        }
    }
    return open;
}

/// Who sees a call before the module.
enum class Watched { byNobody, byTheGuard };

/// What came of a call.
struct Seen {
    std::string outcome; ///< an identifier, or "results"
    std::string changes;
    bool failed = false; ///< an allocation was made to fail
    long left = 0;       ///< allocations that are there since the call, beside its results
};

Seen run(const Module &module, const Row &row, std::size_t n) {
    static std::map<On, Lines> untouched;
    if (!untouched.contains(row.on)) {
        untouched[row.on] = Scene(row.on).describe();
    }
    Scene scene(row.on);
    std::vector<Array> arguments;
    std::vector<const tsArray *> inputs;
    for (const Value &value : row.call) {
        arguments.push_back(value.make(scene));
        inputs.push_back(arguments.back().get());
    }
    const std::vector<int> before = openDatasets();
    Seen seen;
    std::string identifier = "results";
    identifier.reserve(200);
    const long alive = allocationsAlive();
    try {
        const Failing failing(n);
        const Results results = module.call(inputs);
    } catch (const Error &error) {
        identifier = error.identifier();
    }
    seen.left = allocationsAlive() - alive;
    seen.failed = Failing::met();
    seen.outcome = identifier;
    EXPECT_EQ(module("inq_libvers").size(), 1U) << "the next call does not work";
    std::vector<int> opened;
    for (const int ncid : openDatasets()) {
        if (std::find(before.begin(), before.end(), ncid) == before.end()) {
            opened.push_back(ncid);
        }
    }
    scene.addOpened(opened);
    seen.changes = joined(changes(untouched[row.on], scene.describe()));
    return seen;
}

/// The operations for which an allocation has failed, by their short names.
std::set<std::string> &operationsSeen() {
    static std::set<std::string> seen;
    return seen;
}

/// When all rows were run, none of the operations was without a failure.
class EveryOperation : public testing::Environment {
  public:
    void TearDown() override {
        if (GTEST_FLAG_GET(filter) != "*") {
            return;
        }
        for (const ListedOperation &operation : operations) {
            EXPECT_TRUE(operationsSeen().contains(operation.shortName)) << operation.shortName;
        }
    }
};
const testing::Environment *const everyOperation =
    testing::AddGlobalTestEnvironment(new EveryOperation);

std::string operationOf(const Row &row) {
    const Array first = row.call.empty() ? Array::scalar(0) : row.call[0].make(Scene(On::nothing));
    std::string name = first.classID() == tsCHAR ? first.utf8() : std::string();
    std::transform(name.begin(), name.end(), name.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return name.starts_with("nc_") ? name.substr(3) : name;
}

/// Runs a row with the n-th allocation failing; false if there is none.
bool failOne(const Module &module, const Row &row, Watched watched, std::size_t n,
             const Seen &undisturbed) {
    const Seen seen = run(module, row, n);
    if (!seen.failed) {
        EXPECT_EQ(seen.outcome, undisturbed.outcome);
        return false;
    }
    EXPECT_EQ(seen.outcome, "TESSEL:host:outOfMemory");
    EXPECT_TRUE(seen.changes.empty() || seen.changes == undisturbed.changes) << seen.changes;
    if (watched == Watched::byNobody) { // the guard keeps what it knows of datasets
        EXPECT_EQ(seen.left, 0) << "allocations are left behind";
    }
    return true;
}

void failEach(const Module &module, const Row &row, Watched watched) {
    run(module, row, 0); // what is made once for all calls is there from now on
    const Seen undisturbed = run(module, row, 0);
    const long alive = aliveAtRest(module);
    std::size_t failures = 0;
    for (bool failed = true; failed; failures += failed ? 1U : 0U) {
        SCOPED_TRACE("allocation " + shown(failures + 1) + " fails");
        failed = failOne(module, row, watched, failures + 1, undisturbed);
    }
    EXPECT_EQ(aliveAtRest(module) - alive, 0) << "allocations are left when all is closed";
    if (failures > 0) {
        operationsSeen().insert(operationOf(row));
    }
}

} // namespace

TEST_P(Conformance, WithoutMemory) {
    const Row &row = GetParam();
    if (!row.interference.function.empty()) {
        return; // the library would not be asked
    }
    {
        SCOPED_TRACE("the module alone");
        failEach(netcdf(), row, Watched::byNobody);
    }
    {
        SCOPED_TRACE("with the guard");
        static const Module guarded = netcdf().watchedBy(netcdfGuard());
        failEach(guarded, row, Watched::byTheGuard);
    }
}

} // namespace tessel::test
