// tests/conformance/inner_functions.cpp: what no call through the table reaches.
//
// The module's own functions are called here, in a call of the host: guards against rows that the
// table does not have, arrays larger than any memory, and the packers by themselves.
#include "support/conformance.hpp"
#include "support/in_call.hpp"
#include "support/operations.hpp"
#include "support/text.hpp"

#include "call/status.hpp"
#include "convert/index_vector.hpp"
#include "convert/pack.hpp"
#include "convert/scalar.hpp"
#include "convert/text.hpp"
#include "convert/write_data.hpp"
#include "gateway/lookup.hpp"
#include "gateway/operation_table.hpp"
#include "tessel/extension.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <limits>
#include <memory>
#include <random>
#include <vector>

namespace tessel::test {
namespace {

using netcdf::OperationEntry;
using netcdf::OperationHandler;
using netcdf::operationTable;

/// The error that ends the body, as "identifier: message"; empty where there is none.
std::string errorOf(const Body &body) {
    try {
        inCall(body);
    } catch (const Error &error) {
        return error.identifier() + ": " + error.message();
    }
    return {};
}

/// The array that the function makes.
std::string made(const std::function<tsArray *()> &make) {
    return shown(inCall([&](tsArray *plhs[]) { plhs[0] = make(); })[0]);
}

TEST(Table, HasTheListedRows) {
    ASSERT_EQ(operationTable.size(), operations.size());
    for (std::size_t i = 0; i < operations.size(); ++i) {
        EXPECT_EQ(operationTable[i].id, operations[i].id);
        EXPECT_STREQ(operationTable[i].longName, operations[i].longName);
        EXPECT_STREQ(operationTable[i].shortName, operations[i].shortName);
    }
}

/// The row that a walk through the listed rows finds, in stored order, long name before short name;
/// the number of rows where it finds none.
std::size_t walk(const std::string &name) {
    std::size_t row = 0;
    while (row < operations.size() && name != operations[row].longName &&
           name != operations[row].shortName) {
        ++row;
    }
    return row;
}

std::string lowered(std::string name) {
    std::transform(name.begin(), name.end(), name.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return name;
}

void expectAsByWalk(const std::string &typed) {
    SCOPED_TRACE(typed);
    const std::string name = lowered(typed);
    const std::size_t row = walk(name);
    const OperationEntry *found = nullptr;
    std::string text = typed;
    const std::string error =
        errorOf([&](tsArray **) { found = netcdf::findOperation(text.data()); });
    EXPECT_EQ(text, name) << "it is to be lower-cased in place";
    if (row < operations.size()) {
        EXPECT_EQ(found, &operationTable[row]);
    } else {
        EXPECT_EQ(found, nullptr);
        EXPECT_EQ(error,
                  "TESSEL:netcdf:InvalidOperation: Unrecognized operation:  \"" + name + "\"");
    }
}

/// Every name in several cases, and all that is near a name: with a character left out, doubled or
/// changed, and with the prefix put before it.
TEST(Lookup, IsAWalkThroughTheTable) {
    for (const ListedOperation &operation : operations) {
        for (const std::string name : {operation.longName, operation.shortName}) {
            std::string upper = name;
            std::transform(name.begin(), name.end(), upper.begin(),
                           [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
            expectAsByWalk(name);
            expectAsByWalk(upper);
            expectAsByWalk("nc_" + name);
            for (std::size_t i = 0; i < name.size(); ++i) {
                expectAsByWalk(name.substr(0, i) + name.substr(i + 1));
                expectAsByWalk(name.substr(0, i) + name[i] + name.substr(i));
                expectAsByWalk(name.substr(0, i) + 'z' + name.substr(i + 1));
                expectAsByWalk(name.substr(0, i) + upper.substr(i));
            }
        }
    }
    expectAsByWalk("");
    expectAsByWalk("\xC3\x96");
}

/// Any values of Unit, the same in each run.
template <class Unit>
std::vector<Unit> anyValues(std::size_t count) {
    std::mt19937 engine(1);
    std::vector<Unit> values(count);
    std::generate(values.begin(), values.end(), [&] { return static_cast<Unit>(engine()); });
    return values;
}

/// Copies of all lengths around those at which another way of copying begins or ends, from and to
/// wherever a vector may stand; nothing beside them is written.
template <class From, class To, class Copy, class Each>
void expectCopies(const Copy &copy, const Each &each) {
    constexpr std::size_t large = std::size_t{1} << 20U;
    constexpr std::size_t room = 40;
    constexpr To untouched = 0x5A;
    const std::vector<From> from = anyValues<From>(large + 2 * room);
    std::vector<To> to(from.size() + 2 * room, untouched);
    for (const std::size_t length : {std::size_t{0}, large - room, large}) {
        for (std::size_t more = 0; more < room; ++more) {
            // A vector has 16 bytes: both sides stand at each place in one, and at different ones.
            const std::size_t first = more % 17;
            const std::size_t place = room + more % 16;
            const std::size_t count = length + more;
            copy(from.data() + first, count, to.data() + place);
            std::size_t wrong = 0;
            for (std::size_t i = 0; i < to.size(); ++i) {
                const bool copied = i >= place && i - place < count;
                const To expected = copied ? each(from[first + i - place]) : untouched;
                wrong += to[i] == expected ? 0U : 1U;
            }
            ASSERT_EQ(wrong, 0U) << count << " from " << first << " to " << place;
            std::fill(to.begin(), to.end(), untouched);
        }
    }
}

TEST(Text, IsWidenedWithItsSignWhateverItsLengthAndPlace) {
    expectCopies<char, tsChar>(netcdf::widen, [](char byte) {
        const int code = static_cast<unsigned char>(byte);
        return static_cast<tsChar>(code < 0x80 ? code : code + 0xFF00);
    });
}

TEST(Text, IsNarrowedToItsLowBytesWhateverItsLengthAndPlace) {
    expectCopies<tsChar, char>(netcdf::narrow, [](tsChar character) {
        return static_cast<char>(static_cast<unsigned char>(character % 0x100));
    });
}

/// Fewer than no inputs are too few as well.
TEST(Gateway, CountsWithSign) {
    for (const int count : {0, -1, std::numeric_limits<int>::min()}) {
        EXPECT_EQ(errorOf([&](tsArray *plhs[]) { tsxFunction(0, plhs, count, nullptr); }),
                  "TESSEL:netcdf:tooFewArguments: Must provide at least one input argument.");
    }
}

TEST(Status, OfSuccessAndOfWhatHasNoWord) {
    for (const int status : {0, -2, -20, -32, -65, 11, 15, 26, 36, 100}) {
        EXPECT_EQ(netcdf::statusIdentifier(status), "unknownErrorStatus") << status;
    }
    EXPECT_EQ(netcdf::statusIdentifier(std::numeric_limits<int>::min()), "unknownErrorStatus");
    EXPECT_EQ(netcdf::statusIdentifier(std::numeric_limits<int>::max()), "unknownErrorStatus");
    EXPECT_EQ(netcdf::statusIdentifier(-1), "v2ApiError");
    EXPECT_EQ(netcdf::statusIdentifier(22), netcdf::statusIdentifier(-36));
    EXPECT_EQ(netcdf::statusIdentifier(34), netcdf::statusIdentifier(-60));
}

/// A handler, arguments with which it gets as far as to its member, and what it says of an entry
/// that is not of its family.
struct Guard {
    std::string name;
    OperationHandler *handler;
    Values arguments;
    std::vector<int> foreignIDs;
    std::string error;
};

std::vector<Guard> guards() {
    const Value zeros = doubles({0, 0, 0});
    const Value ones = doubles({1, 1, 1});
    const Value one = 1;
    constexpr int largest = std::numeric_limits<int>::max();
    // clang-format off
    return {
        {"get_att",      netcdf::readAttHandler,  {ncid, 1, "fives"},           {-1, 10, 18, 102, largest}, "getAtt:unhandledOperation: \"some_name\" is not a recognized operation."},
        {"get_var",      netcdf::readVarHandler,  {ncid, 1},                    {-1, 17, 25, 103, largest}, "getVar:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"get_var1",     netcdf::readVar1Handler, {ncid, 1, zeros},             {-1, 24, 32, 103, largest}, "getVar1:unrecognizedOperation: Unrecognized operation:  \"some_name\""},
        {"get_vara",     netcdf::readVaraHandler, {ncid, 1, zeros, ones},       {-1, 31, 39, 103, largest}, "getVara:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"get_vars",     netcdf::readVarsHandler, {ncid, 1, zeros, ones, ones}, {-1, 38, 46, 103, largest}, "getVars:unhandledOperation: Unhandled operation:  \"some_name\""},
        // A write checks its data first, and so a foreign id has to be that of another write, whose
        // class the data are of: 66 and the like are the doubles, 65 and the like the text.
        {"put_att",      netcdf::writeAttHandler,  {ncid, -1, "a", 6, one},           {66, 73, 87},     "putAtt:unhandledOperation: Unrecognized operation:  \"some_name\""},
        {"put_att text", netcdf::writeAttHandler,  {ncid, -1, "a", 6, "x"},           {65, 72, 93},     "putAtt:unhandledOperation: Unrecognized operation:  \"some_name\""},
        {"put_var",      netcdf::writeVarHandler,  {ncid, 0, one},                    {59, 73, 80, 87}, "putVar:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_var text", netcdf::writeVarHandler,  {ncid, 0, "x"},                    {65, 79, 86, 93}, "putVar:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_var1",     netcdf::writeVar1Handler, {ncid, 1, zeros, one},             {59, 66, 73, 80}, "putVar1:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_var1 text", netcdf::writeVar1Handler, {ncid, 1, zeros, "x"},            {65, 72, 79, 86}, "putVar1:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_vara",     netcdf::writeVaraHandler, {ncid, 1, zeros, ones, one},       {59, 66, 80, 87}, "putVara:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_vara text", netcdf::writeVaraHandler, {ncid, 1, zeros, ones, "x"},      {65, 72, 86, 93}, "putVara:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_vars",     netcdf::writeVarsHandler, {ncid, 1, zeros, ones, ones, one}, {59, 66, 73, 87}, "putVars:unhandledOperation: Unhandled operation:  \"some_name\""},
        {"put_vars text", netcdf::writeVarsHandler, {ncid, 1, zeros, ones, ones, "x"}, {65, 72, 79, 93}, "putVars:unhandledOperation: Unhandled operation:  \"some_name\""},
        // And one that is of no write at all does not get beyond that check.
        {"put_att of no write",      netcdf::writeAttHandler,     {ncid, -1, "a", 6, one},           {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
        {"put_att_text of no write", netcdf::writeAttTextHandler, {ncid, -1, "a", "x"},              {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
        {"put_var of no write",      netcdf::writeVarHandler,     {ncid, 0, one},                    {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
        {"put_var1 of no write",     netcdf::writeVar1Handler,    {ncid, 1, zeros, one},             {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
        {"put_vara of no write",     netcdf::writeVaraHandler,    {ncid, 1, zeros, ones, one},       {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
        {"put_vars of no write",     netcdf::writeVarsHandler,    {ncid, 1, zeros, ones, ones, one}, {-1, 58, 94, largest}, "validate_write_op_datatype:unhandledFuncstr: Unhandled operation:  \"some_name\""},
    };
    // clang-format on
}

TEST(Guards, AgainstForeignEntries) {
    const Scene scene(On::sample);
    for (const Guard &guard : guards()) {
        SCOPED_TRACE(guard.name);
        Values call = guard.arguments;
        call.insert(call.begin(), "some_name");
        std::vector<Array> arguments;
        std::vector<const tsArray *> inputs;
        for (const Value &value : call) {
            arguments.push_back(value.make(scene));
            inputs.push_back(arguments.back().get());
        }
        for (const int id : guard.foreignIDs) {
            const OperationEntry entry = {id, "nc_some_name", "some_name", guard.handler};
            const std::string error = errorOf([&](tsArray *plhs[]) {
                guard.handler(1, plhs, static_cast<int>(inputs.size()), inputs.data(), &entry);
            });
            EXPECT_EQ(error, "TESSEL:netcdf:" + guard.error) << id;
        }
    }
    EXPECT_EQ(joined(scene.describe()), joined(Scene(On::sample).describe()));
}

/// Attributes, ids 59 to 65, are the ones that may be written without data.
TEST(WriteData, NoneForAnythingButAttributes) {
    const Array none = empty(tsCELL).make(Scene(On::nothing));
    const std::string refused = "TESSEL:netcdf:emptyVariableData: Variable data must not be empty.";
    const auto validated = [&](int id) {
        const OperationEntry entry = {id, "nc_some_name", "some_name", nullptr};
        return errorOf([&](tsArray **) { netcdf::validate_write_op_datatype(none.get(), &entry); });
    };
    for (const int id : {-1, 0, 58, 66, 93, 94, 103}) {
        EXPECT_EQ(validated(id), refused) << id;
    }
    EXPECT_EQ(validated(59), "TESSEL:netcdf:some_name:badDatatype: The input datatype for "
                             "some_name must be double precision, not cell.");
    EXPECT_EQ(validated(65), "TESSEL:netcdf:some_name:badDatatype: The input datatype for "
                             "some_name must be char, not cell.");
}

TEST(WriteData, NoBufferForNoText) {
    const Array none = Array::text("");
    const OperationEntry entry = {65, "nc_put_att_text", "put_att_text", nullptr};
    CallReport report;
    CallOptions options;
    options.report = &report;
    inCall(
        [&](tsArray **) { EXPECT_EQ(netcdf::make_text_write_buffer(none.get(), &entry), nullptr); },
        options);
    EXPECT_EQ(report.allocations, 0U);
}

/// An array that says it has so many elements; none of them is looked at.
Array claiming(tsClassID classID, std::size_t elements) {
    static double first = 0.0;
    const std::array<std::size_t, 2> dims = {elements, 1};
    return Array::borrowed(classID, dims, &first, nullptr);
}

TEST(DimensionLists, TooLongToCount) {
    constexpr auto most = static_cast<std::size_t>(std::numeric_limits<int>::max());
    const std::string uncountable = "TESSEL:netcdf:unpackDimids:numberOfDimensionsOutOfBounds: "
                                    "The number of dimensions is out of bounds.";
    const auto unpacked = [](const Array &list) {
        return errorOf([&](tsArray **) {
            std::vector<int> dimids;
            netcdf::unpackDimids(list.get(), dimids);
        });
    };
    EXPECT_EQ(unpacked(claiming(tsDOUBLE, most)), "TESSEL:netcdf:ndimsLargerThanNetcdfLimits: "
                                                  "Cannot specify more than 1024 dimensions.");
    EXPECT_EQ(unpacked(claiming(tsDOUBLE, most + 1)), uncountable);
    EXPECT_EQ(unpacked(claiming(tsDOUBLE, 2 * most + 3)), uncountable);
    EXPECT_EQ(
        unpacked(claiming(tsINT32, most + 1)),
        "TESSEL:netcdf:unpackDimids:badDimidsType: Dimids argument must be double precision.");
}

/// What was in the vector before is of no matter.
TEST(IndexVectors, AreOverwritten) {
    netcdf::IndexVector index = {7, 7, 7, 7, 7};
    netcdf::StrideVector stride = {-7, -7, -7};
    inCall([&](tsArray **) {
        netcdf::unpackIndexVector(Array::row({1, 2}).get(), "start", index);
        netcdf::unpackStrideVector(Array::row({1, -2, 3, 4}).get(), "stride", stride);
    });
    EXPECT_EQ(index, (netcdf::IndexVector{2, 1}));
    EXPECT_EQ(stride, (netcdf::StrideVector{4, 3, -2, 1}));
    inCall([&](tsArray **) {
        netcdf::unpackIndexVector(Array::row({5, 6, 7}).get(), "start", index);
        netcdf::unpackStrideVector(Array::row({9}).get(), "stride", stride);
    });
    EXPECT_EQ(index, (netcdf::IndexVector{7, 6, 5}));
    EXPECT_EQ(stride, (netcdf::StrideVector{9}));
}

TEST(ModeNames, AreUpperCasedInPlace) {
    std::string name = "nc_NoClobber";
    EXPECT_EQ(netcdf::parseModeName(name.data()), 4);
    EXPECT_EQ(name, "NC_NOCLOBBER");
    std::string none;
    EXPECT_EQ(errorOf([&](tsArray **) { netcdf::parseModeName(none.data()); }),
              "TESSEL:netcdf:unrecognizedFileMode: Unknown parameter \"\".");
}

TEST(Packers, OfOneNumber) {
    EXPECT_EQ(made([] { return netcdf::packIntScalar(-7); }), "1x1 double [-7]");
    EXPECT_EQ(made([] { return netcdf::packUintScalar(4294967295U); }), "1x1 double [4294967295]");
    EXPECT_EQ(made([] { return netcdf::packUintScalar(0); }), "1x1 double [0]");
    EXPECT_EQ(made([] { return netcdf::packUpSizetScalar(9007199254740993U); }),
              "1x1 double [9007199254740992]");
    EXPECT_EQ(made([] { return netcdf::packUpSizetScalar(18446744073709551615U); }),
              "1x1 double [18446744073709551616]");
}

TEST(Packers, OfLists) {
    static constexpr std::array values = {3, -1, 2};
    EXPECT_EQ(made([] { return netcdf::packIntVector(values.data(), 3); }), "1x3 double [3 -1 2]");
    EXPECT_EQ(made([] { return netcdf::packIntVector(values.data(), 1); }), "1x1 double [3]");
    EXPECT_EQ(made([] { return netcdf::packIntVector(values.data(), 0); }), "1x0 double []");
    EXPECT_EQ(made([] {
                  return netcdf::packDimidVector(std::vector{3, -1, 2});
              }),
              "1x3 double [3 -1 2]");
    EXPECT_EQ(made([] { return netcdf::packDimidVector(std::vector{3}); }), "1x1 double [3]");
    EXPECT_EQ(made([] { return netcdf::packDimidVector({}); }), "0x0 double []");
}

} // namespace
} // namespace tessel::test
