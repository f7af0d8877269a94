#include "Gallery.h"

#include "Sections.h"

#include "frame/ClassRegistry.h"

#include <QGroupBox>
#include <QLabel>
#include <QScrollArea>
#include <QVBoxLayout>

namespace {

// Which public classes this build serves, so a visitor sees what the form can hold.
QWidget *classList()
{
    QStringList lines;
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        const bool available = zelctl::ClassRegistry::factoryFor(info.classId) != nullptr;
        lines << QStringLiteral("%1 — %2").arg(QLatin1String(info.name), available ? "pronto" : "por construir");
    }
    auto *label = new QLabel(lines.join('\n'));
    label->setTextInteractionFlags(Qt::TextSelectableByMouse);
    return label;
}

} // namespace

Gallery::Gallery(QWidget *parent)
    : QMainWindow(parent)
{
    setWindowTitle(QString::fromUtf8(zelctl::ClassRegistry::HelpString));
    auto *form = new QWidget;
    m_sections = new QVBoxLayout(form);
    m_sections->addStretch();
    auto *scroll = new QScrollArea;
    scroll->setWidgetResizable(true);
    scroll->setWidget(form);
    setCentralWidget(scroll);
    resize(900, 700);

    addSection(QStringLiteral("NIB"), createNibSection());
    addSection(QStringLiteral("GIF animado"), createGifSection());
    addSection(QStringLiteral("Classes da biblioteca"), classList());
}

void Gallery::addSection(const QString &title, QWidget *content)
{
    auto *box = new QGroupBox(title);
    auto *layout = new QVBoxLayout(box);
    layout->addWidget(content);
    m_sections->insertWidget(m_sections->count() - 1, box);
}
