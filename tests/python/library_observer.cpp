// tests/python/library_observer.cpp: stands before the library's functions and notes where the data
// are that it is given. To be loaded with its symbols visible before a module is.
#include <dlfcn.h>

namespace {

const void *lastData = nullptr;

template <class Data>
int forward(const char *name, int ncid, int varid, Data *data) {
    lastData = data;
    using Function = int (*)(int, int, Data *);
    return reinterpret_cast<Function>(dlsym(RTLD_NEXT, name))(ncid, varid, data);
}

} // namespace

extern "C" {

int nc_get_var_double(int ncid, int varid, double *data) {
    return forward("nc_get_var_double", ncid, varid, data);
}

int nc_put_var_double(int ncid, int varid, const double *data) {
    return forward("nc_put_var_double", ncid, varid, data);
}

/// The data of the last of these calls.
const void *observed_data() {
    return lastData;
}
}
