#include "selection/frmSelectCountry.h"
#include "selection/PictureBox.h"
#include "selection/clsGFXSelection.h"
#include "selection/mod_CTL.h"

#include "companion/CommandButton.h"
#include "support/TestSupport.h"

#include <QImage>
#include <QTemporaryDir>
#include <QTest>
#include <QTreeWidget>

#include <gtest/gtest.h>

#include <functional>

using namespace zelctl;
using namespace zelctl::mod_CTL;

namespace {

QTreeWidget *listOf(frmSelectCountry &form)
{
    return form.findChild<QTreeWidget *>(QStringLiteral("cList"));
}

// Each row as "code name number".
QStringList rows(frmSelectCountry &form)
{
    QStringList result;
    QTreeWidget *list = listOf(form);
    for (int i = 0; i < list->topLevelItemCount(); ++i) {
        const QTreeWidgetItem *item = list->topLevelItem(i);
        result << QStringList { item->text(1), item->text(0), item->text(2) }.join(QLatin1Char(' ')).trimmed();
    }
    return result;
}

void relist(frmSelectCountry &form, GSEL_CountryFilterList mode, const QString &custom = {})
{
    form.setFilterMode(mode);
    form.setCustomList(custom);
    form.RelistCountries();
}

} // namespace

// The order of the bundled list and the European Union's is in the golden pictures.
TEST(CountryList, eachModeListsItsCountriesWithPortugalFirstAndOnce)
{
    frmSelectCountry form;
    EXPECT_EQ(form.objectName(), "frmSelectCountry") << "the name a host finds the form by";
    form.RelistCountries();
    const QStringList every = rows(form);
    ASSERT_EQ(every.size(), 249);
    EXPECT_EQ(every[0], "PT Portugal 620");
    EXPECT_EQ(every.filter(QStringLiteral("PT ")).size(), 1);
    relist(form, GSEL_OnlyPT);
    EXPECT_EQ(rows(form), QStringList { "PT Portugal" });
    relist(form, GSEL_Custom, QStringLiteral("FR,ES"));
    EXPECT_EQ(rows(form), (QStringList { "ES Espanha 724", QStringLiteral("FR França 250") }));
    relist(form, GSEL_Custom, QStringLiteral("S,XES,E"));
    EXPECT_TRUE(rows(form).isEmpty()) << "parts of codes are no codes";
}

TEST(CountryList, aMissingFileLeavesPortugalAloneAndNumbersHaveAtLeastThreeDigits)
{
    QTemporaryDir dir;
    frmSelectCountry form;
    form.setCountryFile(dir.filePath(QStringLiteral("iso3166.txt")));
    test::MessageBoxRecorder boxes;
    form.RelistCountries();
    EXPECT_EQ(boxes.shown().size(), 1) << "the missing file is reported";
    EXPECT_EQ(rows(form), QStringList { "PT Portugal" });

    test::writeFile(dir.filePath(QStringLiteral("iso3166.txt")),
        "8\tAL\tALB\tAlb\xe2nia\r\n" // one digit, name in Windows-1252
        "1234\tZZ\tZZZ\tLonga\r\n" // more than three digits stay
        "0\tXA\tXAA\tSem n\xfamero\r\n" // 0 means none
        " 42abc\tXC\tXCC\tSujo\n" // a bare LF ends a line too
        "77\tXD\r\n" // no name: no country
        "620\tPT\tPRT\tPortugal\r\n");
    form.RelistCountries();
    EXPECT_EQ(rows(form),
        (QStringList { "PT Portugal 620", QStringLiteral("AL Albânia 008"), "ZZ Longa 1234",
            QStringLiteral("XA Sem número"), "XC Sujo 042" }));
}

