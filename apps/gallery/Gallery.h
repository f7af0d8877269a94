#pragma once

#include <QMainWindow>

class QVBoxLayout;

// The demo host: a form with every control of the library, working on the bundled data.
class Gallery : public QMainWindow
{
    Q_OBJECT

public:
    explicit Gallery(QWidget *parent = nullptr);

    // Adds a titled row to the form; each area of the library contributes its own.
    void addSection(const QString &title, QWidget *content);

private:
    QVBoxLayout *m_sections;
};
