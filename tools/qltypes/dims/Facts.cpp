#include "dims/Facts.h"

#include "qlplatform/services/Diagnostics.h"

namespace inspector {
namespace {

void apply(QLTypeSys::SymbolicDimsConstraints& known, const Fact& fact) {
    switch (fact.verb) {
    case Verb::StateEqual:
        return known.addEqual(fact.first, fact.second, fact.block);
    case Verb::StateGreater:
        return known.addGreaterThan(fact.first, fact.second, fact.block);
    case Verb::StateLess:
        return known.addGreaterThan(fact.second, fact.first, fact.block);
    default:
        return known.addRange(fact.first, fact.min, fact.max, fact.block, fact.flags);
    }
}

} // namespace

std::optional<Contradiction> Facts::state(const Fact& fact) {
    std::optional<Contradiction> found;
    try {
        apply(known_, fact);
    } catch (const foundation::core::except::IException& e) {
        qlsvDiagnosticImpl* diagnostic = qlsvCreateDiagnosticFromIException(e, false);
        found = Contradiction{diagnostic->text(0), diagnostic->item(0).identifier(), contradicted(fact)};
        qlsvDiscardDiagnostic(diagnostic);
    }
    stated_.push_back(fact);
    return found;
}

const QLBlock* Facts::block(const std::string& name) {
    QLBlock& block = blocks_[name];
    block.name = name;
    return &block;
}

bool Facts::isRefused(const Fact& fact, const std::vector<const Fact*>& after) const {
    QLTypeSys::SymbolicDimsConstraints known(&table_);
    for (const Fact* earlier : after) {
        try {
            apply(known, *earlier);
        } catch (const foundation::core::except::IException&) { // leaves what it left when it was stated
        }
    }
    try {
        apply(known, fact);
    } catch (const foundation::core::except::IException&) {
        return true;
    }
    return false;
}

// Leaves out ever smaller runs of statements for as long as the fact is refused without them.
std::vector<ScriptPart> Facts::contradicted(const Fact& fact) const {
    std::vector<const Fact*> needed;
    for (const Fact& earlier : stated_)
        needed.push_back(&earlier);
    for (std::size_t length = needed.size(), numBefore = 0; length > 0;) {
        numBefore = needed.size();
        for (std::size_t i = 0; i < needed.size();) {
            std::vector<const Fact*> others(needed.begin(), needed.begin() + static_cast<std::ptrdiff_t>(i));
            others.insert(others.end(),
                          needed.begin() + static_cast<std::ptrdiff_t>(std::min(i + length, needed.size())),
                          needed.end());
            if (isRefused(fact, others))
                needed = std::move(others);
            else
                i += length;
        }
        if (needed.size() == numBefore) length /= 2;
    }
    std::vector<ScriptPart> statements;
    for (const Fact* earlier : needed)
        statements.push_back(earlier->statement);
    return statements;
}

} // namespace inspector
