// tests/support/row.hpp: what a call of the module is to do, as a row that a person can read.
#pragma once

#include "support/scene.hpp"
#include "support/value.hpp"

#include <string>
#include <vector>

namespace tessel::test {

using Lines = std::vector<std::string>;

/// How a call is to end.
struct Outcome {
    enum class Kind {
        gives,   ///< results in the first slots, and nothing in the others
        fails,   ///< an error, after the library was asked
        refuses, ///< an error before the library was asked anything
    };
    Kind kind;
    std::string identifier;
    std::string message;
    Values results;
};

Outcome gives(Values results);
Outcome givesNothing();
Outcome fails(std::string identifier, std::string message);
Outcome refuses(std::string identifier, std::string message);

/// The message of most failures of the library: what could not be done, and the library's text.
std::string libraryFailed(const std::string &what, const std::string &why);

/// What stands between the module and the library or the host in a row.
struct Interference {
    std::string function;   ///< a library function that is not asked: it answers `status`
    int status = 0;         //
    int textDenied = 0;     ///< the n-th tsArrayToString answers NULL
    bool isNumeric = false; ///< tsIsNumeric answers true whatever the class
    bool noBytes = false;   ///< tsCalloc answers a request for no bytes with NULL
    bool noData = false;    ///< tsGetData answers NULL for an array without elements
};

/// The library function answers the status and is not asked.
Interference answering(std::string function, int status);

/// The host gives NULL where the empty needs no memory, as a host may.
Interference nullForNothing();

/// One call, and all that is to come of it.
struct Row {
    std::string title;
    On on;       ///< what is there before
    Values call; ///< the operation's name and its arguments
    Outcome outcome;
    Lines changes = {}; ///< what is different afterwards, as test::changes() tells it
    Lines asks = {};    ///< all that is asked of the library and the host (Probe::trace); none: any
    Interference interference = {};
};

using Rows = std::vector<Row>;

/// The rows of several lists.
Rows together(std::vector<Rows> lists);

/// Runs the row: as it is; again with the n-th allocation failing for every n there is; and by a
/// host that has no memory for what is empty. Reports by way of GoogleTest.
void check(const Row &row);

} // namespace tessel::test
