#include "modFuncs.h"

#include "platform/FileRead.h"
#include "platform/MessageBox.h"
#include "platform/Settings.h"
#include "platform/WindowHandles.h"

#include <QDir>
#include <QFileInfo>
#include <QRegularExpression>
#include <QWidget>

#include <array>

namespace zelctl::modFuncs {

namespace {

thread_local QString CachedRootPath;

QString withTrailingSlash(QString path)
{
    if (!path.endsWith(QLatin1Char('/')))
        path += QLatin1Char('/');
    return path;
}

QString properCase(const QString &text)
{
    QString result = text.toLower();
    bool wordStart = true;
    for (QChar &c : result) {
        if (c.isSpace()) {
            wordStart = true;
        } else if (wordStart) {
            c = c.toUpper();
            wordStart = false;
        }
    }
    return result;
}

} // namespace

QString GetRootPath()
{
    if (!CachedRootPath.isEmpty())
        return CachedRootPath;
    CachedRootPath = platform::GetSetting(QStringLiteral("zEL"), QStringLiteral("Setup"), QStringLiteral("RootPath"));
    if (CachedRootPath.isEmpty()) {
        CachedRootPath = withTrailingSlash(QDir::currentPath());
        platform::SaveSetting(
            QStringLiteral("zEL"), QStringLiteral("Setup"), QStringLiteral("RootPath"), CachedRootPath);
    }
    CachedRootPath = withTrailingSlash(CachedRootPath);
    return CachedRootPath;
}

QString GetDataPath()
{
    return GetRootPath() + QStringLiteral("data/");
}

qint64 SafeFileLength(const QString &path)
{
    const QFileInfo info(path);
    return info.isFile() ? info.size() : 0;
}

QString decodeWindows1252(const QByteArray &bytes)
{
    // Windows-1252 differs from Latin-1 only in 0x80-0x9F; the five unassigned bytes keep
    // their Latin-1 control characters.
    static constexpr std::array<char16_t, 32> high = {
        0x20AC,
        0x0081,
        0x201A,
        0x0192,
        0x201E,
        0x2026,
        0x2020,
        0x2021,
        0x02C6,
        0x2030,
        0x0160,
        0x2039,
        0x0152,
        0x008D,
        0x017D,
        0x008F,
        0x0090,
        0x2018,
        0x2019,
        0x201C,
        0x201D,
        0x2022,
        0x2013,
        0x2014,
        0x02DC,
        0x2122,
        0x0161,
        0x203A,
        0x0153,
        0x009D,
        0x017E,
        0x0178,
    };
    QString text(bytes.size(), Qt::Uninitialized);
    QChar *out = text.data();
    for (const char byte : bytes) {
        const auto value = static_cast<unsigned char>(byte);
        *out++ = QChar(value >= 0x80 && value < 0xA0 ? high[value - 0x80] : char16_t(value));
    }
    return text;
}

QString ReadWholeFile(const QString &path, bool quiet)
{
    const platform::FileRead file = platform::readFile(path, MaxDataFileBytes);
    if (file.ok() && !file.bytes.isEmpty())
        return decodeWindows1252(file.bytes);
    if (!quiet) {
        platform::messageBox(platform::MsgIcon::Warning, QStringLiteral("Ficheiro com acesso negado ou inexistente"),
            QStringLiteral("Não foi possível aceder ao ficheiro:\n") + path
                + QStringLiteral("\n\nPor favor verifique se existe uma nova versão desta aplicação"));
    }
    return {};
}

QList<QStringView> textLines(QStringView text)
{
    QList<QStringView> lines = text.split(u'\n');
    for (QStringView &line : lines) {
        if (line.endsWith(u'\r'))
            line.chop(1);
    }
    return lines;
}

QString FormatShortName(const QString &name)
{
    // Every run of blanks counts as one, so a name padded to line up in a list keeps its words.
    static const QRegularExpression blanks(QStringLiteral(" {2,}"));
    const QString collapsed = QString(name).replace(blanks, QStringLiteral(" "));
    const QStringList words = collapsed.split(QLatin1Char(' '), Qt::SkipEmptyParts);
    if (words.size() < 3)
        return properCase(collapsed);
    QString shortName = words.first() + QLatin1Char(' ') + words.last();
    if (shortName.size() < 10)
        shortName = words.first() + QLatin1Char(' ') + words.at(1).left(1) + QStringLiteral(". ") + words.last();
    return properCase(shortName);
}

void MakeWindowTopmost(qint32 hwnd)
{
    QWidget *window = platform::widgetOf(hwnd);
    if (!window)
        return;
    window->setAttribute(Qt::WA_ShowWithoutActivating);
    window->setWindowFlag(Qt::WindowStaysOnTopHint);
    window->show();
    window->raise();
}

RECT GetObjectWindowRect(const QObject *object)
{
    if (!object)
        return {};
    const QWidget *window = platform::widgetOf(object->property("hWnd").value<qint32>());
    if (!window)
        return {};
    const QRect frame
        = window->isWindow() ? window->frameGeometry() : QRect(window->mapToGlobal(QPoint(0, 0)), window->size());
    return { frame.left(), frame.top(), frame.left() + frame.width(), frame.top() + frame.height() };
}

} // namespace zelctl::modFuncs
