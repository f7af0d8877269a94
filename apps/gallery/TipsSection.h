#pragma once

class QWidget;

// Information, warning and error buttons with their balloon tips.
QWidget *tipsSection();
