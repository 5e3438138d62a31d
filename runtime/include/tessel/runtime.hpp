// tessel/runtime.hpp: the embedded host, all of it.
#pragma once

#include "tessel/runtime/array.hpp"   // IWYU pragma: export
#include "tessel/runtime/error.hpp"   // IWYU pragma: export
#include "tessel/runtime/module.hpp"  // IWYU pragma: export
#include "tessel/runtime/watcher.hpp" // IWYU pragma: export
