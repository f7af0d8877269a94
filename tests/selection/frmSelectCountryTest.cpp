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
    EXPECT_EQ(form.filterMode(), GSEL_All);
    EXPECT_EQ(form.windowTitle(), QStringLiteral("Escolha o país"));
    form.RelistCountries();
    const QList<Row> listed = rows(form);
    ASSERT_EQ(listed.size(), 249);
    EXPECT_EQ(listed[0], (Row { "PT", "Portugal", "620" }));
    EXPECT_EQ(listed[1], (Row { "AF", QStringLiteral("Afeganistão"), "004" }));
    EXPECT_EQ(codes(form).count(QStringLiteral("PT")), 1);
    EXPECT_TRUE(listed.contains(Row { "EL", QStringLiteral("Grécia"), "300" }));
    EXPECT_TRUE(listed.contains(Row { "AL", QStringLiteral("Albânia"), "008" }));
    QStringList expected = fileCodes();
    expected.removeOne(QStringLiteral("PT"));
    expected.prepend(QStringLiteral("PT"));
    EXPECT_EQ(codes(form), expected);
    EXPECT_EQ(listOf(form)->headerItem()->text(0), QStringLiteral("Nome"));
    EXPECT_EQ(listOf(form)->headerItem()->text(1), QStringLiteral("Identificação"));
    EXPECT_EQ(listOf(form)->headerItem()->text(2), QStringLiteral("Código"));
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

    relist(form, GSEL_Custom, QStringLiteral(" ES , PT"));
    EXPECT_EQ(codes(form), (QStringList { "ES", "PT" }));

    relist(form, GSEL_Custom, QString());
    EXPECT_TRUE(rows(form).isEmpty());
    // Parts of codes are no codes.
    relist(form, GSEL_Custom, QStringLiteral("S,XES,E"));
    EXPECT_TRUE(rows(form).isEmpty());
}

TEST(CountryList, eachCountryShowsItsFlag)
{
    frmSelectCountry form;
    relist(form, GSEL_Custom, QStringLiteral("PT,ES"));
    PictureBox surface;
    const QImage pt = mod_CTL::flagOn(surface, QStringLiteral("PT")).image();
    const QIcon icon = listOf(form)->topLevelItem(1)->icon(0);
    ASSERT_FALSE(icon.isNull());
    EXPECT_EQ(icon.pixmap(16, 16).toImage().convertToFormat(QImage::Format_RGB32), pt);
    EXPECT_EQ(mod_CTL::FlagScratchSurface, nullptr);
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

    test::MessageBoxRecorder boxes;
    relist(form, GSEL_Custom, QStringLiteral("PT,ES"));
    EXPECT_EQ(boxes.shown().size(), 1);
    EXPECT_TRUE(rows(form).isEmpty());
}

TEST(CountryList, numbersAreWrittenWithAtLeastThreeDigits)
{
    QTemporaryDir dir;
    QFile file(dir.filePath(QStringLiteral("iso3166.txt")));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("8\tAL\tALB\tAlb\xe2nia\r\n" // one digit, name in Windows-1252
               "1234\tZZ\tZZZ\tLonga\r\n" // more than three digits stay
               "0\tXA\tXAA\tSem n\xfamero\r\n" // 0 means none
               "\tXB\tXBB\tVazio\r\n" // so does nothing
               " 42abc\tXC\tXCC\tSujo\n" // a bare LF ends a line too
               "77\tXD\r\n" // no name: no country
               "only one field\r\n"
               "620\tPT\tPRT\tPortugal\r\n");
    file.close();

    frmSelectCountry form;
    form.setCountryFile(file.fileName());
    form.RelistCountries();
    EXPECT_EQ(rows(form),
        (QList<Row> { { "PT", "Portugal", "620" }, { "AL", QStringLiteral("Albânia"), "008" },
            { "ZZ", "Longa", "1234" }, { "XA", QStringLiteral("Sem número"), "" }, { "XB", "Vazio", "" },
            { "XC", "Sujo", "042" } }));
    EXPECT_EQ(listOf(form)->topLevelItem(1)->data(0, Qt::UserRole).toLongLong(), 8);
    EXPECT_FALSE(listOf(form)->topLevelItem(3)->data(0, Qt::UserRole).isValid());
}

TEST(CountryDialog, okChoosesTheSelectedItem)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    QTreeWidget *list = listOf(form);
    const auto select = [&](const QString &code) {
        const auto found = list->findItems(code, Qt::MatchExactly, 1);
        list->setCurrentItem(found.value(0));
        return found.value(0);
    };

    test::ModalDriver ok([&](QDialog &) {
        select(QStringLiteral("ES"));
        button(form, 0)->click();
        return form.result();
    });
    EXPECT_EQ(platform::showModal(form), QDialog::Accepted);
    EXPECT_EQ(form.Tag(), QStringLiteral("ES"));
    EXPECT_FALSE(form.isVisible());
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
    button(form, 1)->click();
    EXPECT_EQ(form.Tag(), QString());
    EXPECT_EQ(form.result(), QDialog::Rejected);

    form.show();
    list->setCurrentItem(list->topLevelItem(3));
    QTest::keyClick(list, Qt::Key_Escape);
    EXPECT_EQ(form.Tag(), QString());
    EXPECT_FALSE(form.isVisible());
}

TEST(CountryDialog, enterChoosesTheSelectedItemAndOkWithoutOneChoosesNothing)
{
    frmSelectCountry form;
    relist(form, GSEL_OnlyEU);
    form.show();
    QTreeWidget *list = listOf(form);
    list->setFocus();
    list->setCurrentItem(list->topLevelItem(2));
    const QString code = list->topLevelItem(2)->text(1);
    QTest::keyClick(list, Qt::Key_Return);
    EXPECT_EQ(form.Tag(), code);
    EXPECT_EQ(form.result(), QDialog::Accepted);

    frmSelectCountry other;
    relist(other, GSEL_OnlyEU);
    button(other, 0)->click();
    EXPECT_EQ(other.Tag(), QString());
}

TEST(CountryDialog, listFillsTheFormAndUnloadEmptiesIt)
{
    frmSelectCountry form;
    form.RelistCountries();
    form.resize(600, 400);
    form.show();
    EXPECT_EQ(listOf(form)->geometry(), QRect(0, 0, 600, 399));
    EXPECT_EQ(button(form, 0)->Caption(), QStringLiteral("&OK"));
    EXPECT_TRUE(button(form, 0)->Default());
    EXPECT_EQ(button(form, 1)->Caption(), QStringLiteral("&Cancelar"));

    auto *surface = form.findChild<PictureBox *>(QStringLiteral("Picture1"));
    ASSERT_NE(surface, nullptr);
    surface->setPicture(Picture(QImage(4, 4, QImage::Format_RGB32)));
    form.Unload();
    EXPECT_EQ(listOf(form)->topLevelItemCount(), 0);
    EXPECT_TRUE(surface->Picture().isNull());
    EXPECT_FALSE(form.isVisible());
}
