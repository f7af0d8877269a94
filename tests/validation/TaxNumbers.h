#pragma once

#include "validation/nifValidator.h"

#include <QString>
#include <QStringList>

#include <gtest/gtest.h>

#include <functional>
#include <initializer_list>

// Test-side arithmetic for building tax numbers. The check digits are worked out here from
// the national rules, independently of the routines under test.
namespace zelctl::test {

inline bool isValid(QStringView country, const QString &number)
{
    return nifValidator::CheckTaxNumber(number, nifValidator::CountryIndex(country));
}

// The digit at 0-based index i of a text of digits.
inline int digitOf(const QString &digits, qsizetype i)
{
    return digits.at(i).digitValue();
}

// Sum of weight times digit, the first weight paired with the first character of digits.
inline int weighted(const QString &digits, std::initializer_list<int> weights)
{
    int sum = 0;
    qsizetype i = 0;
    for (int weight : weights)
        sum += weight * digitOf(digits, i++);
    return sum;
}

// Non-negative remainder.
inline int mod(long long a, int n)
{
    return int(((a % n) + n) % n);
}

// Every d in 0..9 for which prefix + d + suffix is accepted, as a string ("7", "" or more).
// Comparing it with the one computed check digit shows both that the right number passes
// and that the nine wrong ones fail.
inline QString acceptedDigits(QStringView country, const QString &prefix, const QString &suffix = {})
{
    QString accepted;
    for (char d = '0'; d <= '9'; ++d) {
        if (isValid(country, prefix + QChar(d) + suffix))
            accepted += QChar(d);
    }
    return accepted;
}

inline QString digitText(int check)
{
    return check >= 0 && check <= 9 ? QString::number(check) : QString();
}

// A run of digits and whether the rule under test accepts it.
struct Verdict
{
    const char *digits;
    bool accepted;
};

// The given digits that lie in 0..9, ascending and once each, as acceptedDigits gives them.
inline QString digitSet(std::initializer_list<int> digits)
{
    QString set;
    for (char d = '0'; d <= '9'; ++d) {
        for (int digit : digits) {
            if (digit == d - '0') {
                set += QChar(d);
                break;
            }
        }
    }
    return set;
}

// The first number from `from` upwards, as text of `width` digits, whose sum under `rule`
// has the wanted remainder.
template <typename Rule> QString firstWith(long long from, int width, Rule rule, int remainder, int modulus)
{
    for (long long n = from;; ++n) {
        const QString text = QString::number(n).rightJustified(width, u'0');
        if (mod(rule(text), modulus) == remainder)
            return text;
    }
}

inline int crossSum(int n)
{
    return n / 10 + n % 10;
}

// The check digit "up to the next ten" of a weighted sum.
inline int tenComplement(int sum)
{
    return mod(-sum, 10);
}

// A country whose numbers are lead + prefix + one check digit + tail, and the check digits
// it should accept after a prefix.
struct CheckDigitRule
{
    const char *country;
    QString lead, tail;
    QStringList prefixes;
    std::function<QString(const QString &)> accepted;
};

inline void expectCheckDigits(std::initializer_list<CheckDigitRule> rules)
{
    for (const CheckDigitRule &rule : rules) {
        for (const QString &prefix : rule.prefixes) {
            EXPECT_EQ(acceptedDigits(QString(rule.country), rule.lead + prefix, rule.tail), rule.accepted(prefix))
                << rule.country << " " << prefix.toStdString();
        }
    }
}

// A prefix that no check digit makes valid, and the rule that refuses it.
struct Refusal
{
    const char *rule, *country;
    QString prefix, tail;
};

inline void expectRefused(std::initializer_list<Refusal> rows)
{
    for (const Refusal &row : rows)
        EXPECT_EQ(acceptedDigits(QString(row.country), row.prefix, row.tail), "") << row.country << ": " << row.rule;
}

// A whole number, whether it is valid, and the rule that says so.
struct FormRule
{
    const char *rule, *country;
    QString number;
    bool valid;
};

inline void expectForms(std::initializer_list<FormRule> rows)
{
    for (const FormRule &row : rows)
        EXPECT_EQ(isValid(QString(row.country), row.number), row.valid) << row.country << ": " << row.rule;
}

} // namespace zelctl::test
