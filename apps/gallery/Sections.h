#pragma once

class QWidget;

// One builder per area of the library; each returns the content of a gallery row.
QWidget *createNibSection();
QWidget *createGifSection();
