// tests/threads/forking.cpp: a module that forks within a call.
#include "tessel/host.h"

#include <unistd.h>

extern "C" void tsxFunction(int /*nlhs*/, tsArray *plhs[], int /*nrhs*/,
                            const tsArray * /*prhs*/[]) {
    plhs[0] = tsCreateDoubleScalar(fork());
}
