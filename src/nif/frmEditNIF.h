#pragma once

#include "zelctl_export.h"

#include <QDialog>

#include <memory>

namespace zelctl {

class cNIF;

// "Editar informação de contribuinte": the record of the number in one NIF control, with
// the holder's name, tax office, marital status, spouse's number, bank number, e-mail,
// birth date, telephone, territory and status. Each input carries its record id in its
// "Tag" property. Nothing is written until "&Aplicar" or "&OK" (also Enter); the values
// then go through the control's Nome and Information, which keep them in its record and
// the host's declaration and raise the control's events. A birth date is shown as
// yyyy-MM-dd once read (a two-digit year is the latest such year not after this one); one
// that cannot be read stays as typed, marked white on red. Shown modally with
// platform::showModal after SetNIFControl.
class ZELCTL_EXPORT frmEditNIF : public QDialog
{
    Q_OBJECT

public:
    explicit frmEditNIF(QWidget *parent = nullptr);
    ~frmEditNIF() override;

    // Binds the form to a control (borrowed) and loads its record.
    void SetNIFControl(cNIF *control);

    // Writes the name and every row to the bound control, in row order.
    Q_INVOKABLE void ApplyValues();
    // Shows the bound control's current record again, dropping what was not applied.
    Q_INVOKABLE void LoadValues();

protected:
    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    std::unique_ptr<class frmEditNIFPrivate> const d;
};

} // namespace zelctl
