#pragma once

// Internal: the part of ZuStyledWidget that listens to the style factory.
#include <QColor>
#include <QObject>
#include <QPointer>
#include <QString>
#include <QWidget>

class ZuStyledWidgetPrivate : public QObject
{
    Q_OBJECT
public:
    explicit ZuStyledWidgetPrivate(QWidget* inWidget);

    QString mForegroundName;
    QString mBackgroundName;
    QColor mForegroundDefault;
    QColor mBackgroundDefault;
    QPointer<QWidget> mWidget; // the widget may be deleted before the handle

public Q_SLOTS:
    // Sets the widget's palette from the current scheme; a no-op once the widget is gone.
    void slotApplyColorScheme();
};
