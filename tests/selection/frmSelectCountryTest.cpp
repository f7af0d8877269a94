#include "selection/frmSelectCountry.h"
#include "selection/PictureBox.h"
#include "selection/mod_CTL.h"

#include "companion/CommandButton.h"
#include "platform/ModalPresenter.h"
#include "support/TestSupport.h"

#include <QFile>
#include <QTemporaryDir>
#include <QTest>
#include <QTreeWidget>

#include <gtest/gtest.h>

using namespace zelctl;

namespace {

struct Row
{
    QString code;
    QString name;
    QString number;

    bool operator==(const Row &) const = default;
};

std::ostream &operator<<(std::ostream &out, const Row &row)
{
    return out << row.code.toStdString() << " " << row.name.toStdString() << " " << row.number.toStdString();
}

QTreeWidget *listOf(frmSelectCountry &form)
{
    return form.findChild<QTreeWidget *>(QStringLiteral("cList"));
}

QList<Row> rows(frmSelectCountry &form)
{
    QList<Row> result;
    QTreeWidget *list = listOf(form);
    for (int i = 0; i < list->topLevelItemCount(); ++i) {
        const QTreeWidgetItem *item = list->topLevelItem(i);
        result.append({ item->text(1), item->text(0), item->text(2) });
    }
    return result;
}

QStringList codes(frmSelectCountry &form)
{
    QStringList result;
    for (const Row &row : rows(form))
        result << row.code;
    return result;
}

// The codes of the bundled country file, in file order.
QStringList fileCodes()
{
    QFile file(test::sourcePath(QStringLiteral("data/iso3166.txt")));
    file.open(QIODevice::ReadOnly);
    QStringList result;
    for (const QByteArray &line : file.readAll().split('\n')) {
        const QList<QByteArray> fields = line.split('\t');
        if (fields.size() >= 4)
            result << QString::fromLatin1(fields[1]);
    }
    return result;
}

CommandButton *button(frmSelectCountry &form, int index)
{
    for (CommandButton *b : form.findChildren<CommandButton *>(QStringLiteral("TRU_CommandButton1"))) {
        if (b->Index() == index)
            return b;
    }
    return nullptr;
}

void relist(frmSelectCountry &form, GSEL_CountryFilterList mode, const QString &custom = {})
{
    form.setFilterMode(mode);
    form.setCustomList(custom);
    form.RelistCountries();
}

} // namespace

TEST(CountryList, allCountriesWithPortugalFirstAndOnce)
{
    frmSelectCountry form;
    form.RelistCountries();
    const QList<Row> listed = rows(form);
    ASSERT_EQ(listed.size(), 249);
    EXPECT_EQ(listed[0], (Row { "PT", "Portugal", "620" }));
    EXPECT_EQ(listed[1], (Row { "AF", QStringLiteral("Afeganistão"), "004" }));
    EXPECT_TRUE(listed.contains(Row { "AL", QStringLiteral("Albânia"), "008" }));
    QStringList expected = fileCodes();
    expected.removeOne(QStringLiteral("PT"));
    expected.prepend(QStringLiteral("PT"));
    EXPECT_EQ(codes(form), expected);
}

TEST(CountryList, eachModeListsItsCountries)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyPT);
    EXPECT_EQ(rows(form), (QList<Row> { { "PT", "Portugal", "" } }));

    relist(form, GSEL_OnlyEU);
    const QStringList eu
        = QStringLiteral("AT,BE,BG,CY,CZ,DE,DK,EE,EL,ES,FI,FR,GB,HU,IE,IT,LT,LU,LV,MT,NL,PL,PT,RO,SE,SI,SK")
              .split(QLatin1Char(','));
    QStringList expected { QStringLiteral("PT") };
    for (const QString &code : fileCodes()) {
        if (eu.contains(code) && code != QStringLiteral("PT"))
            expected << code;
    }
    EXPECT_EQ(expected.size(), 27);
    EXPECT_EQ(codes(form), expected);

    relist(form, GSEL_Custom, QStringLiteral("FR,ES"));
    EXPECT_EQ(rows(form), (QList<Row> { { "ES", "Espanha", "724" }, { "FR", QStringLiteral("França"), "250" } }));

    relist(form, GSEL_Custom, QString());
    EXPECT_TRUE(rows(form).isEmpty());
    // Parts of codes are no codes.
    relist(form, GSEL_Custom, QStringLiteral("S,XES,E"));
    EXPECT_TRUE(rows(form).isEmpty());
}

TEST(CountryList, everyMemberStateShowsItsFlag)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    PictureBox surface;
    const QTreeWidget *list = listOf(form);
    ASSERT_EQ(list->topLevelItemCount(), 27);
    for (int row = 0; row < list->topLevelItemCount(); ++row) {
        const QString code = list->topLevelItem(row)->text(1);
        const QIcon icon = list->topLevelItem(row)->icon(0);
        ASSERT_FALSE(icon.isNull()) << code.toStdString();
        EXPECT_EQ(icon.pixmap(16, 16).toImage().convertToFormat(QImage::Format_RGB32),
            mod_CTL::flagOn(surface, code).image().convertToFormat(QImage::Format_RGB32))
            << code.toStdString();
    }
}

