/* host/tessel/class_id.h: the classes of host arrays and the host's character. */
#ifndef TESSEL_CLASS_ID_H
#define TESSEL_CLASS_ID_H

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

/* One host character: a UTF-16 code unit. */
typedef uint16_t tsChar;

/* The class of an array. The values are part of the binary contract and never change. */
typedef enum tsClassID {
    tsUNKNOWN = 0,
    tsCELL = 1,
    tsSTRUCT = 2,
    tsLOGICAL = 3,
    tsCHAR = 4,
    tsDOUBLE = 5,
    tsSINGLE = 6,
    tsINT8 = 7,
    tsUINT8 = 8,
    tsINT16 = 9,
    tsUINT16 = 10,
    tsINT32 = 11,
    tsUINT32 = 12,
    tsINT64 = 13,
    tsUINT64 = 14,
    tsFUNCTION = 15
} tsClassID;

#ifdef __cplusplus
}
#endif

#endif
