// tests/guard/support.hpp: datasets in a folder of the test's own, with and without the guard.
#pragma once

#include "support/process.hpp"
#include "tessel/netcdf_guard.hpp"

#include <gtest/gtest.h>

#include <sys/resource.h>

#include <csignal>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <string>
#include <string_view>

namespace tessel::test {

inline Module plainModule() {
    return Module(TESSEL_NETCDF_MODULE);
}

inline Module guardedModule(const GuardOptions &options = {}) {
    return plainModule().watchedBy(netcdfGuard(options));
}

/// The identifier that a call raises; "" if it raises none.
template <class Call>
std::string identifierOf(const Call &call) {
    try {
        call();
    } catch (const Error &error) {
        return error.identifier();
    }
    return "";
}

/// A call that must raise this error. Another one goes on.
template <class Call>
void wantError(std::string_view identifier, const Call &call) {
    try {
        call();
        ADD_FAILURE() << "the call succeeds, and should raise " << identifier;
    } catch (const Error &error) {
        if (error.identifier() != identifier) {
            throw;
        }
    }
}

/// As long as it lives, files cannot grow beyond 64 KiB.
class FullDisk {
  public:
    FullDisk() {
        getrlimit(RLIMIT_FSIZE, &before);
        const rlimit full = {rlim_t{1} << 16U, before.rlim_max};
        setrlimit(RLIMIT_FSIZE, &full);
    }
    ~FullDisk() {
        setrlimit(RLIMIT_FSIZE, &before);
        std::signal(SIGXFSZ, handler);
    }
    FullDisk(const FullDisk &) = delete;
    FullDisk &operator=(const FullDisk &) = delete;

  private:
    rlimit before{};
    void (*handler)(int) = std::signal(SIGXFSZ, SIG_IGN); // an error like any other
};

/// As long as it lives, the process may have so many MiB more of something than it has: of
/// RLIMIT_DATA, which is "VmData" of its status, or of RLIMIT_AS, "VmSize".
class Limited {
  public:
    Limited(__rlimit_resource of, std::string_view name, rlim_t more) : resource(of) {
        getrlimit(resource, &before);
        const rlimit little = {bytesInStatus(name) + (more << 20U), before.rlim_max};
        setrlimit(resource, &little);
    }
    ~Limited() { setrlimit(resource, &before); }
    Limited(const Limited &) = delete;
    Limited &operator=(const Limited &) = delete;

  private:
    __rlimit_resource resource;
    rlimit before{};
};

struct LittleMemory : Limited {
    LittleMemory() : Limited(RLIMIT_DATA, "VmData:", 256) {}
};

struct FewAddresses : Limited {
    FewAddresses() : Limited(RLIMIT_AS, "VmSize:", 32) {}
};

/// A new file with these bytes.
inline std::string written(const Folder &folder, std::string_view name, std::string_view bytes) {
    std::ofstream(folder.file(name), std::ios::binary) << bytes;
    return folder.file(name);
}

inline int intOf(const Results &results) {
    return static_cast<int>(results[results.size() - 1].number());
}

/// Numbers as the formats store them: four bytes, the highest first.
inline std::string words(std::initializer_list<std::uint32_t> values) {
    std::string bytes;
    for (const std::uint32_t value : values) {
        for (const unsigned shift : {24U, 16U, 8U, 0U}) {
            bytes += static_cast<char>(value >> shift & 0xFFU);
        }
    }
    return bytes;
}

/// A letter with marks of two bytes, which is always written as two of them.
constexpr std::string_view growing = "\u0344";

inline std::string repeated(std::string_view text, std::size_t times) {
    std::string all;
    while (times-- > 0) {
        all += text;
    }
    return all;
}

/// A file with a variable of letters in records, of which it has none.
inline std::string claimedRecords(std::uint32_t records, std::uint32_t bytes) {
    using namespace std::string_literals;
    return "CDF\1" + words({records, 10, 2, 1}) + "t\0\0\0"s + words({0, 1}) + "x\0\0\0"s +
           words({bytes, 0, 0, 11, 1, 1}) + "v\0\0\0"s + words({2, 0, 1, 0, 0, 2, bytes, 200}) +
           std::string(100, '\0');
}

constexpr double ncDouble = 6;
constexpr double noFill = 256; // of set_fill
constexpr double ncInt = 4;
constexpr double global = -1; // in the place of a variable
constexpr double ncChar = 2;
// Flags of create.
constexpr int mapped = 16;
constexpr int data64 = 32;
constexpr int offset64 = 512;
constexpr int persistent = 0x4000; // of what is mapped, a file
constexpr int hdf5 = 0x1000;

/// A dataset in data mode: the fixed variable 0 over x (10), and the record variable 1 over t and
/// x.
inline int newDataset(const Module &netcdf, const std::string &file, int flags = 0) {
    const int ncid = intOf(netcdf("create", file, flags));
    const int t = intOf(netcdf("def_dim", ncid, "t", 0));
    const int x = intOf(netcdf("def_dim", ncid, "x", 10));
    netcdf("def_var", ncid, "fixed", ncDouble, x);
    netcdf("def_var", ncid, "records", ncDouble,
           Array::row({static_cast<double>(x), static_cast<double>(t)}));
    netcdf("enddef", ncid);
    return ncid;
}

/// In define mode, with the variable 0 of these lengths.
inline int definingVariable(const Module &netcdf, const Folder &folder, double type,
                            std::initializer_list<double> lengths, int flags = 0) {
    const int ncid = intOf(netcdf("create", folder.file("a.nc"), flags));
    const Array dimids = Array::numeric(tsDOUBLE, std::array{std::size_t{1}, lengths.size()});
    auto at = dimids.elements<double>().rbegin(); // the host's order
    std::string name = "a";
    for (const double length : lengths) {
        *at++ = netcdf("def_dim", ncid, name, length)[0].number();
        ++name[0];
    }
    netcdf("def_var", ncid, "v", type, dimids);
    return ncid;
}

/// The same in data mode, and never filled.
inline int unfilledVariable(const Module &netcdf, const Folder &folder, double type,
                            std::initializer_list<double> lengths, int flags = 0) {
    const int ncid = definingVariable(netcdf, folder, type, lengths, flags);
    netcdf("set_fill", ncid, noFill);
    netcdf("enddef", ncid);
    return ncid;
}

/// A dataset that is created with these flags while the default is another format.
inline int datasetWithDefault(const Module &netcdf, const Folder &folder, int format, int flags) {
    const int former = intOf(netcdf("set_default_format", format));
    const int ncid = newDataset(netcdf, folder.file("a.nc"), flags);
    netcdf("set_default_format", former);
    return ncid;
}

/// In define mode, which it cannot leave: the fill value has two values instead of one.
inline int unclosable(const Module &netcdf, const Folder &folder, int flags = 0) {
    const int ncid = definingVariable(netcdf, folder, ncInt, {3}, flags);
    netcdf("put_att_double", ncid, 0, "_FillValue", ncInt, Array::row({1, 2}));
    return ncid;
}

} // namespace tessel::test
