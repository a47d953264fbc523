// The readers and writers of number texts, written slowly and step by step: what the fast ones are held against.
#pragma once

#include <string>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace reference {

/// How a reading ended.
enum class Ending { read, invalid, badCast };

struct Reading {
    Ending ending = Ending::invalid;
    fxpDataTypeProp prop{};   // of a text that was read
    bool scalingGiven = true; // of a constructor text that was read
};

bool matchesIntegerPattern(const std::string& text);
bool matchesFixptPattern(const std::string& text);

Reading readIdentifier(const std::string& text);
Reading readConstructor(const std::string& text);

/// The identifier text; 64-bit integers as int64 and uint64 when `torvexNames` is true.
std::string writeIdentifier(const fxpDataTypeProp& prop, bool torvexNames);

} // namespace reference
