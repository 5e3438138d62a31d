// tests/support/library_functions.cpp: the library's functions that the module calls, as the module
// sees them.
#include "support/probe.hpp"
#include "support/text.hpp"

#include <netcdf.h>

using namespace tessel::test;

const char *nc_strerror(int status) {
    if (Probe *const probe = Probe::watching()) {
        probe->note("nc_strerror(" + shown(status) + ")");
        if (probe->explained()) {
            return probe->explained()->c_str();
        }
    }
    return hidden<const char *, int>("nc_strerror")(status);
}

const char *nc_inq_libvers() {
    if (Probe *const probe = Probe::watching()) {
        probe->note("nc_inq_libvers()");
    }
    return hidden<const char *>("nc_inq_libvers")();
}

// clang-format off

int nc_open(const char *path, int mode, int *ncidp) { return probed("nc_open", path, mode, ncidp); }
int nc__open(const char *path, int mode, size_t *chunksizehintp, int *ncidp) { return probed("nc__open", path, mode, chunksizehintp, ncidp); }
int nc_create(const char *path, int cmode, int *ncidp) { return probed("nc_create", path, cmode, ncidp); }
int nc__create(const char *path, int cmode, size_t initialsz, size_t *chunksizehintp, int *ncidp) { return probed("nc__create", path, cmode, initialsz, chunksizehintp, ncidp); }

int nc_close(int ncid) { return probed("nc_close", ncid); }
int nc_abort(int ncid) { return probed("nc_abort", ncid); }
int nc_sync(int ncid) { return probed("nc_sync", ncid); }
int nc_redef(int ncid) { return probed("nc_redef", ncid); }
int nc_enddef(int ncid) { return probed("nc_enddef", ncid); }
int nc__enddef(int ncid, size_t h_minfree, size_t v_align, size_t v_minfree, size_t r_align) { return probed("nc__enddef", ncid, h_minfree, v_align, v_minfree, r_align); }
int nc_set_fill(int ncid, int fillmode, int *old_modep) { return probed("nc_set_fill", ncid, fillmode, old_modep); }
int nc_set_default_format(int format, int *old_formatp) { return probed("nc_set_default_format", format, old_formatp); }

int nc_inq(int ncid, int *ndimsp, int *nvarsp, int *nattsp, int *unlimdimidp) { return probed("nc_inq", ncid, ndimsp, nvarsp, nattsp, unlimdimidp); }

int nc_def_dim(int ncid, const char *name, size_t len, int *idp) { return probed("nc_def_dim", ncid, name, len, idp); }
int nc_inq_dim(int ncid, int dimid, char *name, size_t *lenp) { return probed("nc_inq_dim", ncid, dimid, name, lenp); }
int nc_inq_dimid(int ncid, const char *name, int *idp) { return probed("nc_inq_dimid", ncid, name, idp); }
int nc_inq_dimlen(int ncid, int dimid, size_t *lenp) { return probed("nc_inq_dimlen", ncid, dimid, lenp); }
int nc_rename_dim(int ncid, int dimid, const char *name) { return probed("nc_rename_dim", ncid, dimid, name); }

int nc_def_var(int ncid, const char *name, nc_type xtype, int ndims, const int *dimidsp, int *varidp) { return probed("nc_def_var", ncid, name, xtype, ndims, dimidsp, varidp); }
int nc_inq_var(int ncid, int varid, char *name, nc_type *xtypep, int *ndimsp, int *dimidsp, int *nattsp) { return probed("nc_inq_var", ncid, varid, name, xtypep, ndimsp, dimidsp, nattsp); }
int nc_inq_varid(int ncid, const char *name, int *varidp) { return probed("nc_inq_varid", ncid, name, varidp); }
int nc_inq_varndims(int ncid, int varid, int *ndimsp) { return probed("nc_inq_varndims", ncid, varid, ndimsp); }
int nc_inq_vardimid(int ncid, int varid, int *dimidsp) { return probed("nc_inq_vardimid", ncid, varid, dimidsp); }
int nc_rename_var(int ncid, int varid, const char *name) { return probed("nc_rename_var", ncid, varid, name); }

