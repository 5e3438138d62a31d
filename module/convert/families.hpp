// module/convert/families.hpp: the families of library functions over the memory types.
//
// A family is a row of library functions, and what differs for text is said once, in the buffers.
#pragma once

#include "call/catalogue.hpp"
#include "call/operation.hpp"
#include "convert/memory.hpp"

#include <netcdf.h>

#include <cstddef>
#include <tuple>
#include <utility>

namespace tessel::netcdf {

/// One family of the operation table: the id of its first row, the error for an entry that is not
/// of it, and its library functions, of type Signature<T> for memory type T. These types all
/// differ, so that a swapped column does not compile.
template <template <class T> class Signature, class Types = MemoryTypes>
struct Family;

template <template <class T> class Signature, class... T>
struct Family<Signature, TypeList<T...>> {
    int firstID;
    Error<const char *> foreign;
    std::tuple<Signature<T> *...> functions;
};

// clang-format off

template <class T> using GetAtt  = int(int ncid, int varid, const char *name, T *values);
template <class T> using GetVar  = int(int ncid, int varid, T *data);
template <class T> using GetVar1 = int(int ncid, int varid, const std::size_t *index, T *value);
template <class T> using GetVara = int(int ncid, int varid, const std::size_t *start, const std::size_t *count, T *data);
template <class T> using GetVars = int(int ncid, int varid, const std::size_t *start, const std::size_t *count, const std::ptrdiff_t *stride, T *data);
template <class T> using PutAtt  = int(int ncid, int varid, const char *name, nc_type type, std::size_t count, const T *values);
template <class T> using PutVar  = int(int ncid, int varid, const T *data);
template <class T> using PutVar1 = int(int ncid, int varid, const std::size_t *index, const T *value);
template <class T> using PutVara = int(int ncid, int varid, const std::size_t *start, const std::size_t *count, const T *data);
template <class T> using PutVars = int(int ncid, int varid, const std::size_t *start, const std::size_t *count, const std::ptrdiff_t *stride, const T *data);

inline constexpr Family<GetAtt>  getAtt  = {11, catalogue::getAttForeign,  {nc_get_att_double,  nc_get_att_float,  nc_get_att_int,  nc_get_att_short,  nc_get_att_schar,  nc_get_att_uchar,  nc_get_att_text}};
inline constexpr Family<GetVar>  getVar  = {18, catalogue::getVarForeign,  {nc_get_var_double,  nc_get_var_float,  nc_get_var_int,  nc_get_var_short,  nc_get_var_schar,  nc_get_var_uchar,  nc_get_var_text}};
inline constexpr Family<GetVar1> getVar1 = {25, catalogue::getVar1Foreign, {nc_get_var1_double, nc_get_var1_float, nc_get_var1_int, nc_get_var1_short, nc_get_var1_schar, nc_get_var1_uchar, nc_get_var1_text}};
inline constexpr Family<GetVara> getVara = {32, catalogue::getVaraForeign, {nc_get_vara_double, nc_get_vara_float, nc_get_vara_int, nc_get_vara_short, nc_get_vara_schar, nc_get_vara_uchar, nc_get_vara_text}};
inline constexpr Family<GetVars> getVars = {39, catalogue::getVarsForeign, {nc_get_vars_double, nc_get_vars_float, nc_get_vars_int, nc_get_vars_short, nc_get_vars_schar, nc_get_vars_uchar, nc_get_vars_text}};
inline constexpr Family<PutVar>  putVar  = {66, catalogue::putVarForeign,  {nc_put_var_double,  nc_put_var_float,  nc_put_var_int,  nc_put_var_short,  nc_put_var_schar,  nc_put_var_uchar,  nc_put_var_text}};
inline constexpr Family<PutVar1> putVar1 = {87, catalogue::putVar1Foreign, {nc_put_var1_double, nc_put_var1_float, nc_put_var1_int, nc_put_var1_short, nc_put_var1_schar, nc_put_var1_uchar, nc_put_var1_text}};
inline constexpr Family<PutVara> putVara = {73, catalogue::putVaraForeign, {nc_put_vara_double, nc_put_vara_float, nc_put_vara_int, nc_put_vara_short, nc_put_vara_schar, nc_put_vara_uchar, nc_put_vara_text}};
inline constexpr Family<PutVars> putVars = {80, catalogue::putVarsForeign, {nc_put_vars_double, nc_put_vars_float, nc_put_vars_int, nc_put_vars_short, nc_put_vars_schar, nc_put_vars_uchar, nc_put_vars_text}};

// Numbers alone: text takes no external type, and has a handler of its own.
inline constexpr Family<PutAtt, NumericMemoryTypes> putAtt = {59, catalogue::putAttForeign, {nc_put_att_double, nc_put_att_float, nc_put_att_int, nc_put_att_short, nc_put_att_schar, nc_put_att_uchar}};

// clang-format on

/// Calls `verb` with the family's library function that the entry means, and gives back the status.
/// Raises the family's own error for an entry that is not of the family.
template <template <class T> class Signature, class Types, class Verb>
int withMember(const Family<Signature, Types> &family, const OperationEntry *entry,
               const Verb &verb) {
    const int member = entry->id - family.firstID;
    int status = 0;
    const auto tryEach = [&]<int... at>(std::integer_sequence<int, at...>) {
        return ((member == at && (status = verb(std::get<at>(family.functions)), true)) || ...);
    };
    if (!tryEach(std::make_integer_sequence<int, Types::size>{})) {
        raise(family.foreign, entry->shortName);
    }
    return status;
}

} // namespace tessel::netcdf
