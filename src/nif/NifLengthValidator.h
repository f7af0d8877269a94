#pragma once

#include <QValidator>

#include <functional>

namespace zelctl {

// The length limit of the NIF box, applied as a maximum length would apply it: a key
// beyond the limit is refused and a longer insertion is cut to fit, the rest of the text
// kept. A text that starts with the code of a country the control switches to is let
// through whole: the control then drops the code, and a cut made first would have eaten
// the end of that country's number ("ES12345678Z" pasted into a Portuguese box).
class NifLengthValidator : public QValidator
{
public:
    // `limit` answers the current limit (0 for none), `switchesCountry` whether a text
    // starts with a code the control switches to.
    NifLengthValidator(
        std::function<int()> limit, std::function<bool(const QString &)> switchesCountry, QObject *parent);

    State validate(QString &text, int &pos) const override;

private:
    std::function<int()> m_limit;
    std::function<bool(const QString &)> m_switchesCountry;
    // The text the last validation let through: what an edit started from.
    mutable QString m_before;
};

} // namespace zelctl
