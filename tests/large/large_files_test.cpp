// tests/large/large_files_test.cpp: files beyond 4 GiB, and variables of more elements than 31 and
// 32 bits count, in every family and member. What was written is looked for in the bytes of the
// file.
#include "support/process.hpp"
#include "tessel/runtime.hpp"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <netcdf.h>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <fstream>
#include <limits>
#include <ostream>
#include <string>
#include <vector>

namespace tessel::test {
namespace {

using Values = std::vector<int>;

const Module &netcdf() {
    static const Module module(TESSEL_NETCDF_MODULE);
    return module;
}

/// A member of the families, and how the file has its values.
struct Member {
    const char *suffix;
    tsClassID hostClass;
    nc_type external;
    std::size_t size; ///< of a value in the file
};

constexpr std::array members = {
    Member{"double", tsDOUBLE, NC_DOUBLE, 8}, Member{"float", tsSINGLE, NC_FLOAT, 4},
    Member{"int", tsINT32, NC_INT, 4},        Member{"short", tsINT16, NC_SHORT, 2},
    Member{"schar", tsINT8, NC_BYTE, 1},      Member{"uchar", tsUINT8, NC_BYTE, 1},
    Member{"text", tsCHAR, NC_CHAR, 1}};

void PrintTo(const Member &member, std::ostream *out) {
    *out << member.suffix;
}

/// Calls `with` with a value of the type that a host array of the class has.
template <class With>
auto withType(tsClassID hostClass, const With &with) {
    switch (hostClass) {
    case tsDOUBLE:
        return with(double{});
    case tsSINGLE:
        return with(float{});
    case tsINT32:
        return with(std::int32_t{});
    case tsINT16:
        return with(std::int16_t{});
    case tsINT8:
        return with(std::int8_t{});
    case tsUINT8:
        return with(std::uint8_t{});
    default:
        return with(tsChar{});
    }
}

Array arrayOf(const Member &member, const Values &values) {
    const std::array<std::size_t, 2> dims = {1, values.size()};
    Array array = member.hostClass == tsCHAR ? Array::characters(dims)
                                             : Array::numeric(member.hostClass, dims);
    withType(member.hostClass, [&]<class T>(T /*type*/) {
        std::transform(values.begin(), values.end(), array.elements<T>().begin(),
                       [](int value) { return static_cast<T>(value); });
    });
    return array;
}

Values valuesOf(const Array &array) {
    return withType(array.classID(), [&]<class T>(T /*type*/) {
        const auto elements = array.elements<T>();
        Values values(elements.size());
        std::transform(elements.begin(), elements.end(), values.begin(),
                       [](T element) { return static_cast<int>(element); });
        return values;
    });
}

/// A position, or lengths, in the host's order.
Array vectorOf(const std::vector<std::size_t> &numbers) {
    Array row = Array::numeric(tsDOUBLE, std::array<std::size_t, 2>{1, numbers.size()});
    std::transform(numbers.begin(), numbers.end(), row.elements<double>().begin(),
                   [](std::size_t number) { return static_cast<double>(number); });
    return row;
}

/// The value of so many bytes in a file, most significant first, of this external type.
int decoded(nc_type external, std::uint64_t bits) {
    switch (external) {
    case NC_DOUBLE:
        return static_cast<int>(std::bit_cast<double>(bits));
    case NC_FLOAT:
        return static_cast<int>(std::bit_cast<float>(static_cast<std::uint32_t>(bits)));
    default:
        return static_cast<int>(bits);
    }
}

/// A file as others see it.
class Bytes {
  public:
    explicit Bytes(const std::string &file)
        : descriptor(open(file.c_str(), O_RDWR | O_CREAT, 0600)) {}
    ~Bytes() { close(descriptor); }
    Bytes(const Bytes &) = delete;
    Bytes &operator=(const Bytes &) = delete;

    [[nodiscard]] std::size_t size() const { return static_cast<std::size_t>(status().st_size); }
    [[nodiscard]] std::size_t onDisk() const {
        return static_cast<std::size_t>(status().st_blocks) * 512;
    }

    /// False where there is no room for such a file, or none without the disk that it would take.
    [[nodiscard]] bool becomesHole(std::size_t bytes) const {
        return ftruncate(descriptor, static_cast<off_t>(bytes)) == 0 &&
               pwrite(descriptor, "", 1, static_cast<off_t>(bytes - 1)) == 1 &&
               onDisk() < mostOnDisk;
    }

