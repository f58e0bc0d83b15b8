#pragma once

#include <QWidget>

// The demo host's "Dialogs" page: opens the library's dialogs (message boxes, input, colour,
// file, overwrite question) through their wrappers and shows what came back.
class DemoDialogsPage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoDialogsPage(QWidget* inParent = nullptr);
};