int nc_inq_att(int ncid, int varid, const char *name, nc_type *xtypep, size_t *lenp) { return probed("nc_inq_att", ncid, varid, name, xtypep, lenp); }
int nc_inq_attid(int ncid, int varid, const char *name, int *idp) { return probed("nc_inq_attid", ncid, varid, name, idp); }
int nc_inq_attname(int ncid, int varid, int attnum, char *name) { return probed("nc_inq_attname", ncid, varid, attnum, name); }
int nc_rename_att(int ncid, int varid, const char *name, const char *newname) { return probed("nc_rename_att", ncid, varid, name, newname); }
int nc_del_att(int ncid, int varid, const char *name) { return probed("nc_del_att", ncid, varid, name); }
int nc_copy_att(int ncid_in, int varid_in, const char *name, int ncid_out, int varid_out) { return probed("nc_copy_att", ncid_in, varid_in, name, ncid_out, varid_out); }

int nc_get_att_double(int ncid, int varid, const char *name, double *ip) { return probed("nc_get_att_double", ncid, varid, name, ip); }
int nc_get_att_float(int ncid, int varid, const char *name, float *ip) { return probed("nc_get_att_float", ncid, varid, name, ip); }
int nc_get_att_int(int ncid, int varid, const char *name, int *ip) { return probed("nc_get_att_int", ncid, varid, name, ip); }
int nc_get_att_short(int ncid, int varid, const char *name, short *ip) { return probed("nc_get_att_short", ncid, varid, name, ip); }
int nc_get_att_schar(int ncid, int varid, const char *name, signed char *ip) { return probed("nc_get_att_schar", ncid, varid, name, ip); }
int nc_get_att_uchar(int ncid, int varid, const char *name, unsigned char *ip) { return probed("nc_get_att_uchar", ncid, varid, name, ip); }
int nc_get_att_text(int ncid, int varid, const char *name, char *ip) { return probed("nc_get_att_text", ncid, varid, name, ip); }

int nc_put_att_double(int ncid, int varid, const char *name, nc_type xtype, size_t len, const double *op) { return probed("nc_put_att_double", ncid, varid, name, xtype, len, op); }
int nc_put_att_float(int ncid, int varid, const char *name, nc_type xtype, size_t len, const float *op) { return probed("nc_put_att_float", ncid, varid, name, xtype, len, op); }
int nc_put_att_int(int ncid, int varid, const char *name, nc_type xtype, size_t len, const int *op) { return probed("nc_put_att_int", ncid, varid, name, xtype, len, op); }
int nc_put_att_short(int ncid, int varid, const char *name, nc_type xtype, size_t len, const short *op) { return probed("nc_put_att_short", ncid, varid, name, xtype, len, op); }
int nc_put_att_schar(int ncid, int varid, const char *name, nc_type xtype, size_t len, const signed char *op) { return probed("nc_put_att_schar", ncid, varid, name, xtype, len, op); }
int nc_put_att_uchar(int ncid, int varid, const char *name, nc_type xtype, size_t len, const unsigned char *op) { return probed("nc_put_att_uchar", ncid, varid, name, xtype, len, op); }
int nc_put_att_text(int ncid, int varid, const char *name, size_t len, const char *op) { return probed("nc_put_att_text", ncid, varid, name, len, op); }

