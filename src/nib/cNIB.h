#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"

#include <memory>

namespace zelctl {

// Entry box of a Portuguese bank account number (NIB), 21 characters over four boxes:
// bank (4), branch (4), account (11) and check digits (2). The caret moves from box to box
// as the user types or erases; a valid or an error mark shows beside the boxes. The
// control always keeps its size of 2685 × 330 twips. Focus given to the control lands in
// the first box; a number written by the host moves no focus. A host may delete the
// control from its Changed event.
class ZELCTL_EXPORT cNIB : public UserControl
{
    Q_OBJECT
    // The four boxes' texts in order. Writing fewer than 21 characters empties every box;
    // characters after the 21st are ignored.
    Q_PROPERTY(QString Text READ Text WRITE setText)
    // Background colour (OLE_COLOR), persisted as "BackColor".
    Q_PROPERTY(quint32 BackColor READ BackColor WRITE setBackColor)

public:
    explicit cNIB(QWidget *parent = nullptr);
    ~cNIB() override;

    QString Text() const;
    void setText(const QString &text);

    // True when the number has 21 characters and its last two are its check digits.
    Q_INVOKABLE bool Valid() const;

    // The check digits of the first 19 characters of mynib; "" when it is shorter.
    Q_INVOKABLE QString CalculateCheckDigits(const QString &mynib) const;

    platform::OleColor BackColor() const;
    void setBackColor(platform::OleColor color);

Q_SIGNALS:
    // The number has just become empty, or has just reached 21 characters.
    void Changed();

protected:
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;
    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};

} // namespace zelctl
