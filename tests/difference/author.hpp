// tests/difference/author.hpp: who writes the programs.
#pragma once

#include "chance.hpp"
#include "operations.hpp"
#include "program.hpp"

#include <array>
#include <functional>
#include <span>
#include <string>
#include <vector>

namespace difference {

/// What the program has made so far, as its author believes it; some steps fail, so that it is not
/// always right, and need not be.
struct Plan {
    struct Attribute {
        Value name;
        bool isText;
    };
    struct Variable {
        Value name;
        int type;
        std::vector<std::size_t> dims; ///< in the library's order
        std::vector<Attribute> attributes;
    };
    struct Dimension {
        Value name;
        std::size_t length; ///< 0 for the record dimension
    };
    struct Dataset {
        bool exists = false;
        bool open = false;
        bool define = false;
        std::size_t records = 0;
        std::vector<Dimension> dims;
        std::vector<Variable> variables;
        std::vector<Attribute> globals;
    };
    std::array<Dataset, fileCount> datasets;
};

/// Writes one program.
class Author {
  public:
    explicit Author(const rc::Random &random) : chance(random) {}

    Program program();

  private:
    /// How often a verb is chosen.
    struct Weight {
        Verb verb;
        unsigned weight;
    };
    static const std::vector<Weight> withoutDataset;
    static const std::vector<Weight> inDefineMode;
    static const std::vector<Weight> inDataMode;

    /// A block of a variable, in the library's order.
    struct Block {
        std::vector<double> start, count, stride;
        std::size_t elements = 1;
        std::size_t records = 0; ///< that there are after it was written
    };

    // The choice of what comes next.
    Step next();
    Verb nextVerb();
    Verb weighed(const std::vector<Weight> &weights);
    std::size_t memberFor(Verb verb, const Plan::Dataset &in);
    std::string spelled(const Operation &operation);

    // A step that makes sense, and what it does to the plan.
    std::vector<Value> inputsOf(const Operation &operation);
    std::vector<Value> opening(Verb verb);
    std::vector<Value> definition(Verb verb);
    std::vector<Value> attributeStep(const Operation &operation);
    std::vector<Value> reading(const Operation &operation);
    std::vector<Value> writing(const Operation &operation);

    // A step that makes less sense.
    void spoil(Step &step);
    void spoilValue(Value &value);
    Value odd();

    // Parts of steps.
    Plan::Dataset &here() { return plan.datasets.at(current); }
    Plan::Variable *variableFor(std::size_t member);
    std::vector<Plan::Attribute> *attributesOf(double varid);
    double variableOrGlobal();
    /// The variables, or none, that have such an attribute.
    using AttributeTest = std::function<bool(const Plan::Attribute &)>;
    std::vector<double> holdersOf(const AttributeTest &fits);
    Value id(double value);
    Value newName(const char16_t *prefix);
    Value attributeName(const std::vector<Plan::Attribute> &known);
    Value positions(const std::vector<double> &libraryOrder);
    Value values(std::size_t member, std::size_t n, bool tame);
    double element(tsClassID classID, bool tame);
    Block block(const Plan::Variable &variable, bool writes, bool strided);
    std::size_t lengthOf(std::size_t dim);

    Chance chance;
    Plan plan;
    std::size_t current = 0;
};

} // namespace difference