TEST(CountryList, aMissingFileIsReportedAndLeavesPortugalAlone)
{
    frmSelectCountry form;
    form.setCountryFile(test::sourcePath(QStringLiteral("data/no-such-file.txt")));
    {
        test::MessageBoxRecorder boxes;
        form.RelistCountries();
        ASSERT_EQ(boxes.shown().size(), 1);
        EXPECT_EQ(boxes.shown()[0].title, QStringLiteral("Ficheiro com acesso negado ou inexistente"));
    }
    EXPECT_EQ(rows(form), (QList<Row> { { "PT", "Portugal", "" } }));
}

TEST(CountryList, numbersAreWrittenWithAtLeastThreeDigits)
{
    QTemporaryDir dir;
    QFile file(dir.filePath(QStringLiteral("iso3166.txt")));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("8\tAL\tALB\tAlb\xe2nia\r\n" // one digit, name in Windows-1252
               "1234\tZZ\tZZZ\tLonga\r\n" // more than three digits stay
               "0\tXA\tXAA\tSem n\xfamero\r\n" // 0 means none
               " 42abc\tXC\tXCC\tSujo\n" // a bare LF ends a line too
               "77\tXD\r\n" // no name: no country
               "620\tPT\tPRT\tPortugal\r\n");
    file.close();

    frmSelectCountry form;
    form.setCountryFile(file.fileName());
    form.RelistCountries();
    EXPECT_EQ(rows(form),
        (QList<Row> { { "PT", "Portugal", "620" }, { "AL", QStringLiteral("Albânia"), "008" },
            { "ZZ", "Longa", "1234" }, { "XA", QStringLiteral("Sem número"), "" }, { "XC", "Sujo", "042" } }));
}

TEST(CountryDialog, okAndEnterChooseTheSelectedItem)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    QTreeWidget *list = listOf(form);
    test::ModalDriver ok([&](QDialog &) {
        form.show();
        // OK and Cancel are in sight, beside each other under the list.
        for (int index : { 0, 1 }) {
            const QRect place = button(form, index)->geometry();
            EXPECT_TRUE(button(form, index)->isVisible());
            EXPECT_TRUE(form.rect().contains(place)) << index;
            EXPECT_FALSE(list->geometry().intersects(place)) << index;
        }
        EXPECT_LT(button(form, 0)->x(), button(form, 1)->x());
        list->setCurrentItem(list->findItems(QStringLiteral("ES"), Qt::MatchExactly, 1).value(0));
        QTest::mouseClick(button(form, 0), Qt::LeftButton);
        return form.result();
    });
    EXPECT_EQ(platform::showModal(form), QDialog::Accepted);
    EXPECT_EQ(form.Tag(), QStringLiteral("ES"));
    EXPECT_FALSE(form.isVisible());

    form.show();
    list->setFocus();
    list->setCurrentItem(list->topLevelItem(2));
    QTest::keyClick(list, Qt::Key_Return);
    EXPECT_EQ(form.Tag(), list->topLevelItem(2)->text(1));
    EXPECT_EQ(form.result(), QDialog::Accepted);

    frmSelectCountry other;
    relist(other, GSEL_OnlyEU);
    button(other, 0)->click();
    EXPECT_EQ(other.Tag(), QString()) << "OK without a selection chooses nothing";
}
TEST(CountryDialog, doubleClickChoosesTheItem)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    form.show();
    QTreeWidget *list = listOf(form);
    QTreeWidgetItem *item = list->findItems(QStringLiteral("FR"), Qt::MatchExactly, 1).value(0);
    ASSERT_NE(item, nullptr);
    list->scrollToItem(item);
    const QPoint at = list->visualItemRect(item).center();
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, at);
    QTest::mouseDClick(list->viewport(), Qt::LeftButton, {}, at);
    EXPECT_EQ(form.Tag(), QStringLiteral("FR"));
    EXPECT_EQ(form.result(), QDialog::Accepted);
    EXPECT_FALSE(form.isVisible());
}

TEST(CountryDialog, cancelAndEscapeChooseNothing)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    QTreeWidget *list = listOf(form);
    list->setCurrentItem(list->topLevelItem(3));
    form.setTag(QStringLiteral("DE"));
    form.show();
    QTest::mouseClick(button(form, 1), Qt::LeftButton);
    EXPECT_EQ(form.Tag(), QString());
    EXPECT_EQ(form.result(), QDialog::Rejected);

    form.show();
    list->setCurrentItem(list->topLevelItem(3));
    QTest::keyClick(list, Qt::Key_Escape);
    EXPECT_EQ(form.Tag(), QString());
    EXPECT_FALSE(form.isVisible());
}
