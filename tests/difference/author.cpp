// tests/difference/author.cpp: what comes next in a program, and steps that make sense.
#include "author.hpp"

#include "run.hpp"

#include <netcdf.h>

#include <algorithm>
#include <cctype>
#include <numeric>

namespace difference {

const std::vector<Author::Weight> Author::withoutDataset = {
    {Verb::create, 50},    {Verb::createTuned, 20},     {Verb::open, 12},
    {Verb::openTuned, 12}, {Verb::setDefaultFormat, 8}, {Verb::inqLibvers, 2},
    {Verb::strerror, 3},   {Verb::parameter, 3},        {Verb::constantNames, 1},
};

const std::vector<Author::Weight> Author::inDefineMode = {
    {Verb::defDim, 20},    {Verb::defVar, 30},      {Verb::putAtt, 30},   {Verb::getAtt, 10},
    {Verb::enddef, 34},    {Verb::enddefTuned, 14}, {Verb::renameDim, 5}, {Verb::renameVar, 5},
    {Verb::renameAtt, 6},  {Verb::delAtt, 6},       {Verb::copyAtt, 8},   {Verb::setFill, 6},
    {Verb::inqDim, 3},     {Verb::inqVar, 3},       {Verb::inqAtt, 3},    {Verb::inqAttid, 3},
    {Verb::inqAttname, 3}, {Verb::abort, 2},        {Verb::close, 2},     {Verb::create, 3},
};

const std::vector<Author::Weight> Author::inDataMode = {
    {Verb::putVar, 40},   {Verb::putVar1, 36},   {Verb::putVara, 44},  {Verb::putVars, 44},
    {Verb::getVar, 34},   {Verb::getVar1, 34},   {Verb::getVara, 40},  {Verb::getVars, 40},
    {Verb::getAtt, 40},   {Verb::putAtt, 8},     {Verb::inq, 5},       {Verb::inqDim, 5},
    {Verb::inqDimid, 5},  {Verb::inqVar, 5},     {Verb::inqVarid, 5},  {Verb::inqAtt, 5},
    {Verb::inqAttid, 5},  {Verb::inqAttname, 5}, {Verb::renameDim, 3}, {Verb::renameVar, 3},
    {Verb::renameAtt, 3}, {Verb::redef, 14},     {Verb::sync, 6},      {Verb::setFill, 5},
    {Verb::close, 9},     {Verb::abort, 3},      {Verb::create, 5},    {Verb::open, 3},
};

Program Author::program() {
    const std::size_t length = chance.between(5, 30);
    Program steps;
    while (steps.size() < length) {
        steps.push_back(next());
    }
    return steps;
}

Step Author::next() {
    constexpr std::size_t anything = 5;
    constexpr std::size_t spoiled = 18;
    const bool byPlan = !chance.percent(anything);
    const Operation *operation = &chance.oneOf(operations());
    if (byPlan) {
        const Verb verb = nextVerb();
        const std::vector<std::size_t> &rows = operationsOf(verb);
        const std::size_t member =
            rows.size() == members.size() ? memberFor(verb, here()) : chance.below(rows.size());
        operation = &operations()[rows[member]];
    }
    const Plan before = plan;
    Step step{spelled(*operation), inputsOf(*operation)};
    if (chance.percent(spoiled)) {
        Step worse = step;
        spoil(worse);
        if (!isLeftOut(worse)) {
            step = std::move(worse);
            plan = before;
        }
    }
    return step;
}

Verb Author::nextVerb() {
    std::vector<std::size_t> open;
    for (std::size_t slot = 0; slot < fileCount; ++slot) {
        if (plan.datasets.at(slot).open) {
            open.push_back(slot);
        }
    }
    if (open.empty()) {
        const Verb verb = weighed(withoutDataset);
        const auto exists = [](const Plan::Dataset &one) { return one.exists; };
        const bool opens = verb == Verb::open || verb == Verb::openTuned;
        const bool nothing = std::none_of(plan.datasets.begin(), plan.datasets.end(), exists);
        return opens && nothing && chance.percent(85) ? Verb::create : verb;
    }
    current = chance.percent(98) ? chance.oneOf(open) : chance.below(fileCount);
    const bool hasAttributes = !holdersOf([](const Plan::Attribute &) { return true; }).empty();
    if (!here().define) {
        const Verb verb = weighed(inDataMode);
        return verb == Verb::getAtt && !hasAttributes ? weighed(inDataMode) : verb;
    }
    if (here().dims.size() < 2 && chance.percent(80)) {
        return Verb::defDim;
    }
    if (here().variables.size() < 3 && chance.percent(75)) {
        return Verb::defVar;
    }
    if (!hasAttributes && chance.percent(60)) {
        return Verb::putAtt;
    }
    return weighed(inDefineMode);
}

Verb Author::weighed(const std::vector<Weight> &weights) {
    const auto total =
        std::accumulate(weights.begin(), weights.end(), 0U,
                        [](unsigned sum, const Weight &w) { return sum + w.weight; });
    std::size_t at = chance.below(total);
    const auto *row = weights.data();
    while (at >= row->weight) {
        at -= row->weight;
        ++row;
    }
    return row->verb;
}

/// A member at random, but not text where there is none, and the other way about.
std::size_t Author::memberFor(Verb verb, const Plan::Dataset &in) {
    const bool ofAttributes = verb == Verb::getAtt || verb == Verb::putAtt;
    const auto isText = [](const Plan::Variable &variable) { return variable.type == NC_CHAR; };
    const bool hasText = std::any_of(in.variables.begin(), in.variables.end(), isText);
    const bool hasNumbers = !std::all_of(in.variables.begin(), in.variables.end(), isText);
    if (ofAttributes || chance.percent(10) || (hasText && hasNumbers)) {
        return chance.percent(25) ? textMember : chance.below(textMember);
    }
    return hasText ? textMember : chance.below(textMember);
}

std::string Author::spelled(const Operation &operation) {
    std::string name = chance.percent(30) ? operation.longName : operation.shortName;
    if (chance.percent(10)) {
        for (char &c : name) {
            c = static_cast<char>(chance.percent(50) ? std::toupper(static_cast<unsigned char>(c))
                                                     : c);
        }
    }
    return name;
}

std::vector<Value> Author::inputsOf(const Operation &operation) {
    Plan::Dataset &in = here();
    const Value ncid = dataset(current);
    const auto anyVariable = [&] {
        return static_cast<double>(chance.below(in.variables.size() + 1));
    };
    const auto anyDimension = [&] { return static_cast<double>(chance.below(in.dims.size() + 1)); };
    switch (operation.verb) {
    case Verb::create:
    case Verb::createTuned:
    case Verb::open:
    case Verb::openTuned:
        return opening(operation.verb);
    case Verb::constantNames:
    case Verb::inqLibvers:
        return {};
    case Verb::strerror:
        return {num(static_cast<double>(chance.below(100)) - 70.0)};
    case Verb::parameter:
        return {text(chance.oneOf({"NC_BYTE", "nc_double", "global", "Fill_Float", "NC2_ERR",
                                   "nc_etrunc", "no_such_thing", "MAX_NAME"}))};
    case Verb::setDefaultFormat:
        return {num(chance.oneOf({1.0, 2.0, 2.0, 0.0, 9.0}))};
    case Verb::abort:
    case Verb::close:
        in.open = false;
        if (operation.verb == Verb::abort && in.define) {
            in = {};
        }
        return {ncid};
    case Verb::enddef:
        in.define = false;
        return {ncid};
    case Verb::enddefTuned:
        in.define = false;
        return {ncid, num(chance.oneOf({0.0, 20.0, 100.0})), num(chance.oneOf({1.0, 4.0, 64.0})),
                num(chance.oneOf({0.0, 33.0})), num(chance.oneOf({1.0, 4.0, 16.0}))};
    case Verb::redef:
        in.define = true;
        return {ncid};
    case Verb::inq:
    case Verb::sync:
        return {ncid};
    case Verb::setFill:
        return {ncid, num(chance.oneOf({0.0, 256.0, 256.0, 3.0}))};
    case Verb::inqDim:
        return {ncid, id(anyDimension())};
    case Verb::inqVar:
        return {ncid, id(anyVariable())};
    case Verb::inqDimid:
        return {ncid,
                in.dims.empty() || chance.percent(20) ? newName(u"d") : chance.oneOf(in.dims).name};
    case Verb::inqVarid:
        return {ncid, in.variables.empty() || chance.percent(20) ? newName(u"v")
                                                                 : chance.oneOf(in.variables).name};
    case Verb::defDim:
    case Verb::defVar:
    case Verb::renameDim:
    case Verb::renameVar:
        return definition(operation.verb);
    case Verb::copyAtt:
    case Verb::delAtt:
    case Verb::getAtt:
    case Verb::inqAtt:
    case Verb::inqAttid:
    case Verb::inqAttname:
    case Verb::putAtt:
    case Verb::renameAtt:
        return attributeStep(operation);
    case Verb::getVar:
    case Verb::getVar1:
    case Verb::getVara:
    case Verb::getVars:
        return reading(operation);
    case Verb::putVar:
    case Verb::putVar1:
    case Verb::putVara:
    case Verb::putVars:
        return writing(operation);
    }
    return {};
}

std::vector<Value> Author::opening(Verb verb) {
    const bool creates = verb == Verb::create || verb == Verb::createTuned;
    std::size_t slot = chance.below(foreignFile);
    if (!creates) {
        for (std::size_t other = 0; other < foreignFile; ++other) {
            if (plan.datasets.at(other).exists && !plan.datasets.at(other).open) {
                slot = other;
            }
        }
    } else if (plan.datasets.at(slot).open) { // rarely over one that is open
        slot = chance.percent(90) ? (slot + 1) % foreignFile : slot;
    }
    if (chance.percent(3)) {
        slot = foreignFile;
    }
    Plan::Dataset &in = plan.datasets.at(slot);
    std::vector<Value> inputs = {file(slot)};
    if (creates) {
        struct Mode {
            Value value;
            bool keeps;
        };
        static const std::vector<Mode> modes = {
            {text("clobber"), false}, {text("NC_CLOBBER"), false}, {num(0), false},
            {num(512), false},        {num(512), false},           {num(2048), false},
            {num(2560), false},       {text("noclobber"), true},   {num(516), true},
        };
        const Mode &mode = chance.oneOf(modes);
        inputs.push_back(chance.percent(2) ? num(544) : mode.value); // 544 is two formats at once
        const bool exists = in.exists || slot == foreignFile;
        if (!mode.keeps || !exists) {
            in = {true, true, true, 0, {}, {}, {}};
            current = slot;
        }
    } else {
        inputs.push_back(chance.percent(30) ? text(chance.oneOf({"write", "NC_WRITE", "nowrite"}))
                                            : num(chance.oneOf({1.0, 1.0, 0.0, 2049.0})));
        if (in.exists) {
            in.open = true;
            in.define = false;
            current = slot;
        }
    }
    if (verb == Verb::openTuned || verb == Verb::createTuned) {
        inputs.push_back(num(chance.oneOf({0.0, 512.0, 1024.0, 3000.0})));
    }
    if (verb == Verb::createTuned) {
        inputs.push_back(num(99));
    }
    return inputs;
}

std::vector<Value> Author::definition(Verb verb) {
    Plan::Dataset &in = here();
    const Value ncid = dataset(current);
    const auto anyOf = [&](std::size_t n) {
        return chance.below(n + (chance.percent(10) ? 1 : 0));
    };
    switch (verb) {
    case Verb::defDim: {
        const Value name = newName(u"d");
        const auto isRecord = [](const Plan::Dimension &dim) { return dim.length == 0; };
        const bool hasRecord = std::any_of(in.dims.begin(), in.dims.end(), isRecord);
        const std::size_t length = chance.percent(hasRecord ? 5 : 40) ? 0 : chance.between(1, 4);
        in.dims.push_back({name, length});
        return {ncid, name, num(static_cast<double>(length))};
    }
    case Verb::defVar: {
        Plan::Variable variable{newName(u"v"), chance.oneOf({1, 2, 2, 3, 4, 5, 6}), {}, {}};
        const std::size_t ndims =
            in.dims.empty() ? 0 : chance.oneOf<std::size_t>({0, 1, 1, 2, 2, 3, 4});
        for (std::size_t i = 0; i < ndims; ++i) {
            variable.dims.push_back(chance.below(in.dims.size()));
        }
        // The record dimension comes first, and once, but for some.
        if (chance.percent(95)) {
            const auto isRecord = [&](std::size_t dim) { return in.dims[dim].length == 0; };
            const bool hasRecord =
                std::any_of(variable.dims.begin(), variable.dims.end(), isRecord);
            const auto kept = std::remove_if(variable.dims.begin(), variable.dims.end(), isRecord);
            variable.dims.erase(kept, variable.dims.end());
            if (hasRecord) {
                const auto record =
                    std::find_if(in.dims.begin(), in.dims.end(),
                                 [](const Plan::Dimension &dim) { return dim.length == 0; });
                variable.dims.insert(variable.dims.begin(),
                                     static_cast<std::size_t>(record - in.dims.begin()));
            }
        }
        in.variables.push_back(variable);
        std::vector<double> hostOrder(variable.dims.rbegin(), variable.dims.rend());
        return {ncid, variable.name, num(variable.type), row(std::move(hostOrder))};
    }
    case Verb::renameDim: {
        const std::size_t dim = anyOf(std::max<std::size_t>(in.dims.size(), 1));
        return {ncid, id(static_cast<double>(dim)), newName(u"d")};
    }
    default: {
        const std::size_t variable = anyOf(std::max<std::size_t>(in.variables.size(), 1));
        return {ncid, id(static_cast<double>(variable)), newName(u"v")};
    }
    }
}

std::vector<Value> Author::attributeStep(const Operation &operation) {
    const bool isText = operation.member == textMember;
    const bool reads = operation.verb == Verb::getAtt;
    const auto fits = [&](const Plan::Attribute &one) { return !reads || one.isText == isText; };
    const std::vector<double> holders = holdersOf(fits);
    const bool anywhere = operation.verb == Verb::putAtt || holders.empty() || chance.percent(8);
    const double varid = anywhere ? variableOrGlobal() : chance.oneOf(holders);
    std::vector<Plan::Attribute> none;
    std::vector<Plan::Attribute> *known = attributesOf(varid);
    std::vector<Plan::Attribute> &attributes = known == nullptr ? none : *known;
    std::vector<Value> inputs = {dataset(current), id(varid)};
    switch (operation.verb) {
    case Verb::putAtt: {
        const Value name = chance.percent(25) ? attributeName(attributes) : newName(u"a");
        attributes.push_back({name, isText});
        inputs.push_back(name);
        if (!isText) {
            inputs.push_back(num(chance.oneOf({1, 3, 4, 5, 6, 6, 2})));
        }
        // One choice a statement: the order of a call's arguments is the compiler's, and a seed is
        // to be the same programs with each.
        const std::size_t n = chance.below(6);
        const bool tame = chance.percent(80);
        inputs.push_back(values(operation.member, n, tame));
        return inputs;
    }
    case Verb::inqAttname:
        inputs.push_back(id(static_cast<double>(chance.below(attributes.size() + 1))));
        return inputs;
    case Verb::getAtt: {
        const auto at = std::find_if(attributes.begin(), attributes.end(), fits);
        inputs.push_back(at != attributes.end() && chance.percent(85) ? at->name
                                                                      : attributeName(attributes));
        return inputs;
    }
    default:
        break;
    }
    const Value name = attributeName(attributes);
    inputs.push_back(name);
    if (operation.verb == Verb::renameAtt) {
        inputs.push_back(newName(u"a"));
    }
    if (operation.verb == Verb::copyAtt) {
        const std::size_t other = chance.below(foreignFile);
        const bool goes = plan.datasets.at(other).open || chance.percent(10);
        current = goes ? other : current;
        const double to = variableOrGlobal();
        if (std::vector<Plan::Attribute> *const copied = attributesOf(to)) {
            copied->push_back({name, chance.percent(50)});
        }
        inputs.push_back(dataset(current));
        inputs.push_back(id(to));
    }
    return inputs;
}

std::vector<double> Author::holdersOf(const AttributeTest &fits) {
    std::vector<double> holders;
    for (int varid = NC_GLOBAL; const auto *attributes = attributesOf(varid); ++varid) {
        if (std::any_of(attributes->begin(), attributes->end(), fits)) {
            holders.push_back(varid);
        }
    }
    return holders;
}

std::vector<Value> Author::reading(const Operation &operation) {
    const Plan::Variable *const variable = variableFor(operation.member);
    const auto varid =
        variable == nullptr ? 0.0 : static_cast<double>(variable - here().variables.data());
    std::vector<Value> inputs = {dataset(current), id(varid)};
    if (operation.verb == Verb::getVar) {
        return inputs;
    }
    const bool strided = operation.verb == Verb::getVars;
    const Block part = block(variable == nullptr ? Plan::Variable{} : *variable, false, strided);
    inputs.push_back(positions(part.start));
    if (operation.verb != Verb::getVar1) {
        inputs.push_back(positions(part.count));
    }
    if (strided) {
        inputs.push_back(positions(part.stride));
    }
    return inputs;
}

std::vector<Value> Author::writing(const Operation &operation) {
    const Plan::Variable *const variable = variableFor(operation.member);
    const auto varid =
        variable == nullptr ? 0.0 : static_cast<double>(variable - here().variables.data());
    std::vector<Value> inputs = {dataset(current), id(varid)};
    const bool tame = chance.percent(85);
    const Plan::Variable target = variable == nullptr ? Plan::Variable{} : *variable;
    if (operation.verb == Verb::putVar) {
        std::size_t n = 1;
        for (const std::size_t dim : target.dims) {
            n *= lengthOf(dim);
        }
        inputs.push_back(values(operation.member, n, tame));
        return inputs;
    }
    const bool strided = operation.verb == Verb::putVars;
    const Block part = block(target, true, strided);
    inputs.push_back(positions(part.start));
    if (operation.verb == Verb::putVar1) {
        inputs.push_back(values(operation.member, 1, tame));
        return inputs;
    }
    inputs.push_back(positions(part.count));
    if (strided) {
        inputs.push_back(positions(part.stride));
    }
    inputs.push_back(values(operation.member, part.elements, tame));
    here().records = std::max(here().records, part.records);
    return inputs;
}

} // namespace difference
