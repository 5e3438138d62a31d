// tests/difference/run.cpp: running a program on one side, and comparing the two.
#include "run.hpp"

#include "operations.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cstring>
#include <fstream>
#include <iterator>
#include <sstream>
#include <stdexcept>

namespace difference {
namespace {

namespace fs = std::filesystem;

/// No dataset ever has this id.
constexpr int noDataset = 7;

fs::path pathOf(const fs::path &folder, std::size_t slot) {
    return folder / (std::to_string(slot) + ".nc");
}

/// Whether a variable's fill value is something else than one value of its type. A close in define
/// mode then fails, and the library neither closes the dataset nor survives another attempt.
bool hasBadFillValue(int ncid) {
    int nvars = 0;
    nc_inq_nvars(ncid, &nvars);
    for (int varid = 0; varid < nvars; ++varid) {
        nc_type variable = NC_NAT;
        nc_type attribute = NC_NAT;
        std::size_t length = 0;
        nc_inq_vartype(ncid, varid, &variable);
        const int status = nc_inq_att(ncid, varid, "_FillValue", &attribute, &length);
        if (status == NC_NOERR && (attribute != variable || length != 1)) {
            return true;
        }
    }
    return false;
}

/// The datasets of a run, so that values can name them and that all are closed in the end. Ids are
/// given out from the lowest on, and both runs begin with none, so that they are the same in both.
class Datasets {
  public:
    Datasets() { nc_set_default_format(NC_FORMAT_CLASSIC, &formatBefore); }
    ~Datasets() { nc_set_default_format(formatBefore, nullptr); }
    Datasets(const Datasets &) = delete;
    Datasets &operator=(const Datasets &) = delete;

    /// The id that a slot's file was opened with last.
    [[nodiscard]] int id(std::size_t slot) const { return ids.at(slot); }

    /// Ends the dataset that a step is about to close, if it cannot be closed.
    void prepare(const Step &step) {
        const auto at = ended(step);
        if (at != open.end() && hasBadFillValue(*at)) {
            nc_abort(*at);
            open.erase(at);
        }
    }

    /// Learns from a step what is open, once it was run.
    void follow(const Step &step, const Outcome &outcome) {
        if (!outcome.identifier.empty()) {
            if (ended(step) != open.end() && step.inputs.size() == 1) {
                throw LeftOpen(outcome.identifier);
            }
        } else if (isOpening(step) && !outcome.results.empty()) {
            double id = 0.0; // the last result
            const std::vector<unsigned char> &bytes = outcome.results.back().bytes;
            std::memcpy(&id, bytes.data(), std::min(sizeof(id), bytes.size()));
            open.push_back(static_cast<int>(id));
            ids.at(step.inputs[0].slot) = open.back();
        } else if (const auto at = ended(step); at != open.end()) {
            open.erase(at);
        }
    }

    void closeAll() {
        for (const int ncid : open) {
            const int status = hasBadFillValue(ncid) ? nc_abort(ncid) : nc_close(ncid);
            if (status != NC_NOERR) {
                throw LeftOpen(nc_strerror(status));
            }
        }
    }

  private:
    static bool isOpening(const Step &step) {
        const Operation *const operation = findOperation(step.operation);
        return operation != nullptr &&
               (operation->verb == Verb::create || operation->verb == Verb::createTuned ||
                operation->verb == Verb::open || operation->verb == Verb::openTuned);
    }

    /// The open dataset that a step closes, if it succeeds.
    std::vector<int>::iterator ended(const Step &step) {
        const Operation *const operation = findOperation(step.operation);
        const bool ends = operation != nullptr && !step.inputs.empty() &&
                          (operation->verb == Verb::close || operation->verb == Verb::abort) &&
                          step.inputs[0].kind == Value::Kind::dataset;
        return ends ? std::find(open.begin(), open.end(), id(step.inputs[0].slot)) : open.end();
    }

