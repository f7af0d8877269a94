#pragma once

#include "zelctl_export.h"

#include <QStringView>
#include <QtGlobal>

// Whether a tax number typed for a country is well formed: one check routine per member
// state of the European Union, chosen by a country index, and the small helpers they share.
//
// Every routine takes the number exactly as typed: nothing is trimmed, no case is folded
// and no country prefix is removed. Letters compare case-sensitively (except in IsLetter).
// A wrong length, a wrong character or a wrong check digit answers false; nothing throws.
// All functions are pure, re-entrant and allocate nothing.
//
// Two readings of the text recur. The digit value of a character is 0..9 for an ASCII
// digit and 0 for anything else. "Numeric" is the lenient test of IsNumericFrom. Where a
// routine needs a run of characters as one whole number, the run must be all digits, and
// the routine answers false when it is not.
namespace zelctl::nifValidator {

inline constexpr int CountryCount = 27;

// The index of one of the 27 country codes "AT", "BE", ... "SK" (alphabetical; Greece is
// "EL", the United Kingdom "GB"). The comparison is exact: "pt", "PT " or "US" give -1.
ZELCTL_EXPORT int CountryIndex(QStringView code);

// The code of a country index 0..26, or an empty view for any other index.
ZELCTL_EXPORT QStringView CountryCode(int countryIndex);

// Runs the check routine of the country index on text. An index outside 0..26 names a
// country without a routine, whose numbers are always accepted (true).
ZELCTL_EXPORT bool CheckTaxNumber(QStringView text, int countryIndex);

// Helpers -------------------------------------------------------------------------------

// The lenient numeric test of the part of text from the 1-based position start: length
// characters when length > 0, else to the end. False when text is shorter than start
// characters or start < 1. Numeric means a number in the widest sense a user might type:
// ASCII digits with one optional "." or "," and an optional exponent ("1E5"), blanks
// (space, tab) around it and one "+" or "-" before or after it. The empty text is not.
ZELCTL_EXPORT bool IsNumericFrom(QStringView text, int start, int length);

// The smallest whole number not below x (4.0 gives 4, 4.1 gives 5), held to the range of a
// 32-bit integer; 0 for NaN. Routines use RoundUp(sum / 10) * 10 - sum as the distance
// from a sum to the next multiple of 10.
ZELCTL_EXPORT qint32 RoundUp(double x);

// a mod b, exactly, for a whole number a >= 0 and b > 0; -1 when either is out of range.
ZELCTL_EXPORT qint32 BigMod(qint64 a, qint32 b);

// True when ch is exactly one character whose upper case lies in "A".."Z", so a..z count
// and accented letters do not.
ZELCTL_EXPORT bool IsLetter(QStringView ch);

// "A".."Z" for 0..25, "?" for any other value.
ZELCTL_EXPORT char16_t AlphabetLetter(int i);

// The Cyprus weight of a digit in an odd position: 0..9 give 1, 0, 5, 7, 9, 13, 15, 17, 19,
// 21; any other value gives -1.
ZELCTL_EXPORT int CyprusOddValue(int d);

// Numbers with one form ------------------------------------------------------------------

ZELCTL_EXPORT bool CheckAT(QStringView text); // "U" and 8 digits
ZELCTL_EXPORT bool CheckBE(QStringView text); // 10 digits starting 0, mod 97 pair
ZELCTL_EXPORT bool CheckCY(QStringView text); // 8 digits and a capital letter
ZELCTL_EXPORT bool CheckDE(QStringView text); // 9 digits, MOD 11,10
ZELCTL_EXPORT bool CheckDK(QStringView text); // 8 digits, weighted sum divisible by 11
ZELCTL_EXPORT bool CheckEE(QStringView text); // 9 digits
ZELCTL_EXPORT bool CheckEL(QStringView text); // 9 digits, powers of two
ZELCTL_EXPORT bool CheckFI(QStringView text); // 8 digits
ZELCTL_EXPORT bool CheckHU(QStringView text); // 8 digits
ZELCTL_EXPORT bool CheckIT(QStringView text); // 11 digits, Luhn
ZELCTL_EXPORT bool CheckLU(QStringView text); // 8 digits, mod 89 pair
ZELCTL_EXPORT bool CheckMT(QStringView text); // 8 digits, mod 37 pair
ZELCTL_EXPORT bool CheckNL(QStringView text); // 9 digits, "B" and a 2-digit suffix
ZELCTL_EXPORT bool CheckPL(QStringView text); // 10 digits
ZELCTL_EXPORT bool CheckPT(QStringView text); // 9 digits, mod 11
ZELCTL_EXPORT bool CheckRO(QStringView text); // 2 to 10 digits, read as 10 with leading zeros
ZELCTL_EXPORT bool CheckSE(QStringView text); // 10 digits, Luhn, and "01"
ZELCTL_EXPORT bool CheckSI(QStringView text); // 8 digits
ZELCTL_EXPORT bool CheckSK(QStringView text); // 10 digits divisible by 11

// Numbers with several forms -----------------------------------------------------------
// Each country routine tells the forms apart and calls one of the routines below it; those
// check their own form only and expect the country routine's numeric test to have passed.

// Bulgaria: 9 digits (legal entity) or 10 (person, foreigner, other); all digits.
ZELCTL_EXPORT bool CheckBG(QStringView text);
ZELCTL_EXPORT bool CheckBGLegal(QStringView text);
ZELCTL_EXPORT bool CheckBGPerson(QStringView text); // YYMMDD birth date inside
ZELCTL_EXPORT bool CheckBGForeigner(QStringView text);
ZELCTL_EXPORT bool CheckBGOther(QStringView text);

// Czech Republic: 8 digits (legal entity), 9 (special when it starts with 6, else a person
// born before 1954) or 10 (a person born from 1954 to 1999).
ZELCTL_EXPORT bool CheckCZ(QStringView text);
ZELCTL_EXPORT bool CheckCZLegal(QStringView text);
ZELCTL_EXPORT bool CheckCZSpecial(QStringView text);
ZELCTL_EXPORT bool CheckCZPerson9(QStringView text);
ZELCTL_EXPORT bool CheckCZPerson10(QStringView text);

// Spain: 9 characters; a letter or digit, 7 digits, and a check digit or letter.
ZELCTL_EXPORT bool CheckES(QStringView text);
// t: 7 digits and the check digit.
ZELCTL_EXPORT bool CheckESCifDigit(QStringView t);
// Whether the last character of text is the personal-number letter of n.
ZELCTL_EXPORT bool CheckESDniLetter(qint64 n, QStringView text);
// t: 7 digits and the check letter "A".."J".
ZELCTL_EXPORT bool CheckESCifLetter(QStringView t);

// France: a 2-character key (digits, or letters without I and O) and the 9-digit SIREN.
ZELCTL_EXPORT bool CheckFR(QStringView text);

// United Kingdom: "GD" or "HA" and 3 digits, or 9 or 12 digits.
ZELCTL_EXPORT bool CheckGB(QStringView text);

// Ireland: 7 digits and a letter, or the old form with "+", "*" or a letter second.
ZELCTL_EXPORT bool CheckIE(QStringView text);
// t: 7 digits and the check letter.
ZELCTL_EXPORT bool CheckIEChar(QStringView t);

// Lithuania: 9 digits (legal entity) or 12 (temporary registration).
ZELCTL_EXPORT bool CheckLT(QStringView text);
ZELCTL_EXPORT bool CheckLTLegal(QStringView text);
ZELCTL_EXPORT bool CheckLTTemporary(QStringView text);

// Latvia: 11 digits; a legal entity when the first is above 3, else a person's DDMMYY code.
ZELCTL_EXPORT bool CheckLV(QStringView text);
ZELCTL_EXPORT bool CheckLVLegal(QStringView text);
ZELCTL_EXPORT bool CheckLVPerson(QStringView text);

} // namespace zelctl::nifValidator
