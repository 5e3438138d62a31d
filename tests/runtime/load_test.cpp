// tests/runtime/load_test.cpp: loading, finding and unloading modules.
#include "support.hpp"

#include <dlfcn.h>
#include <unistd.h>

#include <cstdlib>
#include <fstream>
#include <thread>

namespace tessel::test {
namespace {

namespace fs = std::filesystem;

/// A folder of the test's own, which is the current one as long as this lives.
class Scratch {
  public:
    Scratch() : before(fs::current_path()) {
        std::string pattern = (fs::temp_directory_path() / "load-XXXXXX").string();
        folder = mkdtemp(pattern.data());
        fs::current_path(folder);
    }
    ~Scratch() {
        fs::current_path(before);
        fs::remove_all(folder);
        unsetenv("TESSEL_MODULE_PATH");
    }
    Scratch(const Scratch &) = delete;
    Scratch &operator=(const Scratch &) = delete;

    fs::path folder;

  private:
    fs::path before;
};

void setModulePath(const std::string &value) {
    setenv("TESSEL_MODULE_PATH", value.c_str(), 1);
}

/// The folder that is searched last: "tessel" beside the library that the host is.
fs::path hostFolder() {
    Dl_info info{};
    dladdr(reinterpret_cast<void *>(&tsGetClassID), &info);
    return fs::absolute(info.dli_fname).parent_path() / "tessel";
}

TEST(Load, NoSuchFile) {
    const std::optional<Error> error = raisedBy([] { Module("/no/such/file.tsx"); });
    EXPECT_EQ(error->identifier(), "TESSEL:host:moduleNotFound");
    EXPECT_EQ(error->message(), "Cannot load module \"/no/such/file.tsx\": there is no such file; "
                                "looked for a shared object that exports tsxFunction");
}

TEST(Load, EmptyName) {
    const std::optional<Error> error = raisedBy([] { Module(""); });
    EXPECT_EQ(error->identifier(), "TESSEL:host:moduleNotFound");
    EXPECT_EQ(error->message(), "Cannot load module \"\": there is no such file; looked for a "
                                "shared object that exports tsxFunction");
}

TEST(Load, NameThatIsNotValidUtf8) {
    EXPECT_EQ(messageOf([] { Module("/no/caf\xe9.tsx"); }),
              "Cannot load module \"/no/caf\xc3\xa9.tsx\": there is no such file; looked for a "
              "shared object that exports tsxFunction");
}

TEST(Load, WhatIsNoSharedObject) {
    const Scratch scratch;
    const fs::path textFile = scratch.folder / "text.tsx";
    std::ofstream(textFile) << "This is a text, and longer than the header of an object file is.\n"
                            << std::string(200, '.');
    const fs::path emptyFile = scratch.folder / "empty.tsx";
    std::ofstream(emptyFile).flush();
    for (const fs::path &path : {textFile, emptyFile, scratch.folder}) {
        const std::optional<Error> error = raisedBy([&] { const Module module(path); });
        EXPECT_EQ(error->identifier(), "TESSEL:host:notAModule");
        const std::string start =
            "Cannot load module \"" + path.string() +
            "\": it is not a shared object that can be loaded; looked for one "
            "that exports tsxFunction (";
        EXPECT_EQ(error->message().substr(0, start.size()), start);
        EXPECT_GT(error->message().size(), start.size() + 1);
    }
}

TEST(Load, SharedObjectWithoutEntryPoint) {
    const fs::path file = testModule("no_entry_point");
    const std::optional<Error> error = raisedBy([&] { const Module module(file); });
    EXPECT_EQ(error->identifier(), "TESSEL:host:noEntryPoint");
    EXPECT_EQ(error->message(), "Cannot load module \"" + file.string() +
                                    "\": it does not export the entry point tsxFunction");
}

TEST(Load, RelativePathIsRelativeToTheCurrentFolder) {
    const Scratch scratch;
    fs::copy_file(testModule("good"), scratch.folder / "copy.tsx");
    const Module module("copy.tsx");
    EXPECT_EQ(module("add", 1, 2)[0].number(), 3);
}

TEST(Load, NameOutsideAscii) {
    const Scratch scratch;
    const fs::path file = scratch.folder / "größe 水.tsx";
    fs::copy_file(testModule("good"), file);
    const Module module(file);
    EXPECT_EQ(module.file(), file);
    EXPECT_EQ(module("add", 1, 2)[0].number(), 3);
}

TEST(Find, TheFirstFolderThatHasIt) {
    const Scratch scratch;
    for (const char *folder : {"first", "second"}) {
        fs::create_directory(scratch.folder / folder);
    }
    fs::copy_file(testModule("good"), scratch.folder / "second" / "netcdf.tsx");
    setModulePath((scratch.folder / "first").string() + ":" + (scratch.folder / "second").string());
    EXPECT_EQ(Module::find("netcdf").file(), scratch.folder / "second" / "netcdf.tsx");

    fs::copy_file(testModule("good"), scratch.folder / "first" / "netcdf.tsx");
    EXPECT_EQ(Module::find("netcdf").file(), scratch.folder / "first" / "netcdf.tsx");
}

TEST(Find, BesideTheHostLast) {
    unsetenv("TESSEL_MODULE_PATH");
    EXPECT_EQ(Module::find("netcdf").file(), hostFolder() / "netcdf.tsx");
}

TEST(Find, TheCurrentFolderIsNotSearched) {
    const Scratch scratch;
    fs::copy_file(testModule("good"), scratch.folder / "mine.tsx");
    fs::create_directory(scratch.folder / "tessel");
    fs::copy_file(testModule("good"), scratch.folder / "tessel" / "mine.tsx");
    for (const char *path : {"", ":", "::", ".", "./", "tessel", "./tessel:.", "..:tessel/"}) {
        SCOPED_TRACE(path);
        setModulePath(path);
        EXPECT_EQ(messageOf([] { Module::find("mine"); }),
                  "Cannot load module \"mine.tsx\": there is no such file; looked for a shared "
                  "object that exports tsxFunction (searched " +
                      hostFolder().string() + ")");
    }
}

TEST(Find, NamesTheFolders) {
    setModulePath("/no/such/one:relative:/no/such/two");
    const std::optional<Error> error = raisedBy([] { Module::find("absent"); });
    unsetenv("TESSEL_MODULE_PATH");
    EXPECT_EQ(error->identifier(), "TESSEL:host:moduleNotFound");
    EXPECT_EQ(
        error->message(),
        "Cannot load module \"absent.tsx\": there is no such file; looked for a shared object "
        "that exports tsxFunction (searched /no/such/one, /no/such/two, " +
            hostFolder().string() + ")");
}

TEST(Find, ANameIsNoPath) {
    const Scratch scratch;
    fs::copy_file(testModule("good"), scratch.folder / "mine.tsx");
    fs::create_directory(scratch.folder / "modules");
    setModulePath((scratch.folder / "modules").string());
    const std::string absolute = (scratch.folder / "mine").string();
    using namespace std::string_view_literals;
    for (const std::string_view name :
         {"../mine"sv, "./mine"sv, std::string_view(absolute), "a/b"sv, "/"sv, "netcdf\0"sv}) {
        const std::optional<Error> error = raisedBy([&] { Module::find(name); });
        EXPECT_EQ(error->identifier(), "TESSEL:host:moduleNotFound");
        EXPECT_NE(error->message().find("(a module's name has no folder in it)"),
                  std::string::npos);
    }
    EXPECT_EQ(identifierOf([] { Module::find(""); }), "TESSEL:host:moduleNotFound");
}

TEST(Load, UnloadedWithTheLastCopyAndLoadedAnew) {
    for (int round = 1; round <= 200; ++round) {
        const Module module(testModule("raising"));
        {
            const Module copy = module; // NOLINT: a copy is what is tested
            EXPECT_EQ(copy("count_calls")[0].number(), 1);
        }
        EXPECT_EQ(module("count_calls")[0].number(), 2); // the copy did not unload it
    }
}

TEST(Load, TwoModulesAtOnce) {
    const Module good(testModule("good"));
    const Module raising(testModule("raising"));
    const Module goodAgain(testModule("good"));
    EXPECT_EQ(good("add", 1, 2)[0].number(), 3);
    EXPECT_EQ(raising("count_calls")[0].number(), 1);
    EXPECT_EQ(goodAgain("add", 3, 4)[0].number(), 7);
    EXPECT_EQ(raising("count_calls")[0].number(), 2);
}

TEST(Load, ResultsAndErrorsOutliveTheModule) {
    std::optional<Results> results;
    std::optional<Error> error;
    {
        const Module good(testModule("good"));
        const Module raising(testModule("raising"));
        results = good("one_of_each");
        error = raisedBy([&] { raising("local"); });
    }
    EXPECT_EQ((*results)[0].cellAt(119).utf8(), "last");
    EXPECT_EQ(error->message(),
              "An exception that is not the host's left the module: bytes \xc3\xbf and \xc3\xa9");
}

TEST(Load, AThreadMayEndAfterTheModuleThatItCalledIsGone) {
    for (int round = 0; round < 5; ++round) {
        std::thread([] {
            const Module netcdf(TESSEL_NETCDF_MODULE);
            EXPECT_NE(netcdf("inq_libvers")[0].utf8(), "");
        }).join();
    }
}

} // namespace
} // namespace tessel::test
