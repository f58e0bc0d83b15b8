#pragma once

#include "zubase/zubase_export.h"

#include <QWidget>

#include <memory>

class QCheckBox;
class QLabel;

// A check box whose text is a separate label, so that the text can wrap and take rich text;
// pressing the label presses the box and releasing it clicks the box. Screen readers read the
// label's text as the box's name.
class ZUBASE_EXPORT ZuCheckBox : public QWidget
{
    Q_OBJECT
public:
    ZuCheckBox(const QString& inText, QWidget* inParent);
    explicit ZuCheckBox(QWidget* inParent = nullptr);
    ~ZuCheckBox() override;

    // The inner box: the object to connect to, to query, and to hand to a ZuCheckBoxGroup.
    QCheckBox* checkBox();
    const QCheckBox* checkBox() const;
    // The text label beside the box.
    QLabel* label();
    const QLabel* label() const;

    // The box and the label side by side: widths added, the larger height.
    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