// The row current when the dialog closes is its answer (Tag), unless the user cancels.
TEST(CountryDialog, okEnterAndDoubleClickChooseCancelAndEscapeDoNot)
{
    using Way = std::function<void(frmSelectCountry &, QTreeWidget *, QTreeWidgetItem *)>;
    const auto button = [](frmSelectCountry &form, int index) {
        for (CommandButton *b : form.findChildren<CommandButton *>(QStringLiteral("TRU_CommandButton1")))
            if (b->Index() == index)
                QTest::mouseClick(b, Qt::LeftButton);
    };
    const Way ok = [&](auto &form, auto *, auto *) { button(form, 0); };
    const Way doubleClick = [](auto &, QTreeWidget *list, QTreeWidgetItem *row) {
        const QPoint at = list->visualItemRect(row).center();
        QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, at);
        QTest::mouseDClick(list->viewport(), Qt::LeftButton, {}, at);
    };
    const struct
    {
        const char *name, *current, *tag; // the code of the current row, if any, and the answer
        Way way;
        int result;
    } cases[] = {
        { "OK", "ES", "ES", ok, QDialog::Accepted },
        { "OK with nothing selected", nullptr, "", ok, QDialog::Accepted },
        { "Enter", "IT", "IT", [](auto &, auto *list, auto *) { QTest::keyClick(list, Qt::Key_Return); },
            QDialog::Accepted },
        { "double click", "FR", "FR", doubleClick, QDialog::Accepted },
        { "Cancel", "DE", "", [&](auto &form, auto *, auto *) { button(form, 1); }, QDialog::Rejected },
        { "Escape", "DE", "", [](auto &, auto *list, auto *) { QTest::keyClick(list, Qt::Key_Escape); },
            QDialog::Rejected },
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.name);
        frmSelectCountry form;
        relist(form, GSEL_OnlyEU);
        form.show();
        QTreeWidget *list = listOf(form);
        QTreeWidgetItem *row
            = c.current ? list->findItems(QLatin1String(c.current), Qt::MatchExactly, 1).value(0) : nullptr;
        ASSERT_EQ(row != nullptr, c.current != nullptr);
        if (row) {
            list->setCurrentItem(row);
            list->scrollToItem(row);
            form.setTag(QStringLiteral("DE"));
        }
        list->setFocus();
        c.way(form, list, row);
        EXPECT_EQ(form.Tag(), QLatin1String(c.tag));
        EXPECT_EQ(form.result(), c.result);
        EXPECT_FALSE(form.isVisible());
    }
}

namespace {

class CountryFlag : public ::testing::Test
{
protected:
    void SetUp() override
    {
        FlagStripCache = {};
        // Smaller than a flag: the flag is whole all the same.
        surface.resize(4, 4);
    }
    void TearDown() override { SetUp(); }

    PictureBox surface;
};

} // namespace

// How the flags look is in the country dialog's golden picture; this is about which cell is taken.
TEST_F(CountryFlag, cellsFollowTheCodeOrder)
{
    EXPECT_TRUE(GetCountryFlag(QStringLiteral("PT")).isNull()) << "no surface of its own, no flag";
    const QImage cells(QStringLiteral(":/zelctl/COUNTRIES.bmp"));
    const struct
    {
        const char *code;
        QPoint at;
    } cases[] = { { "AF", { 0, 0 } }, { "ZW", { 224, 112 } }, { "GB", { 336, 80 } }, { "GR", { 256, 32 } },
        { "EL", { 256, 32 } } }; // Greece by its ISO and its tax code
    for (const auto &c : cases) {
        const Picture flag = flagOn(surface, QLatin1String(c.code));
        EXPECT_EQ(flag.image().convertToFormat(QImage::Format_RGB32),
            cells.copy(QRect(c.at, QSize(16, 16))).convertToFormat(QImage::Format_RGB32))
            << c.code;
    }
    for (const QString &code : clsGFXSelection().EU_CountryList().split(QLatin1Char(',')))
        EXPECT_FALSE(flagOn(surface, code).isNull()) << code.toStdString();
    for (const char *code : { "pt", "", "A", "F;", "PTX", ";Z", "XX" }) {
        EXPECT_EQ(flagCellIndex(QLatin1String(code)), -1) << code;
        EXPECT_TRUE(flagOn(surface, QLatin1String(code)).isNull()) << code;
    }
}
