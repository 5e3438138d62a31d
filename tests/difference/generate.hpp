// tests/difference/generate.hpp: making programs at random, and making them simpler.
#pragma once

#include "program.hpp"

#include <rapidcheck/Gen.h>

namespace difference {

/// Programs of 5 to 30 steps, most of which make sense after those before them.
rc::Gen<Program> programs();

} // namespace difference
