/* host/tessel/extension.h: what a module exports, and how it fails.
 *
 * Loading. A host opens the module file with its own ts and tsx functions visible to it and looks
 * up tsxFunction. The module exports that symbol and no other, and leaves the host's functions
 * undefined.
 *
 * Serialising. Calls into one module do not overlap: the host sees to it. Where several modules
 * share a library that is not thread-safe, the host serialises the calls into all of them.
 */
#ifndef TESSEL_EXTENSION_H
#define TESSEL_EXTENSION_H

#include "tessel/array.h"

/* What each language says of a function that does not return. */
#ifdef __cplusplus
#define TESSEL_NORETURN [[noreturn]]
extern "C" {
#else
#define TESSEL_NORETURN _Noreturn
#endif

/* The one entry point of a module, defined by it.
 *
 * nlhs, plhs: the number of outputs that the caller asked for, and the output slots: at least 8 of
 * them whatever nlhs is, all NULL at entry. The module fills every slot its operation defines.
 * nrhs, prhs: the number of inputs and the inputs, read-only, alive and unmoved for the whole call.
 *
 * Rationale: slots beyond nlhs are there because a module has one way to give results, and the
 * host, which knows what was asked for, is the one to drop what was not. */
void tsxFunction(int nlhs, tsArray *plhs[], int nrhs, const tsArray *prhs[]);

/* Ends the call with a host error. The identifier is colon-separated; the message is formatted as
 * printf does. Does not return: it leaves the call as a C++ exception of the host's own type,
 * through the module's frames, so that destructors run. The module never catches it, and no
 * function between a raise and the entry point is noexcept. What a user typed is an argument, never
 * the format. Not to be called while another C++ exception is being handled.
 *
 * A C++ exception of another type that leaves the module (memory short in a standard container,
 * say) is turned into a host error by the host; it never ends the process. */
TESSEL_NORETURN void tsxErrMsgIdAndTxt(const char *identifier, const char *format, ...)
#ifdef __GNUC__
    __attribute__((format(printf, 2, 3)))
#endif
    ;

#ifdef __cplusplus
}
#endif

#endif