    [[nodiscard]] int value(const Member &member, std::size_t offset) const {
        std::array<unsigned char, 8> bytes{};
        EXPECT_EQ(pread(descriptor, bytes.data(), member.size, static_cast<off_t>(offset)),
                  static_cast<ssize_t>(member.size));
        std::uint64_t bits = 0;
        for (std::size_t i = 0; i < member.size; ++i) {
            bits = bits << 8U | bytes[i];
        }
        return decoded(member.external, bits);
    }

    /// An integer of the member's size, most significant byte first.
    void put(const Member &member, unsigned value, std::size_t offset) const {
        std::array<unsigned char, 8> bytes{};
        for (std::size_t i = member.size; i-- > 0; value >>= 8U) {
            bytes[i] = static_cast<unsigned char>(value);
        }
        EXPECT_EQ(pwrite(descriptor, bytes.data(), member.size, static_cast<off_t>(offset)),
                  static_cast<ssize_t>(member.size));
    }

    /// Blocks of the file system, the library's buffers, and what it writes between two values.
    static constexpr std::size_t mostOnDisk = std::size_t{32} << 20U;

  private:
    [[nodiscard]] struct stat status() const {
        struct stat found = {};
        fstat(descriptor, &found);
        return found;
    }

    int descriptor;
};

/// One more than 31 bits hold.
constexpr std::size_t in31Bits = std::size_t{1} << 31U;
constexpr std::size_t in32Bits = std::size_t{1} << 32U;

/// The identifier of an error.
std::string identifierOf(const std::string &error) {
    return error.substr(0, error.find(' '));
}

class Large : public testing::TestWithParam<Member> {
  protected:
    void SetUp() override {
        if (!Bytes(folder.file("hole")).becomesHole(in32Bits * 9)) {
            GTEST_SKIP() << "the file system has no room for large files that are nearly all holes";
        }
    }

    /// A call of the member of a family; the data set in front of it are those of the test.
    template <class... Arguments>
    Results call(const char *family, const Arguments &...arguments) const {
        return netcdf()(std::string(family) + "_" + GetParam().suffix, ncid, arguments...);
    }

    template <class... Arguments>
    Values get(const char *family, const Arguments &...arguments) const {
        return valuesOf(call(family, arguments...)[0]);
    }

    /// "IDENTIFIER MESSAGE"
    template <class... Arguments>
    std::string errorOf(const char *family, const Arguments &...arguments) const {
        try {
            call(family, arguments...);
        } catch (const Error &error) {
            return error.identifier() + " " + error.message();
        }
        return "none";
    }

    [[nodiscard]] Array data(const Values &values) const { return arrayOf(GetParam(), values); }

    void create() {
        ncid = netcdf()("create", file, NC_64BIT_OFFSET)[0].number();
        netcdf()("set_fill", ncid, NC_NOFILL);
    }

    [[nodiscard]] Array dimension(const char *name, std::size_t length) const {
        return std::move(netcdf()("def_dim", ncid, name, static_cast<double>(length))[0]);
    }

    /// A variable; its dimensions are given in the host's order.
    [[nodiscard]] double variable(const char *name, nc_type type,
                                  std::initializer_list<double> dims) const {
        return netcdf()("def_var", ncid, name, type, Array::row(dims))[0].number();
    }

    /// Opens the file anew.
    void open(const char *mode) {
        netcdf()("close", ncid);
        ncid = netcdf()("open", file, mode)[0].number();
    }

    void TearDown() override {
        if (ncid >= 0) {
            netcdf()("close", ncid);
        }
    }

    Folder folder;
    std::string file = folder.file("large.nc");
    double ncid = -1;
};

// ---- a variable of more than 2^32 elements, behind one of 4 GiB ---------------------------------

class LargeVariable : public Large {
  protected:
    static constexpr std::size_t columns = in31Bits + 16;
    static constexpr std::size_t elements = 2 * columns; // 32 more than 32 bits hold
    static constexpr std::size_t last = columns - 1;
    static constexpr std::size_t stride = in31Bits - 2; // the largest that the library takes

