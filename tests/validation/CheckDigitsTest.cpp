#include "validation/nifValidator.h"

#include "support/TestSupport.h"

#include <QFile>
#include <QRegularExpression>

#include <gtest/gtest.h>

using namespace zelctl::nifValidator;

namespace {

// What a country's rules say of a number: with a '?' the digits that may stand in its place,
// with a '*' the capital letters (each "-" when none may), otherwise "valid" or "invalid".
QString verdict(const QString &country, const QString &pattern)
{
    const int index = CountryIndex(country);
    const auto accepted = [&](QChar wildcard, char first, char last) {
        QString accepted;
        for (char c = first; c <= last; ++c) {
            if (CheckTaxNumber(QString(pattern).replace(wildcard, QChar(c)), index))
                accepted += QChar(c);
        }
        return accepted.isEmpty() ? QStringLiteral("-") : accepted;
    };
    if (pattern.contains(u'?'))
        return accepted(u'?', '0', '9');
    if (pattern.contains(u'*'))
        return accepted(u'*', 'A', 'Z');
    return CheckTaxNumber(pattern, index) ? "valid" : "invalid";
}

} // namespace

TEST(CheckTaxNumber, knownAnswersOfEveryCountry)
{
    QFile file(zelctl::test::testDataPath("tax-numbers.txt"));
    ASSERT_TRUE(file.open(QIODevice::ReadOnly | QIODevice::Text));
    const QRegularExpression row(R"(^(\w\w) ("[^"]*"|\S+) (\S+)$)");
    QStringList countries;
    for (const QString &line : QString::fromUtf8(file.readAll()).split(u'\n', Qt::SkipEmptyParts)) {
        if (line.startsWith(u'#'))
            continue;
        const QRegularExpressionMatch match = row.match(line);
        ASSERT_TRUE(match.hasMatch()) << line.toStdString();
        const QString number = match.captured(2).remove(u'"');
        EXPECT_EQ(verdict(match.captured(1), number).toStdString(), match.captured(3).toStdString())
            << line.toStdString();
        countries << match.captured(1);
    }
    countries.removeDuplicates();
    EXPECT_EQ(countries.size(), CountryCount) << "every country has its known answers";
}