    std::array<int, fileCount> ids = {noDataset, noDataset, noDataset, noDataset};
    std::vector<int> open;
    int formatBefore = NC_FORMAT_CLASSIC;
};

Value resolve(const Value &value, const fs::path &folder, const Datasets &datasets) {
    switch (value.kind) {
    case Value::Kind::file:
        return text(pathOf(folder, value.slot).string());
    case Value::Kind::dataset:
        return num(datasets.id(value.slot));
    default:
        return value;
    }
}

std::optional<std::string> contentOf(const fs::path &path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        return std::nullopt;
    }
    std::ostringstream content;
    content << in.rdbuf();
    return content.str();
}

std::string said(const Outcome &outcome) {
    return outcome.identifier.empty() ? "success"
                                      : outcome.identifier + " \"" + outcome.message + "\"";
}

std::string shape(const Result &result) {
    std::ostringstream out;
    out << "class " << result.classID << ',';
    for (const std::size_t n : result.dims) {
        out << ' ' << n;
    }
    out << ':' << std::hex;
    for (const unsigned char byte : result.bytes) {
        out << ' ' << +byte;
    }
    return out.str();
}

std::optional<std::string> differenceOf(const Outcome &module, const Outcome &library) {
    if (module.identifier != library.identifier ||
        module.message.find(library.message) == std::string::npos) {
        return "module: " + said(module) + "\nlibrary: " + said(library);
    }
    if (module.results.size() != library.results.size()) {
        return "module: " + std::to_string(module.results.size()) +
               " results\nlibrary: " + std::to_string(library.results.size());
    }
    for (std::size_t i = 0; i < module.results.size(); ++i) {
        if (module.results[i] != library.results[i]) {
            return "result " + std::to_string(i) + "\nmodule: " + shape(module.results[i]) +
                   "\nlibrary: " + shape(library.results[i]);
        }
    }
    return std::nullopt;
}

std::string describe(const std::optional<std::string> &content) {
    return content ? std::to_string(content->size()) + " bytes" : "no file";
}

} // namespace

Trace run(const Program &program, const Side &side, const fs::path &folder) {
    for (std::size_t slot = 0; slot < fileCount; ++slot) {
        fs::remove(pathOf(folder, slot));
    }
    std::ofstream(pathOf(folder, foreignFile)) << foreignContent;

    Trace trace;
    Datasets datasets;
    for (const Step &step : program) {
        Step resolved{step.operation, {}};
        std::transform(step.inputs.begin(), step.inputs.end(), std::back_inserter(resolved.inputs),
                       [&](const Value &value) { return resolve(value, folder, datasets); });
        datasets.prepare(step);
        trace.outcomes.push_back(side(resolved));
        datasets.follow(step, trace.outcomes.back());
    }
    datasets.closeAll();
    for (std::size_t slot = 0; slot < fileCount; ++slot) {
        trace.files.at(slot) = contentOf(pathOf(folder, slot));
    }
    return trace;
}

std::optional<std::string> firstDifference(const Program &program, const Trace &module,
                                           const Trace &library) {
    for (std::size_t i = 0; i < program.size(); ++i) {
        if (const auto found = differenceOf(module.outcomes[i], library.outcomes[i])) {
            std::ostringstream out;
            out << "step " << i << ", " << program[i] << ":\n" << *found;
            return out.str();
        }
    }
    for (std::size_t slot = 0; slot < fileCount; ++slot) {
        const auto &ours = module.files.at(slot);
        const auto &theirs = library.files.at(slot);
        if (ours != theirs) {
            std::string where;
            if (ours && theirs) {
                const auto at =
                    std::mismatch(ours->begin(), ours->end(), theirs->begin(), theirs->end());
                where = ", first at byte " + std::to_string(at.first - ours->begin());
            }
            return "file(" + std::to_string(slot) + ") differs" + where +
                   "\nmodule: " + describe(ours) + "\nlibrary: " + describe(theirs);
        }
    }
    return std::nullopt;
}

} // namespace difference