int nc_get_var_double(int ncid, int varid, double *ip) { return probed("nc_get_var_double", ncid, varid, ip); }
int nc_get_var_float(int ncid, int varid, float *ip) { return probed("nc_get_var_float", ncid, varid, ip); }
int nc_get_var_int(int ncid, int varid, int *ip) { return probed("nc_get_var_int", ncid, varid, ip); }
int nc_get_var_short(int ncid, int varid, short *ip) { return probed("nc_get_var_short", ncid, varid, ip); }
int nc_get_var_schar(int ncid, int varid, signed char *ip) { return probed("nc_get_var_schar", ncid, varid, ip); }
int nc_get_var_uchar(int ncid, int varid, unsigned char *ip) { return probed("nc_get_var_uchar", ncid, varid, ip); }
int nc_get_var_text(int ncid, int varid, char *ip) { return probed("nc_get_var_text", ncid, varid, ip); }

int nc_get_var1_double(int ncid, int varid, const size_t *indexp, double *ip) { return probed("nc_get_var1_double", ncid, varid, indexp, ip); }
int nc_get_var1_float(int ncid, int varid, const size_t *indexp, float *ip) { return probed("nc_get_var1_float", ncid, varid, indexp, ip); }
int nc_get_var1_int(int ncid, int varid, const size_t *indexp, int *ip) { return probed("nc_get_var1_int", ncid, varid, indexp, ip); }
int nc_get_var1_short(int ncid, int varid, const size_t *indexp, short *ip) { return probed("nc_get_var1_short", ncid, varid, indexp, ip); }
int nc_get_var1_schar(int ncid, int varid, const size_t *indexp, signed char *ip) { return probed("nc_get_var1_schar", ncid, varid, indexp, ip); }
int nc_get_var1_uchar(int ncid, int varid, const size_t *indexp, unsigned char *ip) { return probed("nc_get_var1_uchar", ncid, varid, indexp, ip); }
int nc_get_var1_text(int ncid, int varid, const size_t *indexp, char *ip) { return probed("nc_get_var1_text", ncid, varid, indexp, ip); }

int nc_get_vara_double(int ncid, int varid, const size_t *startp, const size_t *countp, double *ip) { return probed("nc_get_vara_double", ncid, varid, startp, countp, ip); }
int nc_get_vara_float(int ncid, int varid, const size_t *startp, const size_t *countp, float *ip) { return probed("nc_get_vara_float", ncid, varid, startp, countp, ip); }
int nc_get_vara_int(int ncid, int varid, const size_t *startp, const size_t *countp, int *ip) { return probed("nc_get_vara_int", ncid, varid, startp, countp, ip); }
int nc_get_vara_short(int ncid, int varid, const size_t *startp, const size_t *countp, short *ip) { return probed("nc_get_vara_short", ncid, varid, startp, countp, ip); }
int nc_get_vara_schar(int ncid, int varid, const size_t *startp, const size_t *countp, signed char *ip) { return probed("nc_get_vara_schar", ncid, varid, startp, countp, ip); }
int nc_get_vara_uchar(int ncid, int varid, const size_t *startp, const size_t *countp, unsigned char *ip) { return probed("nc_get_vara_uchar", ncid, varid, startp, countp, ip); }
int nc_get_vara_text(int ncid, int varid, const size_t *startp, const size_t *countp, char *ip) { return probed("nc_get_vara_text", ncid, varid, startp, countp, ip); }

