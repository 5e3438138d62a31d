// tests/support/row.cpp: running a row.
#include "support/row.hpp"

#include "support/conformance.hpp"
#include "support/probe.hpp"
#include "support/process.hpp"
#include "support/text.hpp"

#include <algorithm>
#include <array>
#include <cctype>
#include <filesystem>

namespace tessel::test {
namespace {

/// What came of a call.
struct Seen {
    std::string outcome;
    std::string expected; ///< the outcome that the row wants, with the scene's own ids
    Lines changes;
    Lines asks;
    CallReport report;
    bool effect = false;
};

std::string shownError(const std::string &identifier, const std::string &message) {
    return "error " + identifier + "\n      " + message;
}

/// Gives every slot up to the last that is filled.
template <class Arrays>
std::string shownResults(const Arrays &arrays) {
    std::string text = "results";
    for (std::size_t i = 0; i < arrays.size(); ++i) {
        text += (i == 0 ? " " : ", ") + (arrays[i] ? shown(arrays[i]) : "nothing");
    }
    return text;
}

std::string shownOutcome(const Outcome &outcome, const Scene &scene) {
    if (outcome.kind != Outcome::Kind::gives) {
        return shownError(outcome.identifier, outcome.message);
    }
    std::vector<Array> results;
    for (const Value &value : outcome.results) {
        results.push_back(value.make(scene));
    }
    return shownResults(results);
}

/// A description of the scene as it is when nothing was called, made once.
const Lines &untouched(On on) {
    static std::map<On, Lines> known;
    const auto found = known.find(on);
    return found != known.end() ? found->second : known[on] = Scene(on).describe();
}

void prepare(Probe &probe, const Interference &interference, const Scene &scene) {
    if (!interference.function.empty()) {
        probe.answer(interference.function, interference.status);
    }
    probe.denyText(interference.textDenied);
    if (interference.isNumeric) {
        probe.claimNumeric();
    }
    if (interference.noBytes) {
        probe.refuseNoBytes();
    }
    if (interference.noData) {
        probe.hideNoData();
    }
    probe.leaveOut(scene.path(""));
    if (scene.ncid() != -1) {
        probe.name(scene.ncid(), "ncid");
    }
    if (scene.otherNcid() != -1) {
        probe.name(scene.otherNcid(), "other");
    }
}

Seen run(const Row &row, const CallOptions &wanted) {
    Scene scene(row.on);
    std::vector<Array> arguments;
    std::vector<const tsArray *> inputs;
    for (const Value &value : row.call) {
        arguments.push_back(value.make(scene));
        inputs.push_back(arguments.back().get());
    }
    Seen seen;
    CallOptions options = wanted;
    options.report = &seen.report;
    {
        Probe probe;
        prepare(probe, row.interference, scene);
        for (std::size_t i = 0; i < arguments.size(); ++i) {
            if (const void *data = arguments[i].data()) {
                probe.name(data, "input " + shown(i));
            }
        }
        try {
            const Results results = netcdf().call(inputs, options);
            seen.outcome = shownResults(results);
            if (results.size() > 0 && results[0] && results[0].data() != nullptr) {
                probe.name(results[0].data(), "result");
            }
        } catch (const Error &error) {
            seen.outcome = shownError(error.identifier(), error.message());
        }
        seen.asks = probe.trace();
        seen.effect = probe.sawEffect();
        scene.addOpened(probe.opened());
    }
    EXPECT_EQ(netcdf()("inq_libvers").size(), 1U) << "the next call does not work";
    seen.expected = shownOutcome(row.outcome, scene);
    const Lines described = scene.describe();
    seen.changes = changes(untouched(row.on), described);
    return seen;
}

/// The one kind of allocation whose failure is reported to the module, which then has an error of
/// its own: the buffer of a text member. By the number of the allocation in the call: the
/// operation's name is the first, then come an attribute's name and an array for the result.
struct TextBuffer {
    const char *operation;
    std::size_t allocation;
    const char *message;
};
constexpr auto textBuffers = std::to_array<TextBuffer>({
    {"get_att_text", 3, "Failed to allocate memory for get_att_text read operation."},
    {"get_var_text", 3, "Failed to allocate memory for get_var_text read operation."},
    {"get_var1_text", 2, "Failed to allocate memory for get_var1_text read operation."},
    {"get_vara_text", 3, "Failed to allocate memory for get_vara_text read operation."},
    {"get_vars_text", 3, "Failed to allocate memory for get_vars_text read operation."},
    {"put_att_text", 3, "Failed to allocate memory for put_att_text write operation."},
    {"put_var_text", 2, "Failed to allocate memory for put_var_text write operation."},
    {"put_var1_text", 2, "Failed to allocate memory for put_var1_text write operation."},
    {"put_vara_text", 2, "Failed to allocate memory for put_vara_text write operation."},
    {"put_vars_text", 2, "Failed to allocate memory for put_vars_text write operation."},
});

/// The operation's short name; empty where the call names none.
std::string operationOf(const Row &row) {
    if (row.call.empty()) {
        return {};
    }
    const Array first = row.call[0].make(Scene(On::nothing));
    std::string name = first.classID() == tsCHAR ? first.utf8() : std::string();
    std::transform(name.begin(), name.end(), name.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return name.starts_with("nc_") ? name.substr(3) : name;
}

/// The outcome when the n-th allocation fails.
std::string outcomeWithout(std::size_t n, const Row &row, const Seen &undisturbed) {
    const std::string operation = operationOf(row);
    const auto *const buffer =
        std::find_if(textBuffers.begin(), textBuffers.end(), [&](const TextBuffer &one) {
            return operation == one.operation && n == one.allocation;
        });
    if (buffer == textBuffers.end()) {
        return shownError("TESSEL:host:outOfMemory", "Out of memory.");
    }
    const Lines &asks = undisturbed.asks;
    if (std::find(asks.begin(), asks.end(), "tsCalloc(0, 2)") != asks.end()) {
        return undisturbed.outcome; // of no bytes, none are missing
    }
    return shownError("TESSEL:netcdf:" + operation + ":memoryAllocationFailure", buffer->message);
}

bool asksLibrary(const Lines &asks) {
    return std::any_of(asks.begin(), asks.end(),
                       [](const std::string &ask) { return ask.starts_with("nc_"); });
}

void checkUndisturbed(const Row &row, const Seen &seen) {
    EXPECT_EQ(seen.outcome, seen.expected);
    EXPECT_EQ(joined(seen.changes), joined(row.changes));
    if (!row.asks.empty()) {
        EXPECT_EQ(joined(seen.asks), joined(row.asks));
    }
    if (row.outcome.kind == Outcome::Kind::gives) {
        EXPECT_EQ(seen.report.blocksLeft, 0U);
        EXPECT_EQ(seen.report.arraysLeft, 0U);
    } else {
        const bool mayAsk = row.outcome.kind == Outcome::Kind::fails;
        EXPECT_EQ(asksLibrary(seen.asks), mayAsk) << joined(seen.asks);
    }
}

} // namespace

Outcome gives(Values results) {
    return {Outcome::Kind::gives, {}, {}, std::move(results)};
}
Outcome givesNothing() {
    return gives({});
}
Outcome fails(std::string identifier, std::string message) {
    return {Outcome::Kind::fails, std::move(identifier), std::move(message), {}};
}
Outcome refuses(std::string identifier, std::string message) {
    return {Outcome::Kind::refuses, std::move(identifier), std::move(message), {}};
}

std::string libraryFailed(const std::string &what, const std::string &why) {
    return what + ", library error message \"" + why + "\"";
}

Interference answering(std::string function, int status) {
    Interference interference;
    interference.function = std::move(function);
    interference.status = status;
    return interference;
}

Interference nullForNothing() {
    Interference interference;
    interference.noBytes = true;
    interference.noData = true;
    return interference;
}

Rows together(std::vector<Rows> lists) {
    Rows all;
    for (Rows &list : lists) {
        all.insert(all.end(), std::make_move_iterator(list.begin()),
                   std::make_move_iterator(list.end()));
    }
    return all;
}

void check(const Row &row) {
    SCOPED_TRACE(row.title);
    untouched(row.on);
    const std::size_t descriptors = openDescriptors();

    const Seen undisturbed = run(row, {});
    checkUndisturbed(row, undisturbed);

    const std::size_t allocations = undisturbed.report.allocations;
    for (std::size_t n = 1; n <= allocations; ++n) {
        SCOPED_TRACE("allocation " + shown(n) + " fails");
        CallOptions options;
        options.failAllocation = n;
        const Seen seen = run(row, options);
        EXPECT_EQ(seen.outcome, outcomeWithout(n, row, undisturbed));
        EXPECT_EQ(joined(seen.changes), joined(seen.effect ? row.changes : Lines()));
    }
    {
        SCOPED_TRACE("no allocation fails, and no output is asked for");
        CallOptions options;
        options.failAllocation = allocations + 1;
        options.outputs = 0;
        checkUndisturbed(row, run(row, options));
    }
    {
        SCOPED_TRACE("the host has no memory for what is empty");
        Row sparing = row;
        sparing.interference.noBytes = true;
        sparing.interference.noData = true;
        sparing.asks = {}; // an empty array's memory is shown as NULL in them
        checkUndisturbed(sparing, run(sparing, {}));
    }

    EXPECT_EQ(openDescriptors(), descriptors) << "a file is still open";
}

} // namespace tessel::test
