// tests/guard/ending.hpp: how a process ends that makes calls which it may not survive.
#pragma once

#include "support/process.hpp"

#include <functional>
#include <string>

namespace tessel::test {

/// True where a sanitizer sees what overflows before it does harm, and ends the process with 1.
#ifdef __SANITIZE_ADDRESS__
inline constexpr bool sanitized = true;
#else
inline constexpr bool sanitized = false;
#endif

inline const std::string survived = "exit with 100";
inline const std::string raised = "exit with 101";

/// How a process ends that makes calls, "Segmentation fault" or one of these two: it is given two
/// seconds of the processor, and little room on the disk.
std::string endOf(const std::function<void(const Folder &)> &calls);

} // namespace tessel::test
