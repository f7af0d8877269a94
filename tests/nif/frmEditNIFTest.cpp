#include "NifTestSupport.h"

#include "nif/frmEditNIF.h"

#include <QComboBox>
#include <QDate>
#include <QSignalSpy>

#include <map>
#include <tuple>

using namespace zelctl;
using namespace zelctl::test;

namespace {

enum Button { Apply = 0, Ok = 1, Cancel = 2, PublicInformation = 3 };

// The record form over a control with no declaration: the record the user confirmed before
// is the control's own, which is where values typed into the form were once lost.
class RecordForm : public NifFixture
{
protected:
    void SetUp() override
    {
        NifFixture::SetUp();
        control->setValue("PT" + PlainNif);
        grabber = grabbers.last;
        grabber->answer("PT" + PlainNif, {});
        for (const auto &[id, value] :
            std::map<QString, QString> { { "servico", "3131" }, { "estadocivil", "1" }, { "conjuge", "PT198765436" },
                { "email", "maria@example.invalid" }, { "datanascimento", "1980-05-07" }, { "status", "Activo" } })
            control->setInformation(id, value);
        control->setNome("MARIA");
        editor = open();
    }
    void TearDown() override
    {
        editor.reset();
        NifFixture::TearDown();
    }

    // Shown before it is given the control, as a host may: the rows come up in a shown form.
    std::unique_ptr<frmEditNIF> open()
    {
        auto form = std::make_unique<frmEditNIF>(this->form);
        form->show();
        form->SetNIFControl(control);
        EXPECT_TRUE(test::showActive(form.get()));
        return form;
    }

    // The input of a record id in the rows' frame (the templates, element 0, carry none).
    template <typename T = QWidget> T *row(const QString &id) const
    {
        for (QWidget *widget : editor->findChild<QWidget *>("pFrame")->findChildren<QWidget *>()) {
            if (widget->property("Tag").toString() == id && widget->property("Index").toInt() > 0)
                return qobject_cast<T *>(widget);
        }
        return nullptr;
    }
    QLineEdit *name() const { return editor->findChild<QLineEdit *>("xNome"); }

    void retype(QLineEdit *box, const QString &text)
    {
        box->setFocus();
        box->selectAll();
        QTest::keyClicks(box, text);
    }

    // The control's own fetcher: the form's controls make fetchers of their own.
    ScriptedGrabber *grabber = nullptr;
    std::unique_ptr<frmEditNIF> editor;
};

} // namespace

TEST_F(RecordForm, loadsTheRecordIntoItsRows)
{
    auto *shown = editor->findChild<cNIF *>("cNIF1");
    EXPECT_EQ(shown->Value(), "PT" + PlainNif);
    EXPECT_TRUE(shown->Locked());
    EXPECT_TRUE(shown->DisablePopupMenu());

    int index = 0;
    for (const char *id :
        { "servico", "estadocivil", "conjuge", "nib", "email", "datanascimento", "territorio", "telefone", "status" })
        EXPECT_EQ(row(id)->property("Index").toInt(), ++index) << id;
    retype(row<QLineEdit>("servico"), "123456");
    EXPECT_EQ(row<QLineEdit>("servico")->text(), "1234") << "a tax office code has 4 characters";
    EXPECT_EQ(row<QComboBox>("estadocivil")->currentText(), "Casado");
    EXPECT_EQ(row<cNIF>("conjuge")->Value(), "PT198765436");
    EXPECT_TRUE(row<QLineEdit>("status")->isReadOnly());

    EXPECT_TRUE(row<cNIF>("conjuge")->Enabled()) << "a married holder's spouse can be given";
    for (const auto &[status, spouse] : std::map<int, bool> { { 0, false }, { 2, true }, { 5, false } }) {
        row<QComboBox>("estadocivil")->setCurrentIndex(status);
        EXPECT_EQ(row<cNIF>("conjuge")->Enabled(), spouse) << "status " << status;
    }
}

