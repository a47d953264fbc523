// The tables identifier_strings.tsv and constructor_strings.tsv, and random texts that resemble what is in them.
#pragma once

#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "tests/fixed_point/Reference.h"

struct TextCase {
    int line;
    std::string text;
    reference::Reading reading;
    std::string lastColumn; // of a text that was read: its identifier text, or whether scaling was given
};

/// The cases of a table in tests/data.
std::vector<TextCase> textCases(const std::string& fileName);

/// The text with control and other bytes escaped, for traces.
std::string shown(std::string_view text);

/// A record of fixed point or scaled double that the checks accept and both text forms can hold.
fxpDataTypeProp randomProp(std::mt19937_64& random);

/// Any double: integers, decimal fractions, any bits.
double randomDouble(std::mt19937_64& random);

/// Pieces of the grammar of identifiers in random order, some of them valid.
std::string randomIdentifier(std::mt19937_64& random);

/// Words of constructor texts in random order, some of them valid.
std::string randomConstructor(std::mt19937_64& random);
