#pragma once

#include "zubase/zubase_export.h"

#include <QObject>
#include <QPixmap>

#include <memory>

// A spinner of eight grey dots with a dark head circling clockwise: while started, hands out
// the next 24 x 24 frame every 100 ms through nextPixmap(), drawn at the screen's pixel ratio.
// Screen readers see it as a busy animation while it runs.
class ZUBASE_EXPORT ZuProgressIcon : public QObject
{
    Q_OBJECT
public:
    ZuProgressIcon();
    ~ZuProgressIcon() override;

    void start();
    // Keeps the frame index: start() goes on from there.
    void stop();

Q_SIGNALS:
    void nextPixmap(const QPixmap& pixmap);

protected Q_SLOTS:
    void slotAnimatedIconFrameChanged();

private:
    class Private;
    std::unique_ptr<Private> const d;
};
