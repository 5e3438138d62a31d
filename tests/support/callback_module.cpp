// tests/support/callback_module.cpp: a module that calls back the program that called it.
#include "tessel/extension.h"

extern "C" void tesselTestBody(tsArray *plhs[]);

void tsxFunction(int /*nlhs*/, tsArray *plhs[], int /*nrhs*/, const tsArray * /*prhs*/[]) {
    tesselTestBody(plhs);
}
