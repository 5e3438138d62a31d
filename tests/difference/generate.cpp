// tests/difference/generate.cpp: making programs at random, and making them simpler.
#include "generate.hpp"

#include "author.hpp"
#include "operations.hpp"
#include "run.hpp"

#include <rapidcheck.h>

#include <algorithm>

namespace difference {
namespace {

bool isKept(const Step &step) {
    return !isLeftOut(step);
}

/// Simpler values in the place of one, none of which has it among its own simpler values.
std::vector<Value> simpler(const Value &value) {
    std::vector<Value> list;
    const auto offer = [&](std::vector<double> elements) {
        if (elements != value.elements) {
            list.push_back(of(value.classID, std::move(elements)));
        }
    };
    if (!value.isArray() || value.elements.empty()) {
        return list;
    }
    const std::size_t n = value.elements.size();
    if (value.classID == tsCHAR) {
        offer({value.elements[0]});
        return list;
    }
    offer({value.elements.begin(), value.elements.begin() + static_cast<std::ptrdiff_t>(n - 1)});
    offer(std::vector<double>(n, 0.0));
    const auto isSimple = [](double element) { return element == 0.0 || element == 1.0; };
    if (!std::all_of(value.elements.begin(), value.elements.end(), isSimple)) {
        offer(std::vector<double>(n, 1.0));
    }
    if (value.dims != std::vector<std::size_t>{1, n}) {
        list.push_back(of(value.classID, value.elements));
    }
    return list;
}

rc::Seq<Step> simplerSteps(const Step &step) {
    std::vector<Step> list;
    const Operation *const operation = findOperation(step.operation);
    if (operation != nullptr && step.operation != operation->shortName) {
        list.push_back({operation->shortName, step.inputs});
    }
    for (std::size_t i = 0; i < step.inputs.size(); ++i) {
        for (Value &value : simpler(step.inputs[i])) {
            Step next = step;
            next.inputs[i] = std::move(value);
            if (isKept(next)) {
                list.push_back(std::move(next));
            }
        }
    }
    return rc::seq::fromContainer(std::move(list));
}

rc::Seq<Program> simplerPrograms(const Program &program) {
    return rc::seq::concat(rc::shrink::removeChunks(program),
                           rc::shrink::eachElement(program, simplerSteps));
}

} // namespace

rc::Gen<Program> programs() {
    return [](const rc::Random &random, int /*size*/) {
        return rc::shrinkable::shrinkRecur(Author(random).program(), [](const Program &program) {
            return simplerPrograms(program);
        });
    };
}

} // namespace difference
