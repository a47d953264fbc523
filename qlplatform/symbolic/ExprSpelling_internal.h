// How operators are written: what the printer writes and the parser reads.
#pragma once

#include <string_view>

#include "qlplatform/symbolic/SymbolicOp.h"

namespace QL {

/// How tightly operators bind, loosest first. An operator of some level takes operands of that level and above; those
/// of one level group from the left.
enum Level : int {
    orLevel,
    andLevel,
    equalLevel,
    orderLevel,
    sumLevel,
    productLevel,
    signLevel,
    powerLevel,
    atomLevel
};

/// One way to write an operator: before its operand or, with blanks as printed, between its operands; as a function
/// when `level` is atomLevel.
struct Spelling {
    std::string_view text; ///< empty for what is no operator: symbols, values, lists
    Level level;
};

/// The options are those of the printer.
Spelling spellingOf(SymbolicOp op, bool hostOperators, bool hostFunctions);

/// 1 or 2. Unchecked: `op` must be an operator that has a spelling.
unsigned numOperandsOf(SymbolicOp op);

} // namespace QL