int nc_get_vars_double(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, double *ip) { return probed("nc_get_vars_double", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_float(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, float *ip) { return probed("nc_get_vars_float", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_int(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, int *ip) { return probed("nc_get_vars_int", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_short(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, short *ip) { return probed("nc_get_vars_short", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_schar(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, signed char *ip) { return probed("nc_get_vars_schar", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_uchar(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, unsigned char *ip) { return probed("nc_get_vars_uchar", ncid, varid, startp, countp, stridep, ip); }
int nc_get_vars_text(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, char *ip) { return probed("nc_get_vars_text", ncid, varid, startp, countp, stridep, ip); }

int nc_put_var_double(int ncid, int varid, const double *op) { return probed("nc_put_var_double", ncid, varid, op); }
int nc_put_var_float(int ncid, int varid, const float *op) { return probed("nc_put_var_float", ncid, varid, op); }
int nc_put_var_int(int ncid, int varid, const int *op) { return probed("nc_put_var_int", ncid, varid, op); }
int nc_put_var_short(int ncid, int varid, const short *op) { return probed("nc_put_var_short", ncid, varid, op); }
int nc_put_var_schar(int ncid, int varid, const signed char *op) { return probed("nc_put_var_schar", ncid, varid, op); }
int nc_put_var_uchar(int ncid, int varid, const unsigned char *op) { return probed("nc_put_var_uchar", ncid, varid, op); }
int nc_put_var_text(int ncid, int varid, const char *op) { return probed("nc_put_var_text", ncid, varid, op); }

int nc_put_var1_double(int ncid, int varid, const size_t *indexp, const double *op) { return probed("nc_put_var1_double", ncid, varid, indexp, op); }
int nc_put_var1_float(int ncid, int varid, const size_t *indexp, const float *op) { return probed("nc_put_var1_float", ncid, varid, indexp, op); }
int nc_put_var1_int(int ncid, int varid, const size_t *indexp, const int *op) { return probed("nc_put_var1_int", ncid, varid, indexp, op); }
int nc_put_var1_short(int ncid, int varid, const size_t *indexp, const short *op) { return probed("nc_put_var1_short", ncid, varid, indexp, op); }
int nc_put_var1_schar(int ncid, int varid, const size_t *indexp, const signed char *op) { return probed("nc_put_var1_schar", ncid, varid, indexp, op); }
int nc_put_var1_uchar(int ncid, int varid, const size_t *indexp, const unsigned char *op) { return probed("nc_put_var1_uchar", ncid, varid, indexp, op); }
int nc_put_var1_text(int ncid, int varid, const size_t *indexp, const char *op) { return probed("nc_put_var1_text", ncid, varid, indexp, op); }

int nc_put_vara_double(int ncid, int varid, const size_t *startp, const size_t *countp, const double *op) { return probed("nc_put_vara_double", ncid, varid, startp, countp, op); }
int nc_put_vara_float(int ncid, int varid, const size_t *startp, const size_t *countp, const float *op) { return probed("nc_put_vara_float", ncid, varid, startp, countp, op); }
int nc_put_vara_int(int ncid, int varid, const size_t *startp, const size_t *countp, const int *op) { return probed("nc_put_vara_int", ncid, varid, startp, countp, op); }
int nc_put_vara_short(int ncid, int varid, const size_t *startp, const size_t *countp, const short *op) { return probed("nc_put_vara_short", ncid, varid, startp, countp, op); }
int nc_put_vara_schar(int ncid, int varid, const size_t *startp, const size_t *countp, const signed char *op) { return probed("nc_put_vara_schar", ncid, varid, startp, countp, op); }
int nc_put_vara_uchar(int ncid, int varid, const size_t *startp, const size_t *countp, const unsigned char *op) { return probed("nc_put_vara_uchar", ncid, varid, startp, countp, op); }
int nc_put_vara_text(int ncid, int varid, const size_t *startp, const size_t *countp, const char *op) { return probed("nc_put_vara_text", ncid, varid, startp, countp, op); }

int nc_put_vars_double(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const double *op) { return probed("nc_put_vars_double", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_float(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const float *op) { return probed("nc_put_vars_float", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_int(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const int *op) { return probed("nc_put_vars_int", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_short(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const short *op) { return probed("nc_put_vars_short", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_schar(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const signed char *op) { return probed("nc_put_vars_schar", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_uchar(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const unsigned char *op) { return probed("nc_put_vars_uchar", ncid, varid, startp, countp, stridep, op); }
int nc_put_vars_text(int ncid, int varid, const size_t *startp, const size_t *countp, const ptrdiff_t *stridep, const char *op) { return probed("nc_put_vars_text", ncid, varid, startp, countp, stridep, op); }

// clang-format on
