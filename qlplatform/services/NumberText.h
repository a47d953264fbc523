// Numbers and their decimal texts. Nothing here depends on the locale or on the rounding mode.
//
//   std::string text = qlsv_dtoa(0.1, false);                              // "0.1"
//   double back = ut_strtod(utGetFpcContext(), text.c_str(), &end, &error); // the same double
#pragma once

#include <string>

#include "qlplatform/Export.h"

/// The shortest decimal text that reads back as the same double: "2", "0.25", "-1.5", "1e+16", "3.5e-5". Magnitudes
/// from 1e-4 to below 1e16 are written without an exponent; exponents have their sign and no leading zeros. Zeros keep
/// their sign; otherwise "inf", "-inf" and "nan". With `keepPoint` a text that would hold neither point nor exponent
/// ends in ".0".
QL_EXPORT std::string qlsv_dtoa(double value, bool keepPoint);

/// The text of a double as an argument of a constructor text; the digits are those of qlsv_dtoa(value, false).
QL_EXPORT std::string qlsv_dtoa_fitools(double value);

/// What number reading needs beside the text. Made on first use, kept for the life of the process, never changed.
class utFpcContext;
/// The context of this process; never null.
QL_EXPORT const utFpcContext* utGetFpcContext();

/// What ut_strtod says of a text.
enum utStrtodError : int {
    utStrtodOk = 0,
    utStrtodNoNumber = 1,   ///< the text does not begin with a number; the result is 0.0
    utStrtodOutOfRange = 2, ///< the result is an infinity, or 0.0 or a subnormal number
};

/// Reads the number that the text begins with, after blanks: the nearest double of a decimal or (0x) hexadecimal
/// number, "inf", "infinity" or "nan" in any case. `end`, when not null, is set behind what was read, or to `text` when
/// there was no number; `error`, when not null, to an utStrtodError. Unchecked: `context` and `text` must not be null.
QL_EXPORT double ut_strtod(const utFpcContext* context, const char* text, char** end, int* error);
