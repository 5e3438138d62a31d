/* host/tessel/memory.h: the host's allocator, for what lives no longer than one call.
 *
 * Everything allocated here and not freed is reclaimed by the host when the call ends, normally or
 * by a raise. Call these only from within a call of tsxFunction.
 */
#ifndef TESSEL_MEMORY_H
#define TESSEL_MEMORY_H

#include "tessel/array.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Zero-filled memory for `count` elements of `size` bytes, aligned for every type; NULL when there
 * is none, the one failure of the host that is reported and not raised. A request for no bytes may
 * be answered NULL as well. */
void *tsCalloc(size_t count, size_t size);

/* Gives back what tsCalloc or tsArrayToString returned. NULL is allowed. */
void tsFree(void *memory);

/* The characters of a char array, in storage order, as new NUL-terminated UTF-8 text, to be freed
 * with tsFree. NULL when the array is not char; raises when memory is short. */
char *tsArrayToString(const tsArray *array);

#ifdef __cplusplus
}
#endif

#endif
