// tests/cost/marks.cpp: marks for callgrind, as functions that any language can call. Without
// callgrind they do nothing.
#include <valgrind/callgrind.h>

extern "C" {

/// What comes from here on is counted.
void costBegins() {
    CALLGRIND_START_INSTRUMENTATION;
}

/// What came since then is the cost of the call of this name.
void costEnds(const char *name) {
    CALLGRIND_STOP_INSTRUMENTATION;
    CALLGRIND_DUMP_STATS_AT(name);
}
}
