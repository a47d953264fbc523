// What is known of dimensions: the way through to the constraint store.
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace QLTypeSys {

void SymbolicDimsTable::addEqualRelation(int a, int b, const QLBlock* block) {
    if (isaSymbolicDimension(a) && isaSymbolicDimension(b)) constraints_->addEqual(a, b, getOriginalBlock(block));
}

void SymbolicDimsTable::addEqualConstraint(int a, int value, const QLBlock* block) {
    if (isaSymbolicDimension(a)) constraints_->addEqualValue(a, value, getOriginalBlock(block));
}

void SymbolicDimsTable::addGreaterThanRelation(int a, int b, const QLBlock* block) {
    if (isaSymbolicDimension(a) && isaSymbolicDimension(b)) constraints_->addGreaterThan(a, b, getOriginalBlock(block));
}

void SymbolicDimsTable::addGreaterThanConstraint(int a, int value, const QLBlock* block) {
    if (isaSymbolicDimension(a)) constraints_->addGreaterThanValue(a, value, getOriginalBlock(block));
}

void SymbolicDimsTable::addLessThanConstraint(int a, int value, const QLBlock* block) {
    if (isaSymbolicDimension(a)) constraints_->addLessThanValue(a, value, getOriginalBlock(block));
}

void SymbolicDimsTable::addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags) {
    if (isaSymbolicDimension(a)) constraints_->addRange(a, min, max, getOriginalBlock(block), flags);
}

bool SymbolicDimsTable::hasEqualRelation(int a, int b) { return constraints_->isEqual(a, b); }
bool SymbolicDimsTable::hasGreaterThanRelation(int a, int b) { return constraints_->isGreaterThan(a, b); }
SymbDimsRange SymbolicDimsTable::getRange(int a) const { return constraints_->getRange(a); }

bool SymbolicDimsTable::hasEqualConstraint(int a, int value) {
    const SymbDimsRange range = getRange(a);
    return range.min == value && range.max == value;
}
bool SymbolicDimsTable::hasGreaterThanConstraint(int a, int value) { return getRange(a).min > value; }
bool SymbolicDimsTable::hasLessThanConstraint(int a, int value) { return getRange(a).max < value; }

void SymbolicDimsTable::getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const {
    constraints_->getSymbolicDimsConstraints(list);
}
void SymbolicDimsTable::getSymbolicDimsConstraints(std::vector<int>& ids) const {
    constraints_->getSymbolicDimsConstraints(ids);
}
void SymbolicDimsTable::getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const {
    constraints_->getSymbolicDimsConstraints(block, ids);
}
void SymbolicDimsTable::getSymbolicDimsConstraints(const QLBlock* block,
                                                   const boost::function<const QLBlock*(const QLBlock*)>& mapper,
                                                   std::vector<int>& ids) const {
    constraints_->getSymbolicDimsConstraints(block, mapper, ids);
}
void SymbolicDimsTable::getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    constraints_->getEquivalentSymbolicDims(list);
}
void SymbolicDimsTable::getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    constraints_->getGreaterThanSymbolicDims(list);
}
void SymbolicDimsTable::getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const {
    constraints_->getLessThanSymbolicDims(list);
}

std::pair<bool, bool> SymbolicDimsTable::equalSymbolicDims(unsigned long a, unsigned long b) {
    const unsigned long simpleA = simplified(getExprTable(), a);
    const unsigned long simpleB = simplified(getExprTable(), b);
    if (simpleA != a) addEqualRelation(symbolicIdOf(a), symbolicIdOf(simpleA), nullptr);
    if (simpleB != b) addEqualRelation(symbolicIdOf(b), symbolicIdOf(simpleB), nullptr);
    const int idA = symbolicIdOf(simpleA), idB = symbolicIdOf(simpleB);
    const bool areEqual = hasEqualRelation(idA, idB) || hasEqualRelation(idB, idA);
    return {areEqual, areEqual};
}

} // namespace QLTypeSys
