#include "Gallery.h"

#include "Sections.h"

#include "common/modFuncs.h"
#include "frame/ClassRegistry.h"
#include "frame/FormFile.h"
#include "frame/UserControl.h"

#include <QFile>
#include <QFileDialog>
#include <QMenuBar>
#include <QMessageBox>

#include <QGroupBox>
#include <QLabel>
#include <QScrollArea>
#include <QUrl>
#include <QVBoxLayout>

namespace {

// What each public class is, as its page in docs/ says in its title, linked to that page,
// so a host developer trying the gallery knows where to read on.
QWidget *classList()
{
    QStringList lines;
    const QString docs = zelctl::modFuncs::GetRootPath() + QStringLiteral("docs/");
    for (const zelctl::ClassInfo &info : zelctl::ClassRegistry::classes()) {
        const QString name = QLatin1String(info.name);
        const QString kind = info.isControl ? QStringLiteral("controlo") : QStringLiteral("classe");
        QFile page(docs + name + QStringLiteral(".md"));
        if (!page.open(QIODevice::ReadOnly)) {
            lines << QStringLiteral("<b>%1</b> (%2)").arg(name, kind);
            continue;
        }
        // The title reads "# cNIF — tax number box".
        const QString title = QString::fromUtf8(page.readLine()).trimmed();
        const QString what = title.section(QStringLiteral(" — "), 1);
        lines << QStringLiteral("<a href=\"%1\">%2</a> (%3) — %4")
                     .arg(QUrl::fromLocalFile(page.fileName()).toString(), name, kind, what.toHtmlEscaped());
    }
    auto *label = new QLabel(lines.join(QStringLiteral("<br>")));
    label->setObjectName(QStringLiteral("classes"));
    label->setTextFormat(Qt::RichText);
    label->setOpenExternalLinks(true);
    label->setTextInteractionFlags(Qt::TextBrowserInteraction);
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
    addFileMenu();

    addSection(QStringLiteral("NIF"), createNifSection());
    addSection(QStringLiteral("NIB"), createNibSection());
    addSection(QStringLiteral("Sujeito da declaração"), createSubjectSection());
    addSection(QStringLiteral("Escolha do país"), createCountrySection());
    addSection(QStringLiteral("Seleção"), createSelectionSection());
    addSection(QStringLiteral("Dicas e botões de informação"), createTipsSection());
    addSection(QStringLiteral("Controlos com skin"), createSkinsSection());
    addSection(QStringLiteral("GIF animado"), createGifSection());
    // Last: what each class is and where its page is.
    addSection(QStringLiteral("Classes da biblioteca"), classList());
}

void Gallery::addSection(const QString &title, QWidget *content)
{
    auto *box = new QGroupBox(title);
    auto *layout = new QVBoxLayout(box);
    layout->addWidget(content);
    m_sections->insertWidget(m_sections->count() - 1, box);
}

QList<zelctl::UserControl *> Gallery::controls() const
{
    return centralWidget()->findChildren<zelctl::UserControl *>();
}

bool Gallery::saveForm(const QString &path, QString *error) const
{
    return zelctl::FormFile::save(path, controls(), error);
}

bool Gallery::openForm(const QString &path, QString *error)
{
    QJsonObject form;
    if (!zelctl::FormFile::load(path, &form, error))
        return false;
    zelctl::FormFile::apply(form, controls());
    return true;
}

void Gallery::addFileMenu()
{
    QMenu *file = menuBar()->addMenu(QStringLiteral("&Ficheiro"));
    const QString filter = QStringLiteral("Formulários (*.json)");
    file->addAction(QStringLiteral("&Abrir formulário..."), this, [this, filter] {
        const QString path = QFileDialog::getOpenFileName(this, QStringLiteral("Abrir formulário"), {}, filter);
        QString error;
        if (!path.isEmpty() && !openForm(path, &error))
            QMessageBox::warning(this, windowTitle(), error);
    });
    file->addAction(QStringLiteral("&Guardar formulário..."), this, [this, filter] {
        const QString path = QFileDialog::getSaveFileName(this, QStringLiteral("Guardar formulário"), {}, filter);
        QString error;
        if (!path.isEmpty() && !saveForm(path, &error))
            QMessageBox::warning(this, windowTitle(), error);
    });
    file->addSeparator();
    file->addAction(QStringLiteral("&Sair"), this, &QWidget::close);
}

void Gallery::fitToContents()
{
    auto *scroll = static_cast<QScrollArea *>(centralWidget());
    const int frame = 2 * scroll->frameWidth();
    resize(width() + 8, menuBar()->sizeHint().height() + scroll->widget()->sizeHint().height() + frame + 8);
}
