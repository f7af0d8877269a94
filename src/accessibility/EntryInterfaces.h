#pragma once

#include <QAccessibleWidget>

// What assistive technology reads of the two number entries. Each control is one editable
// text whose value is the whole number, with its validity as the description and the
// "invalid" state; its boxes and flag are its parts.
namespace zelctl::accessibility {

// cNIF: named by the host (its accessible name, a label whose buddy it is, its tooltip) or
// else by its Name, value "country, number", description "NIF válido" (with the holder's
// name once known) or "NIF inválido", as the box is coloured.
class NifInterface : public QAccessibleWidget
{
public:
    explicit NifInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;

private:
    bool isInvalid() const;
};

// The flag of a cNIF: a button named after the country that opens the country list.
class FlagInterface : public QAccessibleWidget
{
public:
    explicit FlagInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;
    QStringList actionNames() const override;
    void doAction(const QString &actionName) override;
    QStringList keyBindingsForAction(const QString &actionName) const override;
};

// cNIB: named by the host or "NIB", value the whole number, description "NIB válido" or
// "NIB inválido" as the marks beside the boxes show it.
class NibInterface : public QAccessibleWidget
{
public:
    explicit NibInterface(QWidget *widget);

    QString text(QAccessible::Text t) const override;
    QAccessible::State state() const override;

private:
    bool markShown(const char *name) const;
};

} // namespace zelctl::accessibility
