/* host/tessel/host.h: the whole host interface, for a module or a host that wants all of it. */
#ifndef TESSEL_HOST_H
#define TESSEL_HOST_H

#include "tessel/array.h"     /* IWYU pragma: export */
#include "tessel/class_id.h"  /* IWYU pragma: export */
#include "tessel/create.h"    /* IWYU pragma: export */
#include "tessel/extension.h" /* IWYU pragma: export */
#include "tessel/memory.h"    /* IWYU pragma: export */

#endif