    void SetUp() override {
        Large::SetUp();
        if (IsSkipped()) {
            return;
        }
        create();
        const double filler = dimension("filler", in32Bits - 8).number();
        const double two = dimension("two", 2).number();
        const double three = dimension("three", 3).number();
        const double x = dimension("x", columns).number();
        static_cast<void>(variable("filler", NC_BYTE, {filler}));
        small = variable("small", GetParam().external, {two, three});
        huge = variable("huge", GetParam().external, {x, two});
        netcdf()("enddef", ncid);
    }

    double small = 0; ///< two by three
    double huge = 0;  ///< columns by two
};

TEST_P(LargeVariable, IsWrittenAndReadWhereItShall) {
    call("put_var", small, data({1, 2, 3, 4, 5, 6}));
    call("put_var1", huge, vectorOf({last, 1}), data({7}));
    call("put_vara", huge, vectorOf({last - 4, 1}), vectorOf({4, 1}), data({8, 9, 10, 11}));
    call("put_vars", huge, vectorOf({5, 0}), vectorOf({2, 1}), vectorOf({stride, 1}),
         data({12, 13}));
    call("put_var1", huge, vectorOf({in31Bits - 16, 1}), data({14})); // element 2^32
    open("NOWRITE");

    const Bytes bytes(file);
    EXPECT_LT(bytes.onDisk(), Bytes::mostOnDisk);
    const std::size_t size = GetParam().size;
    const std::size_t begin = bytes.size() - elements * size;
    ASSERT_GT(begin, in32Bits);
    const std::size_t smallBegin = begin - (6 * size + 3) / 4 * 4;
    EXPECT_GE(smallBegin, in32Bits);
    for (std::size_t i = 0; i < 6; ++i) {
        EXPECT_EQ(bytes.value(GetParam(), smallBegin + i * size), static_cast<int>(i) + 1);
    }
    // What lies at these places when a position loses the bits from the 32nd on, or the sign.
    for (const auto &[element, value] :
         std::vector<std::pair<std::size_t, int>>{{elements - 1, 7},
                                                  {elements - 5, 8},
                                                  {elements - 4, 9},
                                                  {elements - 3, 10},
                                                  {elements - 2, 11},
                                                  {5, 12},
                                                  {stride + 5, 13},
                                                  {in32Bits, 14},
                                                  {0, 0},
                                                  {elements - 6, 0},
                                                  {elements - 1 - in32Bits, 0},
                                                  {elements - 5 - in32Bits, 0},
                                                  {last, 0},
                                                  {3, 0},
                                                  {in31Bits - 16, 0},
                                                  {in31Bits, 0},
                                                  {in31Bits + 1, 0}}) {
        EXPECT_EQ(bytes.value(GetParam(), begin + element * size), value) << element;
    }

    EXPECT_EQ(get("get_var", small), (Values{1, 2, 3, 4, 5, 6}));
    EXPECT_EQ(get("get_var1", huge, vectorOf({last, 1})), (Values{7}));
    EXPECT_EQ(get("get_var1", huge, vectorOf({in31Bits - 16, 1})), (Values{14}));
    EXPECT_EQ(get("get_vara", huge, vectorOf({last - 5, 1}), vectorOf({6, 1})),
              (Values{0, 8, 9, 10, 11, 7}));
    EXPECT_EQ(get("get_vara", huge, vectorOf({last - 1, 0}), vectorOf({2, 2})),
              (Values{0, 0, 11, 7}));
    EXPECT_EQ(get("get_vars", huge, vectorOf({5, 0}), vectorOf({2, 1}), vectorOf({stride, 1})),
              (Values{12, 13}));
    EXPECT_EQ(get("get_vars", huge, vectorOf({last - 4, 1}), vectorOf({3, 1}), vectorOf({2, 1})),
              (Values{8, 10, 7}));
}

TEST_P(LargeVariable, PositionsBeyondAreErrors) {
    call("put_var1", huge, vectorOf({0, 0}), data({1}));
    open("NOWRITE");
    // In 31 or 32 bits these would be positions that there are.
    EXPECT_EQ(identifierOf(errorOf("get_var1", huge, vectorOf({in32Bits, 0}))),
              "TESSEL:netcdf:getVar1:indexExceedsDimensionBound");
    EXPECT_EQ(identifierOf(errorOf("get_vara", huge, vectorOf({last, 0}), vectorOf({2, 1}))),
              "TESSEL:netcdf:getVara:startPlusCountExceedsDimensionBound");
    EXPECT_EQ(identifierOf(errorOf("get_vars", huge, vectorOf({18, 0}), vectorOf({2, 1}),
                                   vectorOf({stride, 1}))),
              "TESSEL:netcdf:getVars:indexExceedsDimensionBound");
}

/// In 32 bits, the variable would have as many elements as are given. Messages show sizes in 32.
TEST_P(LargeVariable, SizesAreComparedInFull) {
    const Array few = data(Values(elements - in32Bits, 1));
    const Array all = vectorOf({columns, 2});
    const std::string mismatch = "dataSizeMismatch The number of elements implied by the count "
                                 "argument (32) does not equal the number of data elements (32).";
    EXPECT_EQ(identifierOf(errorOf("put_var", huge, few)), "TESSEL:netcdf:putVar:dataSizeMismatch");
    EXPECT_EQ(errorOf("put_vara", huge, vectorOf({0, 0}), all, few),
              "TESSEL:netcdf:putVara:" + mismatch);
    EXPECT_EQ(errorOf("put_vars", huge, vectorOf({0, 0}), all, vectorOf({1, 1}), few),
              "TESSEL:netcdf:putVars:" + mismatch);
}

INSTANTIATE_TEST_SUITE_P(Members, LargeVariable, testing::ValuesIn(members),
                         [](const auto &each) { return each.param.suffix; });

// ---- records beyond 4 GiB -----------------------------------------------------------------------

class LargeRecords : public Large {};

TEST_P(LargeRecords, AreWrittenAndReadWhereTheyShall) {
    constexpr std::size_t recordBytes = std::size_t{1} << 20U;
    constexpr std::size_t record = 5000;
    const std::size_t size = GetParam().size;
    const std::size_t columns = recordBytes / size;
    create();
    const double time = dimension("time", 0).number();
    const double varid =
        variable("v", GetParam().external, {dimension("x", columns).number(), time});
    netcdf()("enddef", ncid);
    call("put_vara", varid, vectorOf({columns - 3, record}), vectorOf({3, 1}), data({1, 2, 3}));
    call("put_var1", varid, vectorOf({0, record}), data({4}));
    call("put_vars", varid, vectorOf({2, record - 900}), vectorOf({1, 2}), vectorOf({1, 900}),
         data({5, 6}));
    open("NOWRITE");

    const Bytes bytes(file);
    EXPECT_LT(bytes.onDisk(), Bytes::mostOnDisk);
    const std::size_t begin = bytes.size() - (record + 1) * recordBytes;
    ASSERT_LT(begin, recordBytes);
    for (const auto &[at, x, value] : std::vector<std::tuple<std::size_t, std::size_t, int>>{
             {record, columns - 3, 1},
             {record, columns - 2, 2},
             {record, columns - 1, 3},
             {record, 0, 4},
             {record - 900, 2, 5},
             {record, 2, 6},
             {record, 1, 0},
             {record - in32Bits / recordBytes, 0, 0},
             {record - 1, columns - 1, 0}}) {
        EXPECT_EQ(bytes.value(GetParam(), begin + at * recordBytes + x * size), value) << at;
    }
    EXPECT_EQ(get("get_vara", varid, vectorOf({columns - 3, record}), vectorOf({3, 1})),
              (Values{1, 2, 3}));
    EXPECT_EQ(get("get_var1", varid, vectorOf({0, record})), (Values{4}));
    EXPECT_EQ(
        get("get_vars", varid, vectorOf({2, record - 900}), vectorOf({1, 2}), vectorOf({1, 900})),
        (Values{5, 6}));
}

INSTANTIATE_TEST_SUITE_P(Members, LargeRecords, testing::ValuesIn(members),
                         [](const auto &each) { return each.param.suffix; });

// ---- a whole variable of more than 2^31 elements ------------------------------------------------

class LargeWhole : public Large {
  protected:
    static constexpr std::size_t elements = in31Bits + 16;

