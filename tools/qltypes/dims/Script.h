// The statements of a dims script, one a line; # begins a comment.
//
//   const std::vector<Statement> script = readScript("filter_bank.dims", text);
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "description/Description.h"

namespace inspector {

enum class Verb {
    Let,
    Bind,
    Register,
    Show,
    Simplify,
    Eval,
    Block,
    StateEqual,
    StateGreater,
    StateLess,
    StateRange,
    AskEqual,
    AskGreater,
    AskLess,
    AskRange,
    List,
    Help,
    Quit,
};

/// A part of a line, with its place.
struct ScriptPart {
    std::string text;
    std::size_t line = 0;   ///< from 1
    std::size_t column = 0; ///< in bytes, from 1
};

struct Statement {
    Verb verb = Verb::Help;
    ScriptPart whole;
    ScriptPart name;                  ///< what let, bind, register and block name
    std::vector<ScriptPart> operands; ///< of register: the text, then the numeric dimensions
};

/// Where a part of the script `file` stands, or what stands `offset` bytes behind its begin.
Place placeOf(const std::string& file, const ScriptPart& part, std::size_t offset = 0);

/// The statement of one line, or nothing where the line has none. Throws InputError. Expressions are not looked into.
std::optional<Statement> readStatement(const std::string& file, std::string_view line, std::size_t lineNumber);

/// All statements of a text. Throws InputError.
std::vector<Statement> readScript(const std::string& file, std::string_view text);

/// How statements are written, a line each.
std::string statementHelp();

} // namespace inspector
