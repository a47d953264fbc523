#include "qltypes/dimensions/SymbolicDims.h"

#include <algorithm>
#include <ostream>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

QL::SymbolicExpr SymbolicDims::expr() const { return table_->getSymbolicExpr(exprIdOf(id_)); }

bool SymbolicDims::isTerminal() const { return expr().isTerminal(); }

std::size_t SymbolicDims::getNumDimensions() const { return std::max<std::size_t>(1, expr().getNumDimensions()); }

int SymbolicDims::getDimensionId(std::size_t index) const {
    const QL::SymbolicExpr own = expr();
    if (own.getNumDimensions() == 0) return id_;
    QLTYPES_ASSERT(index < own.getNumDimensions());
    return symbolicIdOf(own.getDimension(index));
}

SymbolicDims SymbolicDims::getDimension(std::size_t index) const { return {table_, getDimensionId(index)}; }

SymbolicDims SymbolicDims::getSize() const {
    const std::size_t numDimensions = getNumDimensions();
    return numDimensions == 1 ? *this : getSize(numDimensions);
}

SymbolicDims SymbolicDims::getSize(std::size_t numDimensions) const {
    const QL::SymbolicExpr own = expr();
    if (own.getNumDimensions() == 0) return *this;
    QLTYPES_ASSERT(numDimensions <= own.getNumDimensions());
    QL::SymbolicExprTable& exprs = table_->getExprTable();
    unsigned long product = own.getDimension(0);
    for (std::size_t i = 1; i < numDimensions; ++i)
        product = QL::SymbolicMultiplyExpr(exprs, product, own.getDimension(i)).getId(exprs);
    return {table_, symbolicIdOf(simplified(exprs, product))};
}

template <class Expr> SymbolicDims SymbolicDims::combined(const SymbolicDims& right) const {
    QLTYPES_ASSERT(right.table_ == table_);
    QL::SymbolicExprTable& exprs = table_->getExprTable();
    const Expr result(exprs, exprs.get(exprIdOf(id_)), exprs.get(exprIdOf(right.id_)));
    return {table_, symbolicIdOf(simplified(exprs, result.getId(exprs)))};
}

// clang-format off
SymbolicDims SymbolicDims::operator+(const SymbolicDims& right) const { return combined<QL::SymbolicPlusExpr>(right); }
SymbolicDims SymbolicDims::operator-(const SymbolicDims& right) const { return combined<QL::SymbolicMinusExpr>(right); }
SymbolicDims SymbolicDims::operator*(const SymbolicDims& right) const { return combined<QL::SymbolicMultiplyExpr>(right); }
SymbolicDims SymbolicDims::operator/(const SymbolicDims& right) const { return combined<QL::SymbolicDivideExpr>(right); }
SymbolicDims SymbolicDims::operator%(const SymbolicDims& right) const { return combined<QL::SymbolicModuloExpr>(right); }
// clang-format on

SymbolicDims SymbolicDims::operator-() const { // kept: not simplified, even for a number
    QL::SymbolicExprTable& exprs = table_->getExprTable();
    return {table_, symbolicIdOf(QL::SymbolicUnaryMinusExpr(exprs, expr()).getId(exprs))};
}

std::string SymbolicDims::toString() const { return toString(QL::SymbolicExprPrinter::Predicate::instance()); }

std::string SymbolicDims::toString(const QL::SymbolicExprPrinterPredicate& predicate) const {
    return QL::SymbolicExprPrinter(table_->getExprTable(), predicate, false, false, false, {})(expr());
}

std::string SymbolicDims::getExprWithEmptyInherit() const { return id_ == -1 || id_ == 0 ? "" : toString(); }

void SymbolicDims::print(std::ostream& out) const { out << "SymbolicDims : '" << toString() << "'\n"; }

std::ostream& operator<<(std::ostream& out, const SymbolicDims& dims) {
    dims.print(out);
    return out;
}

SymbolicDimsString::SymbolicDimsString(SymbolicDimsTable& table, const std::string& name)
    : SymbolicDims(&table, symbolicIdOf(table.getExprTable().addSymbol(name))) {}

SymbolicDimsQLSizeValue::SymbolicDimsQLSizeValue(SymbolicDimsTable& table, long value)
    : SymbolicDims(&table, symbolicIdOf(table.getExprTable().addInt(static_cast<int>(value)))) {}

namespace {

int listOf(SymbolicDimsTable& table, const std::vector<int>& ids) {
    std::vector<unsigned long> exprIds;
    exprIds.reserve(ids.size());
    for (const int id : ids) {
        QLTYPES_ASSERT(table.getSymbolicExpr(exprIdOf(id)).getOp() != QL::SymbolicOp::ND);
        exprIds.push_back(exprIdOf(id));
    }
    QL::SymbolicExprTable& exprs = table.getExprTable();
    return symbolicIdOf(QL::SymbolicNDExpr(exprs, exprIds).getId(exprs));
}

} // namespace

SymbolicDimsND::SymbolicDimsND(SymbolicDimsTable& table, const std::vector<int>& ids)
    : SymbolicDims(&table, listOf(table, ids)) {}

} // namespace QLTypeSys
