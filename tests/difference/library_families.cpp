// tests/difference/library_families.cpp: the typed families on the direct side.
#include "library_side.hpp"

#include "text.hpp"

#include <algorithm>
#include <cstdint>
#include <numeric>
#include <tuple>
#include <type_traits>

namespace difference {
namespace {

using Index = const std::size_t *;
using Stride = const std::ptrdiff_t *;

/// What the library has for one memory type. Text attributes have no external type to be told, and
/// so no function here.
template <class T>
struct Functions {
    int (*getAtt)(int, int, const char *, T *);
    int (*putAtt)(int, int, const char *, nc_type, std::size_t, const T *);
    int (*getVar)(int, int, T *);
    int (*putVar)(int, int, const T *);
    int (*getVar1)(int, int, Index, T *);
    int (*putVar1)(int, int, Index, const T *);
    int (*getVara)(int, int, Index, Index, T *);
    int (*putVara)(int, int, Index, Index, const T *);
    int (*getVars)(int, int, Index, Index, Stride, T *);
    int (*putVars)(int, int, Index, Index, Stride, const T *);
};

// clang-format off
constexpr std::tuple types = {
    Functions<double>       {nc_get_att_double, nc_put_att_double, nc_get_var_double, nc_put_var_double, nc_get_var1_double, nc_put_var1_double, nc_get_vara_double, nc_put_vara_double, nc_get_vars_double, nc_put_vars_double},
    Functions<float>        {nc_get_att_float,  nc_put_att_float,  nc_get_var_float,  nc_put_var_float,  nc_get_var1_float,  nc_put_var1_float,  nc_get_vara_float,  nc_put_vara_float,  nc_get_vars_float,  nc_put_vars_float},
    Functions<int>          {nc_get_att_int,    nc_put_att_int,    nc_get_var_int,    nc_put_var_int,    nc_get_var1_int,    nc_put_var1_int,    nc_get_vara_int,    nc_put_vara_int,    nc_get_vars_int,    nc_put_vars_int},
    Functions<short>        {nc_get_att_short,  nc_put_att_short,  nc_get_var_short,  nc_put_var_short,  nc_get_var1_short,  nc_put_var1_short,  nc_get_vara_short,  nc_put_vara_short,  nc_get_vars_short,  nc_put_vars_short},
    Functions<signed char>  {nc_get_att_schar,  nc_put_att_schar,  nc_get_var_schar,  nc_put_var_schar,  nc_get_var1_schar,  nc_put_var1_schar,  nc_get_vara_schar,  nc_put_vara_schar,  nc_get_vars_schar,  nc_put_vars_schar},
    Functions<unsigned char>{nc_get_att_uchar,  nc_put_att_uchar,  nc_get_var_uchar,  nc_put_var_uchar,  nc_get_var1_uchar,  nc_put_var1_uchar,  nc_get_vara_uchar,  nc_put_vara_uchar,  nc_get_vars_uchar,  nc_put_vars_uchar},
    Functions<char>         {nc_get_att_text,   nullptr,           nc_get_var_text,   nc_put_var_text,   nc_get_var1_text,   nc_put_var1_text,   nc_get_vara_text,   nc_put_vara_text,   nc_get_vars_text,   nc_put_vars_text},
};
// clang-format on

/// Calls `verb` with the functions of the member that a call means.
template <class Verb>
Results withMember(const Call &call, const Verb &verb) {
    Results results;
    const auto tryEach = [&]<std::size_t... i>(std::index_sequence<i...>) {
        return ((call.operation.member == i && (results = verb(std::get<i>(types)), true)) || ...);
    };
    tryEach(std::make_index_sequence<members.size()>{});
    return results;
}

template <class T>
constexpr bool isText = std::is_same_v<T, char>;

/// Values as the host shows them: numbers as they are, bytes of text as wide as host characters.
template <class T>
Result shown(const Call &call, const std::vector<T> &values, std::vector<std::size_t> dims) {
    const tsClassID classID = members.at(call.operation.member).classID;
    if constexpr (isText<T>) {
        std::vector<std::uint16_t> wide(values.size());
        std::transform(values.begin(), values.end(), wide.begin(), [&](char byte) {
            return call.deviation == Deviation::unsignedText
                       ? static_cast<std::uint16_t>(static_cast<unsigned char>(byte))
                       : static_cast<std::uint16_t>(static_cast<signed char>(byte));
        });
        return {classID, std::move(dims), bytesOf(wide), {}};
    } else {
        return {classID, std::move(dims), bytesOf(values), {}};
    }
}

/// Has `read` fill a block of the given lengths, which are in the library's order.
template <class T, class Read>
Results readBlock(const Call &call, const std::vector<std::size_t> &lengths, const Read &read) {
    std::vector<T> values(wantRoom(lengths, isText<T> ? sizeof(std::uint16_t) : sizeof(T)));
    T none{};
    call.check(read(values.empty() ? &none : values.data()));
    std::vector<std::size_t> dims(lengths.rbegin(), lengths.rend());
    dims.resize(std::max<std::size_t>(dims.size(), 2), 1);
    return {shown(call, values, std::move(dims))};
}

/// Has `read` fill a list whose text ends at the first zero byte.
template <class T, class Read>
Results readList(const Call &call, std::size_t length, const std::vector<std::size_t> &dims,
                 const Read &read) {
    std::vector<T> values(length + 1);
    call.check(read(values.data()));
    values.pop_back();
    if constexpr (isText<T>) {
        return {string({values.begin(), std::find(values.begin(), values.end(), '\0')})};
    } else {
        return {shown(call, values, dims)};
    }
}

/// The values of a write, as the library takes them.
template <class T>
std::vector<T> written(const Call &call, const Value &data) {
    std::vector<T> values(data.elements.size());
    std::transform(data.elements.begin(), data.elements.end(), values.begin(), [](double element) {
        if constexpr (isText<T>) {
            return static_cast<char>(static_cast<unsigned>(element) & 0xFFU);
        } else {
            return static_cast<T>(element);
        }
    });
    if (call.deviation == Deviation::swappedValues && values.size() > 1) {
        std::swap(values[0], values[1]);
    }
    return values;
}

struct Variable {
    explicit Variable(const Call &call) : ncid(call.id(0, "ncid")), varid(call.id(1, "varid")) {}
    int ncid;
    int varid;
};

/// The number of dimensions of a variable; `failed` is told the status of the inquiry.
template <class Failed>
std::size_t dimensionsOf(const Variable &variable, const Failed &failed) {
    int ndims = 0;
    failed(nc_inq_var(variable.ncid, variable.varid, nullptr, nullptr, &ndims, nullptr, nullptr));
    return static_cast<std::size_t>(ndims);
}

/// The lengths of a variable's dimensions now.
template <class Failed>
std::vector<std::size_t> lengthsOf(const Variable &variable, const Failed &failed) {
    std::vector<int> dimids(dimensionsOf(variable, failed));
    failed(nc_inq_vardimid(variable.ncid, variable.varid, dimids.data()));
    std::vector<std::size_t> lengths(dimids.size());
    for (std::size_t i = 0; i < dimids.size(); ++i) {
        failed(nc_inq_dimlen(variable.ncid, dimids[i], &lengths[i]));
    }
    return lengths;
}

std::size_t product(const std::vector<std::size_t> &lengths) {
    return std::accumulate(lengths.begin(), lengths.end(), std::size_t{1}, std::multiplies<>());
}

/// The frame of the writes of parts: what is asked between the data's class and the library.
template <class Then>
Results writePart(const Call &call, const Variable &at, const Value &data,
                  const std::vector<std::pair<std::size_t, const char *>> &lengths,
                  const Then &then) {
    if (call.deviation != Deviation::laterChecks) {
        wantData(data, call.operation);
    }
    const bool single = call.operation.verb == Verb::putVar1;
    call.want(!single || data.elements.size() == 1, "dataSizeMismatch");
    const std::size_t ndims = dimensionsOf(
        at, [&](int status) { call.want(status == NC_NOERR, "inqVarNDimsFailure", status); });
    for (const auto &[length, word] : lengths) {
        call.want(length == ndims, word);
    }
    if (call.deviation == Deviation::laterChecks) {
        wantData(data, call.operation);
    }
    return withMember(call, [&]<class T>(const Functions<T> &functions) -> Results {
        call.check(then(functions, written<T>(call, data).data()));
        return {};
    });
}

} // namespace

Results getAtt(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const int varid = call.id(1, "varid");
    const std::string name = readName(call[2], "attribute");
    nc_type type = NC_NAT;
    std::size_t length = 0;
    call.check(nc_inq_att(ncid, varid, name.c_str(), &type, &length));
    return withMember(call, [&]<class T>(const Functions<T> &functions) {
        return readList<T>(call, length, {length == 0 ? 0U : 1U, length}, [&](T *values) {
            return functions.getAtt(ncid, varid, name.c_str(), values);
        });
    });
}

Results putAtt(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const int varid = call.id(1, "varid");
    const std::string name = readName(call[2], "attribute");
    const nc_type type = readType(call[3]);
    wantData(call[4], call.operation);
    return withMember(call, [&]<class T>(const Functions<T> &functions) -> Results {
        const std::vector<T> values = written<T>(call, call[4]);
        call.check(functions.putAtt(ncid, varid, name.c_str(), type, values.size(), values.data()));
        return {};
    });
}

Results putAttText(const Call &call) {
    const int ncid = call.id(0, "ncid");
    const int varid = call.id(1, "varid");
    const std::string name = readName(call[2], "attribute");
    wantData(call[3], call.operation);
    const std::vector<char> bytes = written<char>(call, call[3]);
    call.check(nc_put_att_text(ncid, varid, name.c_str(), bytes.size(), bytes.data()));
    return {};
}

Results getVar(const Call &call) {
    const Variable at(call);
    // The first inquiry that fails is the one for the number of dimensions: the variable is there
    // for those that follow it.
    const std::vector<std::size_t> lengths =
        lengthsOf(at, [&](int status) { call.check(status, "numDimsInquiry:"); });
    return withMember(call, [&]<class T>(const Functions<T> &functions) {
        return readBlock<T>(call, lengths,
                            [&](T *data) { return functions.getVar(at.ncid, at.varid, data); });
    });
}

Results putVar(const Call &call) {
    const Variable at(call);
    wantData(call[2], call.operation);
    const std::vector<std::size_t> lengths = lengthsOf(at, [&](int status) { call.check(status); });
    call.want(product(lengths) == call[2].elements.size(), "dataSizeMismatch");
    return withMember(call, [&]<class T>(const Functions<T> &functions) -> Results {
        call.check(functions.putVar(at.ncid, at.varid, written<T>(call, call[2]).data()));
        return {};
    });
}

Results getVar1(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> index = readPositions(call[2], "start");
    const std::size_t ndims = dimensionsOf(at, [&](int status) { call.check(status); });
    call.want(index.size() == ndims, "indexVectorLengthMismatch");
    return withMember(call, [&]<class T>(const Functions<T> &functions) {
        return readList<T>(call, 1, {1, 1}, [&](T *value) {
            return functions.getVar1(at.ncid, at.varid, index.data(), value);
        });
    });
}

Results putVar1(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> index = readPositions(call[2], "start");
    return writePart(call, at, call[3], {{index.size(), "badStartLength"}},
                     [&]<class T>(const Functions<T> &functions, const T *data) {
                         return functions.putVar1(at.ncid, at.varid, index.data(), data);
                     });
}

Results getVara(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> start = readPositions(call[2], "start");
    const std::vector<std::size_t> count = readPositions(call[3], "count");
    const std::size_t ndims =
        dimensionsOf(at, [&](int status) { call.check(status, "numDimsInquiry:"); });
    call.want(start.size() == ndims, "startVectorLengthMismatch");
    call.want(count.size() == ndims, "countVectorLengthMismatch");
    return withMember(call, [&]<class T>(const Functions<T> &functions) {
        return readBlock<T>(call, count, [&](T *data) {
            return functions.getVara(at.ncid, at.varid, start.data(), count.data(), data);
        });
    });
}

Results putVara(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> start = readPositions(call[2], "start");
    const std::vector<std::size_t> count = readPositions(call[3], "count");
    return writePart(
        call, at, call[4], {{start.size(), "badStartLength"}, {count.size(), "badCountLength"}},
        [&]<class T>(const Functions<T> &functions, const T *data) {
            call.want(product(count) == call[4].elements.size(), "dataSizeMismatch");
            return functions.putVara(at.ncid, at.varid, start.data(), count.data(), data);
        });
}

Results getVars(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> start = readPositions(call[2], "start");
    const std::vector<std::size_t> count = readPositions(call[3], "count");
    const std::vector<std::ptrdiff_t> stride = readStrides(call[4]);
    const std::size_t ndims = dimensionsOf(
        at, [&](int status) { call.want(status == NC_NOERR, "numVarsInquiryFailure", status); });
    call.want(start.size() == ndims, "startVectorLengthMismatch");
    call.want(count.size() == ndims, "countVectorLengthMismatch");
    call.want(stride.size() == ndims, "strideVectorLengthMismatch");
    return withMember(call, [&]<class T>(const Functions<T> &functions) {
        return readBlock<T>(call, count, [&](T *data) {
            return functions.getVars(at.ncid, at.varid, start.data(), count.data(), stride.data(),
                                     data);
        });
    });
}

Results putVars(const Call &call) {
    const Variable at(call);
    const std::vector<std::size_t> start = readPositions(call[2], "start");
    const std::vector<std::size_t> count = readPositions(call[3], "count");
    const std::vector<std::ptrdiff_t> stride = readStrides(call[4]);
    return writePart(call, at, call[5],
                     {{start.size(), "badStartLength"},
                      {count.size(), "badCountLength"},
                      {stride.size(), "badStrideLength"}},
                     [&]<class T>(const Functions<T> &functions, const T *data) {
                         call.want(product(count) == call[5].elements.size(), "dataSizeMismatch");
                         return functions.putVars(at.ncid, at.varid, start.data(), count.data(),
                                                  stride.data(), data);
                     });
}

} // namespace difference
