#include "Command.h"

#include "nib/NibCheckDigits.h"

// zelctl nib NUMBER: the check digits of a 19-, 20- or 21-character NIB and, for a whole
// number, whether its own check digits are right (exit 0 valid, 1 invalid).
int runNib(const QStringList &args, QTextStream &out, QTextStream &err)
{
    if (args.size() != 1) {
        err << "usage: zelctl nib NUMBER\n";
        return 2;
    }
    const QString &number = args.first();
    if (number.size() < 19 || number.size() > 21) {
        err << "zelctl nib: a NIB has 19 to 21 characters, not " << number.size() << '\n';
        return 2;
    }
    const QString digits = zelctl::CalculateNibCheckDigits(number);
    out << digits << '\n';
    if (number.size() < 21)
        return 0;
    const bool valid = number.right(2) == digits;
    out << (valid ? "valid" : "invalid") << '\n';
    return valid ? 0 : 1;
}
