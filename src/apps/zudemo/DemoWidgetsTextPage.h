#pragma once

#include <QWidget>

// The demo host's "Text and input" page: the text edit with its find/replace dialog and
// marks, the line edits and validators, the input filters and a DICOM node list.
class DemoWidgetsTextPage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoWidgetsTextPage(QWidget* inParent = nullptr);
};
