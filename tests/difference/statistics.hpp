// tests/difference/statistics.hpp: what was run, so that a test that tests little is noticed.
#pragma once

#include "run.hpp"

#include <cstddef>
#include <iosfwd>
#include <map>
#include <string>
#include <vector>

namespace difference {

class Statistics {
  public:
    /// Counts a program on which both sides agreed.
    void add(const Program &program, const Trace &library);

    [[nodiscard]] std::size_t programs() const { return programCount; }

    /// What there was too little of; empty for a healthy mix.
    [[nodiscard]] std::vector<std::string> complaints() const;

    void print(std::ostream &out) const;

    /// The counts of every operation, a line each.
    void printOperations(std::ostream &out) const;

  private:
    struct Tally {
        std::size_t succeeded = 0;
        std::size_t refused = 0; ///< before the library was reached
        std::size_t failed = 0;  ///< with a status of the library
        std::size_t steps() const { return succeeded + refused + failed; }
    };

    std::size_t programCount = 0;
    std::vector<Tally> byOperation; ///< as in operations(), and one more for what is none
    std::map<std::string, std::size_t> failures; ///< by the status's word
    std::map<std::string, std::size_t> refusals; ///< by identifier
    std::map<std::string, std::size_t> filesByFormat;
    std::size_t fileBytes = 0;
    std::size_t resultBytes = 0;
};

} // namespace difference