    void SetUp() override {
        // The host's characters have two bytes, and come by a buffer of the file's.
        const std::size_t taken = elements * (GetParam().hostClass == tsCHAR ? 3 : GetParam().size);
        if (const std::size_t available = memoryAvailable(); available < taken + in31Bits) {
            GTEST_SKIP() << "there are " << available << " bytes of memory, and this takes "
                         << taken << " and leaves 2 GiB";
        }
        Large::SetUp();
        if (IsSkipped()) {
            return;
        }
        create();
        varid = variable("v", GetParam().external, {dimension("x", elements).number()});
        netcdf()("enddef", ncid);
        open("WRITE");
        begin = Bytes(file).size() - elements * GetParam().size;
    }

    /// Gives the first and the last element, and two in between, values of their own.
    void markFile() const {
        const Bytes bytes(file);
        for (const std::size_t element : marked) {
            bytes.put(GetParam(), static_cast<unsigned>(mark(element)),
                      begin + element * GetParam().size);
        }
    }

    /// The value of such an element. That of the last is larger than a byte where there is room.
    static int mark(std::size_t element) {
        const int more = GetParam().size > 1 && element == elements - 1 ? 0x100 : 0;
        return static_cast<int>(element % 100) + 1 + more;
    }

    static std::size_t memoryAvailable() {
        std::ifstream lines("/proc/meminfo");
        for (std::string name; lines >> name; lines.ignore(100, '\n')) {
            std::size_t kilobytes = 0;
            if (name == "MemAvailable:" && lines >> kilobytes) {
                return kilobytes * 1024;
            }
        }
        return 0;
    }

