#include "qltypes/dimensions/SymbolicDimsTable.h"

#include <algorithm>
#include <limits>
#include <ostream>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprCopy.h"
#include "qlplatform/symbolic/SymbolicExprEval.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qlplatform/symbolic/SymbolicExprSymbols.h"
#include "qlplatform/symbolic/SymbolicExprTranslate.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace QLTypeSys {
namespace {

constexpr int diagNotAsked = 2;

unsigned long wholeNumberOf(double value) {
    constexpr double limit = 18446744073709551616.0; // 2^64
    if (!(value >= 1.0)) return 0;
    return value < limit ? static_cast<unsigned long>(value) : std::numeric_limits<unsigned long>::max();
}

} // namespace

SymbolicDimsTable::SymbolicDimsTable()
    : SymbolRegistry(QL::SymbolDomain::Integers), constraints_(std::make_unique<SymbolicDimsConstraints>(this)) {
    initialize();
}

SymbolicDimsTable::~SymbolicDimsTable() { constraints_.reset(); }

void SymbolicDimsTable::initialize() {
    QL::SymbolicExprTable& exprs = getExprTable();
    exprs.addSymbol("INHERIT");
    exprs.addSymbol("NOSYMBOLIC");
    exprs.addBoolSymbols();
    const unsigned long oneInt = exprs.addInt(1);
    oneDoubleExprId_ = exprs.addDouble(1.0);
    oneIntExprId_ = oneInt;
    symbolsRegistered_ = false;
    lossOfSymbolicDimsDiag_ = diagNotAsked;
}

void SymbolicDimsTable::resetToBuiltin() {
    auto exprs = std::make_unique<QL::SymbolicExprTable>(getExprTable().getDomain());
    std::unique_ptr<SymbolicDimsConstraints> constraints;
    swapExprTable(exprs);
    try {
        constraints = std::make_unique<SymbolicDimsConstraints>(this);
        initialize();
    } catch (...) {
        constraints.reset();
        swapExprTable(exprs);
        throw;
    }
    constraints_.swap(constraints);
    displayStrings_.clear();
    torvexExprs_.clear();
    headerFiles_.clear();
}

const QLBlock* SymbolicDimsTable::getOriginalBlock(const QLBlock* block) const { return block; }
SymbolicDimsTable* SymbolicDimsTable::CreateSymbolicDimsTable(QLRootBD*) const { return nullptr; }
SymbolicDimsTable::DimsRegistration SymbolicDimsTable::registerSymbolicDims(const char*, const QLBlock*) {
    return {0, nullptr};
}
SymbolicDimsTable::DimsRegistration SymbolicDimsTable::registerSymbolicDimsExpr(const char*, const QLBlock*) {
    return {0, nullptr};
}
void SymbolicDimsTable::reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*&, int) {}
bool SymbolicDimsTable::isLossOfSymbolicDimsDiagEnabled() const { return true; }
void SymbolicDimsTable::registerReferencedSymbolInParamTable(int, const QLBlock*) {}

std::size_t SymbolicDimsTable::getNumSymbolicDimss() const { return hasExprTable() ? getExprTable().getNumExprs() : 0; }

bool SymbolicDimsTable::isSymbolicDimsIdValid(int id) const {
    return id >= -1 && static_cast<long>(id) < static_cast<long>(getNumSymbolicDimss()) - 1;
}

bool SymbolicDimsTable::isaSymbolicDimension(int id) const { return id >= 1 && isSymbolicDimsIdValid(id); }

bool SymbolicDimsTable::checkSymbolicDimsId(int id) const {
    // kept: the message speaks of a data type
    if (!isSymbolicDimsIdValid(id)) failure::raise("QuillaneTypes:general", "InvalidDataTypeId", id);
    return true;
}

SymbolicDims SymbolicDimsTable::getSymbolicDims(int id) const {
    return {const_cast<SymbolicDimsTable*>(this), id}; // a handle adds expressions, which no constness keeps out
}

SymbolicDims SymbolicDimsTable::getSymbolicDimsAt(unsigned long exprId) const {
    return getSymbolicDims(symbolicIdOf(exprId));
}

