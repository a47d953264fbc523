// The table of the symbolic dimensions of one model.
//
// It owns an expression table, makes ids of symbols, numbers and lists of dimensions, answers questions about them and
// reshapes them. Handles of ids are in SymbolicDims.h.
//
//   QLTypeSys::SymbolicDimsTable table;
//   const int k = QLTypeSys::SymbolicDimsString(table, "K").getId();
//   const int shape = QLTypeSys::SymbolicDimsND(table, {table.registerSymbolicDims(1), k}).getId();
//   table.getDisplayString(table.removeLeadingOnes(shape)); // K
//
// A table belongs to one thread at a time: even questions fill caches and add expressions. It is a base class: clients
// override the hooks. Operations without a word on it take any id that isSymbolicDimsIdValid and check nothing.
#pragma once

#include <iosfwd>
#include <memory>
#include <set>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/symbolic/SymbolRegistry.h"
#include "qlplatform/symbolic/SymbolValidator.h"
#include "qltypes/dimensions/QLSymbolicDimsConstraints.h"
#include "qltypes/dimensions/SymbolicDims.h"

struct txArray_tag;

namespace QLTypeSys {

class NumericDims;

/// The symbolic dimensions of one model. Engines derive their own and override the hooks.
class QL_EXPORT SymbolicDimsTable : public QL::SymbolRegistry {
  public:
    /// A symbolic id, and a diagnostic that is null on success.
    using DimsRegistration = std::pair<int, qlsvDiagnosticImpl*>;

    SymbolicDimsTable();
    ~SymbolicDimsTable() override;

    // Hooks.

    /// The block that constraints are stated for in place of `block`. Here it is the block itself.
    virtual const QLBlock* getOriginalBlock(const QLBlock* block) const;

    /// A new table for a model, or null as here.
    virtual SymbolicDimsTable* CreateSymbolicDimsTable(QLRootBD* model) const;

    /// Brings the table back to its first state: every id and handle becomes meaningless. Without memory for a new
    /// first state the table stays as it is.
    virtual void resetToBuiltin();

    /// Registers a token, or an expression, for a block. Here nothing is registered: id 0 and no diagnostic.
    virtual DimsRegistration registerSymbolicDims(const char* text, const QLBlock* block);
    /// Registers an expression for a block. Here nothing is registered: id 0 and no diagnostic.
    virtual DimsRegistration registerSymbolicDimsExpr(const char* text, const QLBlock* block);

    /// Is told of a dimension that is lost; does nothing here. An override may make or extend the diagnostic.
    virtual void reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*& diagnostic, int id);

    /// Whether lost dimensions are reported; asked once and remembered by lossOfSymbolicDimsDiagEnabled(). Here true.
    virtual bool isLossOfSymbolicDimsDiagEnabled() const;

    /// Is told of a symbol that parameters refer to; does nothing here.
    virtual void registerReferencedSymbolInParamTable(int id, const QLBlock* block);

    // Dimensions from text. Texts of the host language are read as SymbolicDimsFromTParseTree.h says. A diagnostic that
    // is returned belongs to the caller; it can stand beside a valid id.

    /// Registers the dimensions that `text` gives for a signal whose numeric dimensions are `dims`: an expression id,
    /// SymbolicExprTable::noExpr for a text that has no symbols or cannot be read. For a signal without elements it is
    /// 1, NOSYMBOLIC; the text is then read only to tell reportLossOfSymbolicDimensions() of it, where that is enabled.
    virtual Registration registerSymbolicTExpr(const std::string& text, const NumericDims& dims,
                                               QL::SymbolValidator& validator);
    /// Registers the dimensions that `text` gives: an expression id, 1 for a text that cannot be read. `values` becomes
    /// what eval() gives for them and stays as it is when there are none. The dimensions of 1 at the end, beyond the
    /// third, are told to reportLossOfSymbolicDimensions() where that is enabled.
    Registration registerSymbolicTExpr(const std::u16string& text, QL::SymbolValidator& validator,
                                       std::vector<double>& values) override;
    using QL::SymbolRegistry::registerSymbolicTExpr;

    /// Registers one token: a decimal number of 32 bits, or the name of a symbol with the value that `validator` gives
    /// it. Id -2 with a diagnostic when that value is refused. Throws boost::bad_lexical_cast for the empty token and
    /// for numbers written otherwise: hexadecimal, behind blanks, out of range. 017 is 17.
    DimsRegistration registerSymbolicDims(const char* text, QL::SymbolValidator& validator);

    /// Registers an expression, or a list, in the engine's own syntax (SymbolicExprParser.h), whose symbols get the
    /// values that `validator` gives them. Id -2 with a diagnostic when the text cannot be read or a value is refused.
    DimsRegistration registerSymbolicDimsExpr(const char* text, QL::SymbolValidator& validator);

    /// Gives each symbol of `id` that has none the value of the validator. Null on success; otherwise what the first
    /// refused value gave.
    qlsvDiagnosticImpl* registerSymbolicIdValues(int id, QL::SymbolValidator& validator);

