#pragma once

#include "zubase/zubase_export.h"

#include <QLabel>

#include <memory>

// A label whose text can be shown upside down or turned by a quarter turn, for captions along
// the side of a panel. The label is rendered once into an image at the screen's pixel ratio and
// the image is turned; the image is made again when text, font, size, palette, alignment,
// margin or pixel ratio change.
class ZUBASE_EXPORT ZuDirectionalLabel : public QLabel
{
public:
    enum Direction
    {
        Normal = 0,      // painted by QLabel itself
        UpsideDown = 1,  // turned by 180 degrees
        TopToBottom = 2, // turned by 90 degrees clockwise
        BottomToTop = 3  // turned by 90 degrees counter-clockwise
    };

    explicit ZuDirectionalLabel(QWidget* inParent = nullptr);
    ~ZuDirectionalLabel() override;

    Direction direction() const;
    // Only stores the direction: follow with update(), and updateGeometry() when switching
    // between horizontal and vertical.
    void setDirection(Direction inDirection);

    // QLabel's hints, with width and height exchanged for the vertical directions.
    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

protected:
    void paintEvent(QPaintEvent* inEvent) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
