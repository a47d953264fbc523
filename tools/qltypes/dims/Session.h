// Runs the statements of a dims script over one table of symbolic dimensions.
//
//   Session session("filter_bank.dims");
//   for (const Statement& statement : script) show(session.run(statement));
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

#include <nlohmann/json.hpp>

#include "dims/Facts.h"
#include "dims/Script.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace inspector {

/// What a statement gives. A statement that tells nothing has neither text nor values.
struct Answer {
    std::string text;              ///< one line, or several with a line end each
    nlohmann::ordered_json values; ///< what --json has of it, an object
    std::optional<Contradiction> contradiction;
};

class Session {
  public:
    /// `file` is named in complaints.
    explicit Session(std::string file) : file_(std::move(file)), facts_(table_) {}

    /// Throws InputError when the statement is wrong in itself; then it does nothing.
    Answer run(const Statement& statement);

    const QLTypeSys::SymbolicDimsTable& table() const { return table_; }
    const Facts& facts() const { return facts_; }

  private:
    int read(const ScriptPart& expression);
    int readSimplified(const ScriptPart& expression);
    unsigned long withNamesReplaced(unsigned long exprId, const ScriptPart& expression);
    std::string text(int id) const;

    Answer let(const Statement& statement);
    Answer bind(const Statement& statement);
    Answer registerText(const Statement& statement);
    Answer show(const Statement& statement);
    Answer eval(const Statement& statement);
    Answer state(const Statement& statement);
    Answer ask(const Statement& statement);
    Answer askRange(const Statement& statement);
    Answer listModel() const;
    Answer listCode() const;
    Answer listBlock(const std::string& name);
    int bound(const ScriptPart& text, int open) const;
    QLTypeSys::GenerateCodeFlags hiddenBounds(const ScriptPart& words) const;
    void failForSyntax(const ScriptPart& text, qlsvDiagnosticImpl* diagnostic) const;
    [[noreturn]] void fail(const ScriptPart& at, const std::string& complaint, std::size_t offset = 0) const;

    std::string file_;
    QLTypeSys::SymbolicDimsTable table_;
    Facts facts_;
    std::unordered_map<unsigned long, unsigned long> names_; // what let made stand for something else
    const QLBlock* block_ = nullptr;                         // who states
};

/// The bounds of a range in words: "16 to 512", "at least 16", "= 5", "anything".
std::string rangeText(const QLTypeSys::SymbDimsRange& range);

} // namespace inspector