TEST_F(RecordForm, birthDateIsReadWhenLeftAndKeptWhenUnreadable)
{
    const int year = QDate::currentDate().year();
    const QString thisYear = QString::number(year % 100).rightJustified(2, '0');
    const QString nextYear = QString::number((year + 1) % 100).rightJustified(2, '0');
    // Typed, then shown once the box is left, and whether it is marked unreadable.
    const std::tuple<QString, QString, bool> cases[] = {
        { "1980-5-7", "1980-05-07", false },
        { "7/5/80", "1980-05-07", false },
        { "1.2." + thisYear, QString::number(year) + "-02-01", false },
        { "1-2-" + nextYear, QString::number(year - 99) + "-02-01", false },
        { "ontem", "ontem", true },
    };
    QLineEdit *date = row<QLineEdit>("datanascimento");
    for (const auto &[typed, shown, marked] : cases) {
        retype(date, typed);
        row<QLineEdit>("telefone")->setFocus();
        EXPECT_EQ(date->text(), shown) << typed.toStdString();
        EXPECT_EQ(date->palette().color(QPalette::Base) == Qt::red, marked) << typed.toStdString();
    }
}

TEST_F(RecordForm, confirmedValuesReachTheRecordAndCancelKeepsIt)
{
    const std::map<QString, QString> typed { { "servico", "1155" }, { "nib", "003506510000001234580" },
        { "datanascimento", "7/5/80" }, { "territorio", "Açores" }, { "telefone", "213456789" } };
    retype(name(), "JOANA");
    for (const auto &[id, text] : typed)
        row<QLineEdit>(id)->setText(text);
    row<QComboBox>("estadocivil")->setCurrentIndex(0);
    row<cNIF>("conjuge")->setValue("");
    events.clear();
    press(*editor, Apply);
    EXPECT_TRUE(editor->isVisible()) << "Apply keeps the form open";
    EXPECT_EQ(control->Nome(), "JOANA");
    EXPECT_EQ(control->Information("estadocivil"), "0");
    EXPECT_EQ(control->Information("estadocivil.text"), "Solteiro");
    EXPECT_EQ(control->Information("conjuge"), "") << "an empty number is kept empty";
    EXPECT_FALSE(events.contains("UpdatedInformation:email")) << "unchanged values raise nothing";

    QSignalSpy accepted(editor.get(), &QDialog::accepted);
    retype(row<QLineEdit>("email"), "joana@example.invalid");
    QTest::keyClick(row<QLineEdit>("email"), Qt::Key_Return);
    EXPECT_EQ(accepted.count(), 1) << "Enter is OK";
    EXPECT_EQ(control->Information("email"), "joana@example.invalid");

    editor = open();
    events.clear();
    EXPECT_EQ(name()->text(), "JOANA");
    EXPECT_EQ(row<QComboBox>("estadocivil")->currentText(), "Solteiro");
    for (const auto &[id, text] : typed)
        EXPECT_EQ(row<QLineEdit>(id)->text(), id == "datanascimento" ? "1980-05-07" : text) << id.toStdString();
    row<QComboBox>("estadocivil")->setCurrentIndex(2);
    row<cNIF>("conjuge")->setValue("PT" + AnaNif);
    retype(name(), "RUI");
    EXPECT_EQ(editor->findChild<cNIF *>("cNIF1")->Nome(), "RUI") << "the shown number follows the name box";
    retype(row<QLineEdit>("email"), "outro@example.invalid");
    press(*editor, Cancel);
    EXPECT_EQ(control->Information("email"), "joana@example.invalid") << "Cancel changes nothing";
    EXPECT_EQ(control->Nome(), "JOANA");
    EXPECT_TRUE(events.isEmpty()) << events.join(' ').toStdString();
}

// Of a holder nothing is known of, the form shows the answer when the fetch ends.
TEST_F(RecordForm, publicInformationShowsWhatIsFetched)
{
    control->setValue("PT" + AnaNif);
    grabber->answer("PT" + AnaNif, {});
    editor = open();
    EXPECT_EQ(row<QComboBox>("estadocivil")->currentIndex(), -1) << "nothing known, nothing chosen";
    press(*editor, PublicInformation);
    ASSERT_EQ(grabber->fetched, QStringList({ "PT" + PlainNif, "PT" + AnaNif, "PT" + AnaNif }));
    grabber->answer("PT" + AnaNif,
        { { "NAME", "ANA LOPES" }, { "ESTADOCIVIL", "Divorciado" }, { "DATANASCIMENTO", "1981-04-17" } });
    EXPECT_EQ(name()->text(), "ANA LOPES");
    EXPECT_EQ(row<QComboBox>("estadocivil")->currentText(), "Divorciado") << "a state given by name";
    EXPECT_EQ(row<QLineEdit>("datanascimento")->text(), "1981-04-17");
}
