#include "NifLengthValidator.h"

namespace zelctl {

NifLengthValidator::NifLengthValidator(
    std::function<int()> limit, std::function<bool(const QString &)> switchesCountry, QObject *parent)
    : QValidator(parent)
    , m_limit(std::move(limit))
    , m_switchesCountry(std::move(switchesCountry))
{ }

QValidator::State NifLengthValidator::validate(QString &text, int &pos) const
{
    const int limit = m_limit();
    if (limit <= 0 || text.size() <= limit || m_switchesCountry(text)) {
        m_before = text;
        return Acceptable;
    }
    // An insertion ends at the caret: what does not fit is cut from its end, as a maximum
    // length cuts it. A caret that stands before the excess is no insertion's; then the
    // text keeps its first characters.
    const qsizetype excess = text.size() - limit;
    QString fitted = text;
    if (pos >= excess) {
        fitted.remove(pos - excess, excess);
        pos -= int(excess);
    } else {
        fitted.truncate(limit);
        pos = std::min(pos, limit);
    }
    if (fitted == m_before)
        return Invalid;
    text = fitted;
    m_before = text;
    return Acceptable;
}

} // namespace zelctl