    /// The number that a host array holds, as a dimension; 0 when it holds no real scalar. `name`, `text` and
    /// `position` say where it is from. `array` may be null.
    int getNumberFromTxArray(const txArray_tag* array, const std::string& name, const char* text,
                             unsigned long position);

    /// An expression of some table. The diagnostic belongs to the caller and may be there when it is `ok`.
    struct CheckedExpr {
        /// The id in that table.
        unsigned long exprId;
        /// What went wrong, or null.
        qlsvDiagnosticImpl* diagnostic;
        /// Whether there is an expression.
        bool ok;
    };
    /// Reads dimensions into `exprTable`, simplifies them and leaves out those of 1 at the end, of which two are kept.
    /// Not ok, with a diagnostic, for what cannot be read, and `DimensionLessThanOne` for a number below 1.
    CheckedExpr generateExprIdFromExpr(const std::u16string& text, QL::SymbolicExprTable& exprTable) const;

    /// Empties `names`; then the names of the symbols of that expression of this table which has the number that the
    /// text would have alone in an empty table, when this is a symbolic dimension.
    void getSymbolicDimensionsFromExpr(const std::u16string& text, std::vector<std::string>& names) const;

    /// A text. The diagnostic belongs to the caller and may be there when it is `ok`.
    struct CheckedText {
        /// The text.
        std::u16string text;
        /// What went wrong, or null.
        qlsvDiagnosticImpl* diagnostic;
        /// Whether there is a text.
        bool ok;
    };
    /// Checks dimensions as generateExprIdFromExpr, in a table of its own, and gives their text in the host language.
    /// Not ok, with an empty text, for what that refuses, and `InsufficientNumDimensions` for fewer than `minDims`
    /// dimensions when that is above 1; what is no list has none then.
    CheckedText validateSymbolicDimsTExpr(const std::u16string& text, int minDims) const;

    // Ids and handles.

    /// Number of expressions, of which the first two are INHERIT and NOSYMBOLIC; 0 while there is no expression table.
    std::size_t getNumSymbolicDimss() const;

    /// Whether the id is one of this table: -1, 0 or above.
    bool isSymbolicDimsIdValid(int id) const;
    /// Whether the id is a symbolic dimension of this table: a valid id but -1 and 0.
    bool isaSymbolicDimension(int id) const;
    /// True for a valid id. Raises `InvalidDataTypeId` otherwise.
    bool checkSymbolicDimsId(int id) const;

    /// The handle of an id. Unchecked: the id must be valid.
    SymbolicDims getSymbolicDims(int id) const;
    /// The handle of an expression id. Unchecked: it must be below getNumSymbolicDimss().
    SymbolicDims getSymbolicDimsAt(unsigned long exprId) const;
    /// The expression of an expression id. Unchecked: it must be below getNumSymbolicDimss().
    QL::SymbolicExpr getSymbolicExpr(unsigned long exprId) const;

    /// The symbolic id of an expression id of this table, and the table counts as one with symbols registered; 0 for
    /// any other number.
    int convertExprId2SymbDimsId(unsigned long exprId);

    /// The id of a number, which may be any.
    int registerSymbolicDims(int value);

    /// Binds a symbol to a number, for eval. Returns the expression id of the symbol.
    unsigned long registerValue(const std::string& name, double value);
    unsigned long registerValue(const std::string& name, int value);

    // Values and shape.

    /// The value of each dimension under the numbers bound to its symbols; no number (NaN) for what has none.
    std::vector<double> eval(int id) const;

    /// Whether the id is the integer 1 or the double 1.0 itself.
    bool isOne(int id) const;
    /// Whether it is one, or every dimension evaluates to 1. True for a list of no dimensions.
    bool resolvesToOne(int id) const;

    /// Whether it has one dimension, or two of which one isOne().
    bool isVector(int id);

    /// The id of the product of all dimensions, as multiplying them by `*` one by one gives it.
    int getWidthSymbolicDimsId(int id);

    /// True and the number when the id is an integer value; false and 0 otherwise, also for an expression that would
    /// simplify to a number.
    std::pair<bool, int> getValueOf(int id) const;
    /// Whether it simplifies to an integer value.
    bool isNumericalDimension(int id) const;

    /// eval() as whole numbers, rounded towards zero. What is below 0 or no number is 0, what is beyond 64 bits the
    /// largest number.
    std::vector<unsigned long> getNumericDims(int id) const;

    /// The names of the symbols of a symbolic dimension, in the order of its text, each once; empty for another id.
    void getSymbolicDimsSymbols(int id, std::vector<std::string>& names) const;
    /// The texts of the dimensions of a symbolic dimension; empty for another id.
    void getSymbolicDimensions(int id, std::vector<std::string>& texts) const;

    // Reshaping. The result must have a dimension, and dimensions are no lists (both asserted in debug builds).