QL::SymbolicExpr SymbolicDimsTable::getSymbolicExpr(unsigned long exprId) const {
    QLTYPES_ASSERT(exprId < getNumSymbolicDimss());
    return getExprTable().get(exprId);
}

int SymbolicDimsTable::convertExprId2SymbDimsId(unsigned long exprId) {
    const auto valid = convertExprId2ValidSymbolicId(exprId);
    if (!valid) return 0;
    symbolsRegistered_ = true;
    return symbolicIdOf(*valid);
}

int SymbolicDimsTable::registerSymbolicDims(int value) { return symbolicIdOf(getExprTable().addInt(value)); }

unsigned long SymbolicDimsTable::registerValue(const std::string& name, double value) {
    return getExprTable().registerValueId(name, getExprTable().addDouble(value));
}

unsigned long SymbolicDimsTable::registerValue(const std::string& name, int value) {
    return getExprTable().registerValueId(name, getExprTable().addInt(value));
}

std::vector<double> SymbolicDimsTable::eval(int id) const {
    return QL::SymbolicExprEval(getExprTable()).eval(exprIdOf(id));
}

bool SymbolicDimsTable::isOne(int id) const {
    return exprIdOf(id) == oneIntExprId_ || exprIdOf(id) == oneDoubleExprId_;
}

bool SymbolicDimsTable::resolvesToOne(int id) const {
    if (isOne(id)) return true;
    const std::vector<double> values = eval(id);
    return std::all_of(values.begin(), values.end(), [](double value) { return value == 1.0; });
}

bool SymbolicDimsTable::isVector(int id) {
    const SymbolicDims dims = getSymbolicDims(id);
    const std::size_t numDimensions = dims.getNumDimensions();
    return numDimensions == 1 ||
           (numDimensions == 2 && (isOne(dims.getDimensionId(0)) || isOne(dims.getDimensionId(1))));
}

int SymbolicDimsTable::getWidthSymbolicDimsId(int id) {
    const SymbolicDims dims = getSymbolicDims(id);
    const std::size_t numDimensions = dims.getNumDimensions();
    const auto isPlain = [&](int dimension) {
        const QL::SymbolicOp op = getSymbolicExpr(exprIdOf(dimension)).getOp();
        return op == QL::SymbolicOp::StringSymbol || op == QL::SymbolicOp::IntValue;
    };
    // A product of symbols and integers has one simplified form, however it is come by: once is enough, and does not
    // read what is already multiplied again for each factor.
    const std::vector<int> ids = dimensionIds(id);
    if (numDimensions > 2 && std::all_of(ids.begin(), ids.end(), isPlain)) return dims.getSize(numDimensions).getId();
    SymbolicDims width = dims.getDimension(0);
    for (std::size_t i = 1; i < numDimensions; ++i)
        width = width * dims.getDimension(i);
    return width.getId();
}

std::pair<bool, int> SymbolicDimsTable::getValueOf(int id) const {
    const QL::SymbolicExpr expr = getSymbolicExpr(exprIdOf(id));
    if (expr.getOp() != QL::SymbolicOp::IntValue) return {false, 0};
    return {true, expr.getIntValue()};
}

bool SymbolicDimsTable::isNumericalDimension(int id) const {
    return getSymbolicExpr(simplified(getExprTable(), exprIdOf(id))).getOp() == QL::SymbolicOp::IntValue;
}

std::vector<unsigned long> SymbolicDimsTable::getNumericDims(int id) const {
    const std::vector<double> values = eval(id);
    std::vector<unsigned long> dims(values.size());
    std::transform(values.begin(), values.end(), dims.begin(), wholeNumberOf);
    return dims;
}

void SymbolicDimsTable::getSymbolicDimsSymbols(int id, std::vector<std::string>& names) const {
    names.clear();
    if (isaSymbolicDimension(id)) QL::SymbolicExprSymbols(getExprTable()).getSymbols(exprIdOf(id), names);
}

void SymbolicDimsTable::getSymbolicDimensions(int id, std::vector<std::string>& texts) const {
    texts.clear();
    if (!isaSymbolicDimension(id)) return;
    const SymbolicDims dims = getSymbolicDims(id);
    for (std::size_t i = 0; i < dims.getNumDimensions(); ++i)
        texts.push_back(dims.getDimension(i).toString());
}

