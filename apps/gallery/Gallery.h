#pragma once

#include <QMainWindow>

class QVBoxLayout;

namespace zelctl {
class UserControl;
}

// The demo host: a form with every control of the library, working on the bundled data.
class Gallery : public QMainWindow
{
    Q_OBJECT

public:
    explicit Gallery(QWidget *parent = nullptr);

    // Adds a titled row to the form; each area of the library contributes its own.
    void addSection(const QString &title, QWidget *content);

    // Every control on the form.
    QList<zelctl::UserControl *> controls() const;

    // Saves the controls' persisted properties to a form file, or loads them back into the
    // controls of the same class and name. False (with the reason in *error) on failure.
    bool saveForm(const QString &path, QString *error) const;
    bool openForm(const QString &path, QString *error);

    // Grows the window to show the whole form without scrolling, for a screenshot.
    void fitToContents();

private:
    void addFileMenu();

    QVBoxLayout *m_sections;
};