    /// Without the dimensions at the end that isOne(), as far as more than `minDims` are left.
    int removeTrailingOnes(int id, unsigned long minDims);
    /// Without the dimensions in front that isOne(). If all are, the first one.
    int removeLeadingOnes(int id);
    /// With 1 in place of the dimension at `index`; 1 for what has one dimension. Unchecked: `index` must be below the
    /// number of dimensions.
    int collapseDimensions(int id, unsigned long index);
    /// With the dimensions of 1 that the shape `numeric` has and the id lacks. The id itself when it is no symbolic
    /// dimension or `numeric` has no more dimensions than it. An entry of `numeric` that is neither 1 nor the value of
    /// the next dimension is left out without a word.
    int amendSymbolicDims(int id, const std::vector<int>& numeric);

    // Text.

    /// The C-like text. Owned by the table; good until the next call.
    const char* getDisplayString(int id);
    /// The text in the host language.
    std::string getTorvexExpr(int id) const;
    /// Writes the number of expressions and a line for each.
    void print(std::ostream& out) const;

    // Header files.

    /// Records the header file that declares the symbol `id`. The first file of an id stays; an invalid id is ignored.
    void registerHeaderFile(int id, const std::string& file);
    /// Adds the header files of the symbols of `id` to the set; of an invalid id none.
    void getHeaderFiles(int id, std::set<std::string>& files) const;

    // What is known of dimensions, kept by the constraint store (QLSymbolicDimsConstraints.h has meanings and
    // failures). The block is replaced by getOriginalBlock(block). A statement about an id that is no symbolic
    // dimension is ignored. Unchecked: the ids of questions must be valid.

    void addEqualRelation(int a, int b, const QLBlock* block);
    void addEqualConstraint(int a, int value, const QLBlock* block);
    void addGreaterThanRelation(int a, int b, const QLBlock* block);
    void addGreaterThanConstraint(int a, int value, const QLBlock* block);
    void addLessThanConstraint(int a, int value, const QLBlock* block);
    void addRange(int a, int min, int max, const QLBlock* block, GenerateCodeFlags flags);

    bool hasEqualRelation(int a, int b);
    bool hasGreaterThanRelation(int a, int b);
    SymbDimsRange getRange(int a) const;
    /// By the bounds alone: whether both are the number, the lower one is above it, the upper one is below it.
    bool hasEqualConstraint(int a, int value);
    bool hasGreaterThanConstraint(int a, int value);
    bool hasLessThanConstraint(int a, int value);

    // Listings: as those of SymbolicDimsConstraints with the same name; blocks are taken as they are.
    void getSymbolicDimsConstraints(std::vector<SymbolicDimsConstraint>& list) const;
    void getSymbolicDimsConstraints(std::vector<int>& ids) const;
    void getSymbolicDimsConstraints(const QLBlock* block, std::vector<int>& ids) const;
    void getSymbolicDimsConstraints(const QLBlock* block, const boost::function<const QLBlock*(const QLBlock*)>& mapper,
                                    std::vector<int>& ids) const;
    void getEquivalentSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getGreaterThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;
    void getLessThanSymbolicDims(std::vector<SymbolicDimsCGConstraint>& list) const;

    /// Whether two expressions, by their expression ids, are equal once simplified, or are known to be; the answer
    /// comes twice. Each is stated to equal its simplified form, by no block, which raises as addEqual. Unchecked: the
    /// ids must be below getNumSymbolicDimss().
    std::pair<bool, bool> equalSymbolicDims(unsigned long a, unsigned long b);

    // Operators in use.

    /// Appends one record for each expression of the operator, oldest first, with its two operands and no blocks.
    /// Unchecked: the operator must have two operands.
    void getOperatorConstraints(QL::SymbolicOp op, std::vector<SymbolicDimsCGConstraint>& list) const;
    /// getOperatorConstraints() for divisions.
    void getDivisionConstraints(std::vector<SymbolicDimsCGConstraint>& list) const;
    /// getOperatorConstraints() for modulos.
    void getModuloConstraints(std::vector<SymbolicDimsCGConstraint>& list) const;

    // Import.

    /// Brings a dimension of another table into this one and registers its symbols for `block`. Returns the id here and
    /// no diagnostic, or what registering a symbol returned with one. What is no symbolic dimension of `other` keeps
    /// its id.
    DimsRegistration importSymbolicDims(const SymbolicDimsTable& other, int id, const QLBlock* block);

    /// isLossOfSymbolicDimsDiagEnabled() as it answered the first time since the last reset.
    bool lossOfSymbolicDimsDiagEnabled() const;

  protected:
    /// Whether a symbol has entered the table by a registration or an import since the last reset.
    bool symbolsRegistered() const { return symbolsRegistered_; }

  private:
    void initialize();
    std::vector<int> dimensionIds(int id) const;
    int listOf(const std::vector<int>& dimensions);

    std::unique_ptr<SymbolicDimsConstraints> constraints_;
    std::vector<std::string> displayStrings_; // by expression id; cut at a reset
    std::unordered_map<int, std::string> headerFiles_;
    unsigned long oneIntExprId_ = 0;
    unsigned long oneDoubleExprId_ = 0;
    bool symbolsRegistered_ = false;
    mutable std::vector<std::string> torvexExprs_; // by expression id; cut at a reset
    mutable int lossOfSymbolicDimsDiag_ = 0;       // 0 off, 1 on, 2 not yet asked
};

} // namespace QLTypeSys