const char* SymbolicDimsTable::getDisplayString(int id) {
    displayStrings_.resize(getNumSymbolicDimss());
    std::string& text = displayStrings_[exprIdOf(id)];
    if (text.empty()) text = getSymbolicDims(id).toString();
    return text.c_str();
}

std::string SymbolicDimsTable::getTorvexExpr(int id) const {
    torvexExprs_.resize(getNumSymbolicDimss());
    std::string& text = torvexExprs_[exprIdOf(id)];
    if (text.empty()) {
        QL::SymbolicExprTable& exprs = getExprTable();
        const unsigned long translated = QL::SymbolicExprC2T(exprs)(exprIdOf(id));
        text = QL::SymbolicExprPrinter(exprs, QL::SymbolicExprPrinter::Predicate::instance(), true, true, true,
                                       {})(exprs.get(translated));
    }
    return text;
}

void SymbolicDimsTable::print(std::ostream& out) const {
    const std::size_t count = getNumSymbolicDimss();
    out << "SymbolicDimsTable\nNumber of SymbolicDimss : " << count << "\n\n";
    for (std::size_t i = 0; i < count; ++i)
        out << getSymbolicDimsAt(i);
    out << '\n';
}

void SymbolicDimsTable::registerHeaderFile(int id, const std::string& file) {
    if (isSymbolicDimsIdValid(id)) headerFiles_.try_emplace(id, file);
}

void SymbolicDimsTable::getHeaderFiles(int id, std::set<std::string>& files) const {
    if (!isSymbolicDimsIdValid(id)) return;
    std::vector<unsigned long> symbols;
    QL::SymbolicExprSymbols(getExprTable()).getSymbols(exprIdOf(id), symbols);
    for (const unsigned long symbol : symbols) {
        const auto found = headerFiles_.find(symbolicIdOf(symbol));
        if (found != headerFiles_.end() && !found->second.empty()) files.insert(found->second);
    }
}

void SymbolicDimsTable::getOperatorConstraints(QL::SymbolicOp op, std::vector<SymbolicDimsCGConstraint>& list) const {
    std::vector<unsigned long> exprIds;
    getExprTable().lookup(op, exprIds);
    for (const unsigned long exprId : exprIds) {
        const QL::SymbolicExpr expr = getSymbolicExpr(exprId);
        list.push_back({symbolicIdOf(expr.getLeft()), symbolicIdOf(expr.getRight()), {}});
    }
}

void SymbolicDimsTable::getDivisionConstraints(std::vector<SymbolicDimsCGConstraint>& list) const {
    getOperatorConstraints(QL::SymbolicOp::Divide, list);
}

void SymbolicDimsTable::getModuloConstraints(std::vector<SymbolicDimsCGConstraint>& list) const {
    getOperatorConstraints(QL::SymbolicOp::Modulo, list);
}

SymbolicDimsTable::DimsRegistration SymbolicDimsTable::importSymbolicDims(const SymbolicDimsTable& other, int id,
                                                                          const QLBlock* block) {
    if (!other.isaSymbolicDimension(id)) return {id, nullptr};
    QL::SymbolicExprTable& exprs = getExprTable();
    const unsigned long copy = QL::SymbolicExprCopy(other.getExprTable(), exprs).copy(exprIdOf(id));
    const int imported = symbolicIdOf(QL::SymbolicExprT2C(exprs)(copy));
    symbolsRegistered_ = true;
    std::vector<std::string> names;
    getSymbolicDimsSymbols(imported, names);
    for (const std::string& name : names) {
        const DimsRegistration registration = registerSymbolicDims(name.c_str(), block);
        if (registration.second) return registration;
    }
    return {imported, nullptr};
}

bool SymbolicDimsTable::lossOfSymbolicDimsDiagEnabled() const {
    if (lossOfSymbolicDimsDiag_ == diagNotAsked) lossOfSymbolicDimsDiag_ = isLossOfSymbolicDimsDiagEnabled() ? 1 : 0;
    return lossOfSymbolicDimsDiag_ == 1;
}

} // namespace QLTypeSys
