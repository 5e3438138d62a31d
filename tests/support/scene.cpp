// tests/support/scene.cpp: the files and datasets that a row plays with, made anew for each run.
#include "support/scene.hpp"

#include "support/sample.hpp"
#include "support/text.hpp"

#include <netcdf.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <fstream>
#include <stdexcept>

namespace tessel::test {
namespace {

constexpr std::size_t sampleRecords = 2;

/// One folder a process; each scene finds it empty and leaves it so.
const std::filesystem::path &sceneFolder() {
    struct Folder {
        std::filesystem::path path =
            std::filesystem::temp_directory_path() / ("tessel-scene-" + shown(getpid()));
        Folder() { std::filesystem::create_directory(path); }
        ~Folder() { std::filesystem::remove_all(path); }
        Folder(const Folder &) = delete;
        Folder &operator=(const Folder &) = delete;
    };
    static const Folder folder;
    return folder.path;
}

int created(const std::string &path) {
    int ncid = -1;
    want(nc_create(path.c_str(), NC_CLOBBER, &ncid));
    return ncid;
}

constexpr std::array typeNames = {"nat", "byte", "char", "short", "int", "float", "double"};

const char *typeName(nc_type type) {
    return typeNames.at(static_cast<std::size_t>(type));
}

template <class T>
std::string shownAll(const std::vector<T> &values) {
    std::string text;
    for (const T value : values) {
        text += (text.empty() ? "" : " ") + shown(value);
    }
    return text;
}

/// The values of a variable or an attribute of a stored type, read by `read` into memory for them.
template <class Read>
std::string shownValues(nc_type type, std::size_t size, const Read &read) {
    if (type == NC_CHAR) {
        std::vector<char> text(size);
        want(read(text.data()));
        return quoted(std::span<const char>(text));
    }
    const auto numbers = [&]<class T>(std::vector<T> values) {
        want(read(values.data()));
        return shownAll(values);
    };
    switch (type) {
    case NC_FLOAT:
        return numbers(std::vector<float>(size));
    case NC_DOUBLE:
        return numbers(std::vector<double>(size));
    case NC_SHORT:
        return numbers(std::vector<short>(size));
    case NC_INT:
        return numbers(std::vector<int>(size));
    default:
        return numbers(std::vector<signed char>(size));
    }
}

std::string described(int ncid, int varid, const std::string &owner, int number) {
    std::array<char, NC_MAX_NAME + 1> name{};
    want(nc_inq_attname(ncid, varid, number, name.data()));
    nc_type type = NC_NAT;
    std::size_t length = 0;
    want(nc_inq_att(ncid, varid, name.data(), &type, &length));
    return owner + ":" + name.data() + " = " + typeName(type) + " " +
           shownValues(type, length,
                       [&](void *to) { return nc_get_att(ncid, varid, name.data(), to); });
}

void describeDimensions(int ncid, int count, int unlimited, std::vector<std::string> &lines) {
    for (int id = 0; id < count; ++id) {
        std::array<char, NC_MAX_NAME + 1> name{};
        std::size_t length = 0;
        want(nc_inq_dim(ncid, id, name.data(), &length));
        lines.push_back("dimension " + shown(id) + ": " + name.data() + " = " + shown(length) +
                        (id == unlimited ? ", unlimited" : ""));
    }
}

void describeVariable(int ncid, int varid, std::vector<std::string> &lines) {
    std::array<char, NC_MAX_NAME + 1> name{};
    nc_type type = NC_NAT;
    int ndims = 0;
    std::array<int, NC_MAX_VAR_DIMS> dimids{};
    int natts = 0;
    want(nc_inq_var(ncid, varid, name.data(), &type, &ndims, dimids.data(), &natts));
    std::string dimensions;
    std::size_t size = 1;
    for (int i = 0; i < ndims; ++i) {
        std::array<char, NC_MAX_NAME + 1> dimension{};
        std::size_t length = 0;
        want(nc_inq_dim(ncid, dimids[static_cast<std::size_t>(i)], dimension.data(), &length));
        dimensions += (i == 0 ? "" : ", ") + std::string(dimension.data());
        size *= length;
    }
    lines.push_back("variable " + shown(varid) + ": " + typeName(type) + " " + name.data() + "(" +
                    dimensions + ")");
    for (int number = 0; number < natts; ++number) {
        lines.push_back(described(ncid, varid, name.data(), number));
    }
    lines.push_back(std::string(name.data()) + " = " +
                    shownValues(type, size, [&](void *to) { return nc_get_var(ncid, varid, to); }));
}

void describeContents(int ncid, std::vector<std::string> &lines) {
    int ndims = 0;
    int nvars = 0;
    int natts = 0;
    int unlimited = -1;
    want(nc_inq(ncid, &ndims, &nvars, &natts, &unlimited));
    describeDimensions(ncid, ndims, unlimited, lines);
    for (int number = 0; number < natts; ++number) {
        lines.push_back(described(ncid, NC_GLOBAL, "", number));
    }
    for (int varid = 0; varid < nvars; ++varid) {
        describeVariable(ncid, varid, lines);
    }
}

std::string formatName(int ncid) {
    int format = 0;
    want(nc_inq_format(ncid, &format));
    return format == NC_FORMAT_CLASSIC        ? "classic"
           : format == NC_FORMAT_64BIT_OFFSET ? "64-bit offset"
                                              : "format " + shown(format);
}

/// "classic, data mode, fill", of an open dataset, which is in data mode afterwards; "closed" of
/// one that is not open.
std::string describedState(int ncid) {
    if (nc_inq(ncid, nullptr, nullptr, nullptr, nullptr) == NC_EBADID) {
        return "closed";
    }
    const std::string format = formatName(ncid);
    const int status = nc_redef(ncid);
    if (status == NC_EPERM) {
        return format + ", read only";
    }
    int fill = NC_FILL;
    want(nc_set_fill(ncid, NC_FILL, &fill));
    want(nc_enddef(ncid));
    return format + (status == NC_EINDEFINE ? ", define mode" : ", data mode") +
           (fill == NC_NOFILL ? ", no fill" : ", fill");
}

std::string baseName(int ncid) {
    std::size_t length = 0;
    want(nc_inq_path(ncid, &length, nullptr));
    std::string path(length, '\0');
    want(nc_inq_path(ncid, nullptr, path.data()));
    return std::filesystem::path(path).filename().string();
}

/// What is in a file, read afresh.
void describeFile(const std::string &path, std::vector<std::string> &lines) {
    int ncid = -1;
    const int status = nc_open(path.c_str(), NC_NOWRITE, &ncid);
    if (status != NC_NOERR) {
        lines.emplace_back(nc_strerror(status));
        return;
    }
    describeContents(ncid, lines);
    want(nc_close(ncid));
}

} // namespace

void want(int status) {
    if (status != NC_NOERR) {
        throw std::runtime_error(std::string("the library refused the tests: ") +
                                 nc_strerror(status));
    }
}

Scene::Scene(On what) : on(what), folder(sceneFolder()) {
    if (on == On::nothing) {
        return;
    }
    if (on == On::textFile) {
        std::ofstream(path("text.nc")) << "This is no dataset.\n";
        return;
    }
    dataset = created(path("sample.nc"));
    if (on == On::newDataset) {
        return;
    }
    defineSample(dataset);
    want(nc_enddef(dataset));
    writeSample(dataset, on == On::noRecords ? 0 : sampleRecords);
    if (on == On::sampleFile || on == On::sampleRead) {
        want(nc_close(dataset));
        dataset = -1;
    }
    if (on == On::sampleRead) {
        want(nc_open(path("sample.nc").c_str(), NC_NOWRITE, &dataset));
    }
    if (on == On::sampleDefine || on == On::twoDatasets) {
        want(nc_redef(dataset));
    }
    if (on == On::twoDatasets) {
        otherDataset = created(path("other.nc"));
        want(nc_def_dim(otherDataset, "x", 2, nullptr));
        want(nc_def_var(otherDataset, "v", NC_INT, 1, std::array{0}.data(), nullptr));
    }
}

Scene::~Scene() {
    openedIDs.push_back(dataset);
    openedIDs.push_back(otherDataset);
    for (const int id : openedIDs) {
        if (id != -1) {
            nc_close(id); // a dataset that the call under test has closed is no longer there
        }
    }
    int ignored = 0;
    nc_set_default_format(NC_FORMAT_CLASSIC, &ignored);
    std::error_code error;
    for (const auto &entry : std::filesystem::directory_iterator(folder, error)) {
        std::filesystem::remove_all(entry.path(), error);
    }
}

std::string Scene::path(const std::string &name) const {
    return (folder / name).string();
}

void Scene::addOpened(const std::vector<int> &ids) {
    openedIDs.insert(openedIDs.end(), ids.begin(), ids.end());
}

std::vector<std::string> Scene::describe() const {
    std::vector<std::string> lines;
    int format = 0;
    want(nc_set_default_format(NC_FORMAT_CLASSIC, &format));
    if (format != NC_FORMAT_CLASSIC) {
        lines.push_back("default format: " + shown(format));
    }
    if (dataset != -1) {
        const std::string state = describedState(dataset);
        lines.push_back(state);
        if (state == "closed") {
            describeFile(path("sample.nc"), lines);
        } else {
            describeContents(dataset, lines);
        }
    }
    if (otherDataset != -1) {
        lines.push_back("other: " + describedState(otherDataset));
        std::vector<std::string> contents;
        describeContents(otherDataset, contents);
        for (const std::string &line : contents) {
            lines.push_back("other: " + line);
        }
    }
    for (const int id : openedIDs) {
        lines.push_back("opened " + baseName(id) + ": " + describedState(id));
    }
    return lines;
}

std::vector<std::string> changes(const std::vector<std::string> &before,
                                 const std::vector<std::string> &after) {
    std::vector<std::string> found;
    const auto addMissing = [&](const char *sign, const auto &lines, const auto &among) {
        for (const std::string &line : lines) {
            if (std::find(among.begin(), among.end(), line) == among.end()) {
                found.push_back(sign + line);
            }
        }
    };
    addMissing("- ", before, after);
    addMissing("+ ", after, before);
    return found;
}

} // namespace tessel::test
