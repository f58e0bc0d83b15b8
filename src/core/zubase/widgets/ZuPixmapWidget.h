#pragma once

#include "zubase/zubase_export.h"

#include <QColor>
#include <QPixmap>
#include <QWidget>

#include <optional>

// Shows a pixmap scaled to fit with its aspect ratio kept, centred on a background colour,
// inside a one-pixel frame, with an optional overlay text on a translucent dark box. Colours
// that are not set come from the palette (Window, WindowText). A null or empty pixmap leaves
// the background and the frame.
class ZUBASE_EXPORT ZuPixmapWidget : public QWidget
{
    Q_OBJECT
public:
    explicit ZuPixmapWidget(QWidget* inParent = nullptr);
    ~ZuPixmapWidget() override;

    void setPixmap(QPixmap inPixmap);
    // An empty text removes the overlay. Screen readers get the text as the description.
    void setOverlayText(const QString& inText, Qt::Alignment inAlignment);
    void setBackgroundColor(const QColor& inColor);
    void setOverlayTextColor(const QColor& inColor);
    void setFrameColor(const QColor& inColor);

    // The pixmap's size.
    QSize sizeHint() const override;

protected:
    void paintEvent(QPaintEvent* inEvent) override;

private:
    // The largest rectangle of inSize's aspect ratio inside inRect, centred.
    QRect fitIntoRect(const QRect& inRect, const QSize& inSize) const;

    QPixmap mPixmap;
    QString mOverlayText;
    Qt::Alignment mOverlayAlignment = Qt::AlignCenter;
    std::optional<QColor> mBackgroundColor;
    std::optional<QColor> mOverlayTextColor;
    std::optional<QColor> mFrameColor;
};
