// tests/difference/statistics.cpp: what was run, and whether it was enough.
#include "statistics.hpp"

#include "model.hpp"
#include "operations.hpp"

#include <algorithm>
#include <iomanip>
#include <ostream>

namespace difference {
namespace {

/// How many programs there may be for each time that an operation succeeded, was refused or failed.
constexpr std::size_t programsPerCase = 1000;

/// Enough programs meet at least so many different refusals and statuses.
constexpr std::size_t leastRefusals = 110;
constexpr std::size_t leastStatuses = 20;
constexpr std::size_t programsForAll = 10000;

/// Whether the library can have a status for it at all.
bool canFail(Verb verb) {
    return verb != Verb::constantNames && verb != Verb::inqLibvers && verb != Verb::parameter &&
           verb != Verb::strerror;
}

/// Whether there is an argument that the module refuses.
bool canBeRefused(Verb verb) {
    return verb != Verb::constantNames;
}

std::string formatOf(const std::string &content) {
    const std::string magic = content.substr(0, 4);
    return magic == std::string("CDF\1")   ? "classic"
           : magic == std::string("CDF\2") ? "64-bit offset"
                                           : "other";
}

} // namespace

void Statistics::add(const Program &program, const Trace &library) {
    ++programCount;
    byOperation.resize(operations().size() + 1);
    for (std::size_t i = 0; i < program.size(); ++i) {
        const Outcome &outcome = library.outcomes[i];
        const Operation *const operation = findOperation(program[i].operation);
        Tally &tally = operation == nullptr
                           ? byOperation.back()
                           : byOperation[static_cast<std::size_t>(operation - operations().data())];
        if (outcome.identifier.empty()) {
            ++tally.succeeded;
        } else if (outcome.status == 0) {
            ++tally.refused;
            ++refusals[outcome.identifier];
        } else {
            ++tally.failed;
            ++failures[wordOf(outcome.status)];
        }
        for (const Result &result : outcome.results) {
            resultBytes += result.bytes.size();
        }
    }
    for (const auto &content : library.files) {
        if (content && *content != foreignContent) {
            ++filesByFormat[formatOf(*content)];
            fileBytes += content->size();
        }
    }
}

std::vector<std::string> Statistics::complaints() const {
    std::vector<std::string> list;
    const std::size_t least = programCount / programsPerCase;
    const auto want = [&](std::size_t found, std::size_t wanted, const std::string &what) {
        if (found < wanted) {
            list.push_back(what + ": " + std::to_string(found) + ", wanted " +
                           std::to_string(wanted));
        }
    };
    for (std::size_t i = 0; i < operations().size(); ++i) {
        const Operation &operation = operations()[i];
        const Tally tally = i < byOperation.size() ? byOperation[i] : Tally{};
        want(tally.succeeded, least, operation.shortName + " succeeded");
        if (canBeRefused(operation.verb)) {
            want(tally.refused, least, operation.shortName + " refused");
        }
        if (canFail(operation.verb)) {
            want(tally.failed, least, operation.shortName + " failed");
        }
    }
    for (const char *format : {"classic", "64-bit offset"}) {
        const auto found = filesByFormat.find(format);
        want(found == filesByFormat.end() ? 0 : found->second, programCount / 5,
             std::string("files of format ") + format);
    }
    if (programCount >= programsForAll) {
        want(failures.size(), leastStatuses, "different statuses");
        want(refusals.size(), leastRefusals, "different refusals");
    }
    return list;
}

void Statistics::print(std::ostream &out) const {
    Tally all;
    for (const Tally &tally : byOperation) {
        all.succeeded += tally.succeeded;
        all.refused += tally.refused;
        all.failed += tally.failed;
    }
    out << programCount << " programs, " << all.steps() << " steps: " << all.succeeded
        << " succeeded, " << all.refused << " were refused (" << refusals.size()
        << " different identifiers), " << all.failed << " failed (" << failures.size()
        << " different statuses)\nresults of " << resultBytes << " bytes and files of " << fileBytes
        << " bytes were equal; files by format:";
    for (const auto &[format, count] : filesByFormat) {
        out << ' ' << format << ' ' << count << ';';
    }
    out << "\nstatuses:";
    for (const auto &[word, count] : failures) {
        out << ' ' << word << ' ' << count << ';';
    }
    out << '\n';
}

void Statistics::printOperations(std::ostream &out) const {
    for (std::size_t i = 0; i < byOperation.size(); ++i) {
        const Tally &tally = byOperation[i];
        out << std::setw(20) << (i < operations().size() ? operations()[i].shortName : "(none)")
            << std::setw(9) << tally.succeeded << std::setw(9) << tally.refused << std::setw(9)
            << tally.failed << '\n';
    }
}

} // namespace difference