    static constexpr std::array<std::size_t, 4> marked = {0, in31Bits - 1, in31Bits, elements - 1};
    double varid = 0;
    std::size_t begin = 0;
};

TEST_P(LargeWhole, IsRead) {
    markFile();
    open("NOWRITE");
    const Results results = call("get_var", varid);
    ASSERT_EQ(results[0].size(), elements);
    withType(GetParam().hostClass, [&]<class T>(T /*type*/) {
        const auto found = results[0].elements<T>();
        for (const std::size_t element : marked) {
            // The whole read of text counts the characters that it hands over in 31 bits and a
            // sign, and hands over none when that is negative.
            const int expected = GetParam().hostClass == tsCHAR ? 0 : mark(element);
            EXPECT_EQ(static_cast<int>(found[element]), expected) << element;
        }
        EXPECT_EQ(static_cast<int>(found[in31Bits - 2]), 0);
    });
    EXPECT_EQ(get("get_vara", varid, vectorOf({elements - 2}), vectorOf({2})),
              (Values{0, mark(elements - 1)}));
}

// Numbers of two bytes are more than 32 bits count of those, too. What is larger takes 8 GiB and
// more of memory, and is of the same code.
INSTANTIATE_TEST_SUITE_P(Members, LargeWhole, testing::Values(members[3], members[4], members[6]),
                         [](const auto &each) { return each.param.suffix; });

/// Blocks of text are counted in 64 bits, and so read in full.
class LargeText : public LargeWhole {};

TEST_P(LargeText, IsReadInFull) {
    markFile();
    open("NOWRITE");
    const Results results = call("get_vara", varid, vectorOf({0}), vectorOf({elements}));
    ASSERT_EQ(results[0].size(), elements);
    for (const std::size_t element : marked) {
        EXPECT_EQ(results[0].elements<tsChar>()[element], mark(element)) << element;
    }
}

INSTANTIATE_TEST_SUITE_P(Members, LargeText, testing::Values(members[6]),
                         [](const auto &each) { return each.param.suffix; });

class LargeWholeWrite : public LargeWhole {};

TEST_P(LargeWholeWrite, IsWritten) {
    struct statvfs room = {};
    ASSERT_EQ(statvfs(folder.folder().c_str(), &room), 0);
    if (room.f_bavail * room.f_frsize < 2 * in31Bits) {
        GTEST_SKIP() << "there is less room on the disk than this takes";
    }
    const Array all = Array::numeric(GetParam().hostClass, std::array<std::size_t, 2>{elements, 1});
    const auto values = all.elements<std::int8_t>();
    for (const std::size_t element : marked) {
        values[element] = static_cast<std::int8_t>(mark(element));
    }
    call("put_var", varid, all);
    netcdf()("sync", ncid);
    const Bytes bytes(file);
    for (const std::size_t element : marked) {
        EXPECT_EQ(bytes.value(GetParam(), begin + element), mark(element));
    }
}

INSTANTIATE_TEST_SUITE_P(Members, LargeWholeWrite, testing::Values(members[4]),
                         [](const auto &each) { return each.param.suffix; });

} // namespace
} // namespace tessel::test
