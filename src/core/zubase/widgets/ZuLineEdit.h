#pragma once

#include "zubase/zubase_export.h"

#include <QLineEdit>

#include <memory>

// A line edit that asks for exactly the room its text needs: its minimum and preferred width
// are the bare width of the wider of its current text and a sample text (no frame or margins),
// its height that of QLineEdit.
class ZUBASE_EXPORT ZuLineEdit : public QLineEdit
{
public:
    explicit ZuLineEdit(QWidget* inParent = nullptr);
    ~ZuLineEdit() override;

    // The text whose width the edit asks for at least, e.g. "0000" for a four-digit field.
    // Takes effect at the next layout pass; no geometry update is triggered here.
    void setTextForMinimumSize(const QString& inText);

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
