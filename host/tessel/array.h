/* host/tessel/array.h: what a module may ask of a host array.
 *
 * An array belongs to the host and is opaque to a module. Its data are stored first dimension
 * fastest (column-major), aligned for the class, and nothing beyond the last element may be read
 * or written. The inputs of a call are read-only, alive and unmoved until the call ends.
 *
 * None of these functions raises. `array` is never NULL.
 */
#ifndef TESSEL_ARRAY_H
#define TESSEL_ARRAY_H

#include "tessel/class_id.h"

#include <stddef.h>

#ifndef __cplusplus
#include <stdbool.h>
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* A host array. Only the host knows what is in it. */
typedef struct tsArray tsArray;

/* The class of the array. */
tsClassID tsGetClassID(const tsArray *array);

/* The name of the array's class: "double", "single", "int8", "uint8", "int16", "uint16", "int32",
 * "uint32", "int64", "uint64", "char", "logical", "cell", "struct", "function_handle" or "unknown".
 * The text is constant and belongs to the host. */
const char *tsGetClassName(const tsArray *array);

/* True for the ten numeric classes; false for logical and char, which are not numbers. */
bool tsIsNumeric(const tsArray *array);

/* True when the array has no elements. */
bool tsIsEmpty(const tsArray *array);

/* The number of elements, the product of the dimensions. */
size_t tsGetNumberOfElements(const tsArray *array);

/* The number of dimensions, at least 2. */
size_t tsGetNumberOfDimensions(const tsArray *array);

/* The dimensions, as many as tsGetNumberOfDimensions tells; alive as long as the array. */
const size_t *tsGetDimensions(const tsArray *array);

/* The array's own real data, column-major; char data are tsChar, one a character, and logical data
 * one byte an element. NULL is possible for an empty array and for a class without plain data. */
void *tsGetData(const tsArray *array);

/* True for plus and minus infinity. */
bool tsIsInf(double value);

/* True for every not-a-number. */
bool tsIsNaN(double value);

#ifdef __cplusplus
}
#endif

#endif
