/* host/tessel/create.h: making host arrays.
 *
 * Each creation either succeeds or raises (memory is short, or the product or the size in bytes of
 * the dimensions overflows); none returns NULL. What a call creates and does not hand out in an
 * output slot is reclaimed by the host when the call ends, normally or by a raise. Outputs that
 * were stored before a raise are discarded by the host.
 *
 * Call these only from within a call of tsxFunction.
 */
#ifndef TESSEL_CREATE_H
#define TESSEL_CREATE_H

#include "tessel/array.h"

#ifdef __cplusplus
extern "C" {
#endif

/* A 1-by-1 double. */
tsArray *tsCreateDoubleScalar(double value);

/* A 1-by-n row of characters made from NUL-terminated text; "" gives an empty row. The text is read
 * as UTF-8; a byte that is not part of valid UTF-8 becomes the character of the same code. */
tsArray *tsCreateString(const char *text);

/* A real array of a numeric class whose elements have no defined values yet. One dimension of
 * length n makes an n-by-1 array. */
tsArray *tsCreateUninitNumericArray(size_t ndim, const size_t *dims, tsClassID classID);

/* An array of characters, all zero. */
tsArray *tsCreateCharArray(size_t ndim, const size_t *dims);

/* An array of cells, all empty. */
tsArray *tsCreateCellArray(size_t ndim, const size_t *dims);

/* Puts a value into the cell of the given storage position; the cell owns the value from here on.
 * The value was created by this call and is nowhere else. */
void tsSetCell(tsArray *cell, size_t index, tsArray *value);

#ifdef __cplusplus
}
#endif

#endif
