#pragma once

#include "zubase/zubase_export.h"

#include <QLineEdit>

// A line edit that cleans pasted multi-line text when editing ends: white space at both ends
// goes, and every line feed, carriage return and tab inside becomes one blank.
class ZUBASE_EXPORT ZuAutoTrimLineEdit : public QLineEdit
{
public:
    explicit ZuAutoTrimLineEdit(QWidget* inParent = nullptr);
    ~ZuAutoTrimLineEdit() override;

    // Cleans the text now (also called on editingFinished()); the cursor ends up at the end.
    void trimLineBreaks();
};
