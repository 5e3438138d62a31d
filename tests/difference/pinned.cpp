// tests/difference/pinned.cpp: programs that are run every time.
//
// A program that was printed as a difference is pasted here once what it found is mended.
#include "pinned.hpp"

#include <cmath>

namespace difference {

const std::vector<Pinned> &pinnedPrograms() {
    static const std::vector<Pinned> list = {
        {"records of two variables, by block and by stride",
         12,
         {
             {"create", {file(0), num(512)}},
             {"def_dim", {dataset(0), text("time"), num(0)}},
             {"def_dim", {dataset(0), text("x"), num(3)}},
             {"def_var", {dataset(0), text("a"), num(3), row({1, 0})}},
             {"def_var", {dataset(0), text("b"), num(1), row({0})}},
             {"enddef", {dataset(0)}},
             {"put_vara_double", {dataset(0), num(0), row({0, 1}), row({3, 1}), row({1, 2, 3})}},
             {"put_vars_int",
              {dataset(0), num(0), row({0, 0}), row({2, 2}), row({2, 2}),
               of(tsINT32, {4, 5, 6, 7})}},
             {"put_var1_schar", {dataset(0), num(1), num(3), of(tsINT8, {-5})}},
             {"get_var_float", {dataset(0), num(0)}},
             {"get_vars_uchar", {dataset(0), num(0), row({0, 0}), row({2, 2}), row({2, 2})}},
             {"put_var1_short", {dataset(0), num(1), num(3), of(tsINT16, {300})}},
             {"get_var_short", {dataset(0), num(1)}},
         }},
        {"text with every kind of byte, and its way back",
         9,
         {
             {"nc_create", {file(1), text("noclobber")}},
             {"def_dim", {dataset(1), text("n"), num(4)}},
             {"def_var", {dataset(1), of(tsCHAR, {233, 8364}), num(2), num(0)}},
             {"put_att_text", {dataset(1), num(-1), text("t"), of(tsCHAR, {195, 169, 233, 0, 65})}},
             {"end_def", {dataset(1)}},
             {"put_var_text", {dataset(1), num(0), of(tsCHAR, {65, 233, 65535, 256})}},
             {"get_var_text", {dataset(1), num(0)}},
             {"get_var1_text", {dataset(1), num(0), num(3)}},
             {"get_att_text", {dataset(1), num(-1), text("t")}},
             {"get_att_double", {dataset(1), num(-1), text("t")}},
         }},
        {"checks come in their order",
         4,
         {
             {"create", {file(0), num(0)}},
             {"def_dim", {dataset(0), text("x"), num(2)}},
             {"def_var", {dataset(0), text("v"), num(6), num(0)}},
             {"enddef", {dataset(0)}},
             {"put_var1_double", {dataset(0), num(9), num(0), row({1, 2})}},
             {"put_vara_double", {dataset(0), num(9), num(0), num(2), num(1)}},
             {"put_vars_double", {dataset(0), num(0), row({0, 0}), row({1, 1}), num(1), num(1)}},
             {"get_vars_double", {dataset(0), num(0), num(0), num(1), row({1, 1})}},
             {"put_var_int", {dataset(0), num(9), row({1, 2})}},
             {"put_vara_int", {dataset(0), num(NAN), num(INFINITY), row({}), row({})}},
             {"get_vara_double", {dataset(0), num(0), num(0), num(-1)}},
         }},
        {"an integer that is read as half a double",
         2,
         {
             {"set_default_format", {of(tsINT32, {0, 1073741824})}},
             {"set_default_format", {of(tsINT32, {9, 1, 1})}},
             {"create", {file(0), num(0)}},
         }},
        {"empty attributes and empty reads",
         9,
         {
             {"_create", {file(2), num(0), num(512), num(1)}},
             {"def_dim", {dataset(2), text("t"), num(0)}},
             {"def_var", {dataset(2), text("v"), num(4), num(0)}},
             {"put_att_double", {dataset(2), num(0), text("e"), num(6), row({})}},
             {"put_att_text", {dataset(2), num(0), text("f"), of(tsCHAR, {0, 0}, {})}},
             {"_enddef", {dataset(2), num(10), num(4), num(0), num(4)}},
             {"get_var_int", {dataset(2), num(0)}},
             {"get_att_text", {dataset(2), num(0), text("e")}},
             {"get_att_short", {dataset(2), num(0), text("f")}},
         }},
    };
    return list;
}

} // namespace difference
