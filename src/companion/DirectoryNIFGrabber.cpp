#include "DirectoryNIFGrabber.h"

#include "common/modFuncs.h"
#include "platform/FileRead.h"

#include <QJsonDocument>
#include <QTimer>

namespace zelctl::companion {

namespace {

QJsonObject readDirectory(const QString &path)
{
    const platform::FileRead file = platform::readFile(path, modFuncs::MaxDataFileBytes);
    return file.ok() ? QJsonDocument::fromJson(file.bytes).object() : QJsonObject();
}

} // namespace

DirectoryNIFGrabber::DirectoryNIFGrabber(const QString &directoryFile, QObject *parent)
    : NIFGrabber(parent)
    , m_directoryFile(directoryFile)
{ }

QString DirectoryNIFGrabber::defaultDirectoryFile()
{
    return modFuncs::GetDataPath() + QStringLiteral("contribuintes.json");
}

QString DirectoryNIFGrabber::HolderName() const
{
    return GetField(QStringLiteral("NAME"));
}

QString DirectoryNIFGrabber::GetField(const QString &key) const
{
    return m_fields.value(key.toUpper());
}

void DirectoryNIFGrabber::SetField(const QString &key, const QString &value)
{
    m_fields.insert(key.toUpper(), value);
}

void DirectoryNIFGrabber::Fetch(const QString &taxNumber, const QVariant &option)
{
    Q_UNUSED(option)
    if (m_busy)
        return;
    m_busy = true;
    QTimer::singleShot(0, this, [this] { Q_EMIT Starting(); });
    QTimer::singleShot(m_latency, this, [this, taxNumber] { answer(taxNumber); });
}

void DirectoryNIFGrabber::answer(const QString &taxNumber)
{
    // The file is read at every fetch, so edits show without restarting the host.
    // The fields answer for the last fetch only: a number nobody knows leaves none.
    const QJsonObject holder = readDirectory(m_directoryFile).value(taxNumber).toObject();
    m_fields.clear();
    if (!holder.isEmpty()) {
        for (auto it = holder.begin(); it != holder.end(); ++it)
            m_fields.insert(it.key().toUpper(), it.value().toVariant().toString());
        m_fields.insert(QStringLiteral("ID"), taxNumber);
        Q_EMIT ReceivedInformation(taxNumber);
    }
    m_busy = false;
    Q_EMIT Finished();
}

} // namespace zelctl::companion
