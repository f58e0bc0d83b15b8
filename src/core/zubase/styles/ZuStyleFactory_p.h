#pragma once

// Internal: the factory's private record and its theme-change observer.

#include "zubase/ZuApplication.h"
#include "zubase/ZuStyleFactory.h"

#include <QColor>
#include <QMap>
#include <QPalette>
#include <QPointer>
#include <QString>
#include <QStyle>

class QEvent;
class QObject;

// One colour scheme as read from its file.
struct ZuColorScheme
{
    QString styleClass;
    QPalette palette;
    bool translateName = false; // kept for the host
    int priority = 0;           // kept for the host; the table is ordered by name only
    QMap<QString, QColor> userDefinedColors;
};

// Puts the scheme palette back when the desktop theme changes, whatever the receiver of the
// ThemeChange event. It sees every event of the process, so it only compares the type.
class ThemeChangeObserver : public ZuApplication::HookNotify
{
public:
    ThemeChangeObserver() = default;
    ~ThemeChangeObserver() override;
    void beforeNotify(QObject* inReceiver, QEvent* inEvent) override;
    void afterNotify(QObject* inReceiver, QEvent* inEvent) override;
};

class ZuStyleFactoryPrivate
{
public:
    static ZuStyleFactoryPrivate* get(ZuStyleFactory& inFactory) { return inFactory.d.get(); }
    // A factory beside the process-wide one, so that white-box tests can watch what its set-up
    // and tear-down do to the application (the observer hook). Main thread, after the app.
    static ZuStyleFactory* createDetached() { return new ZuStyleFactory; }
    static void destroyDetached(ZuStyleFactory* inFactory) { delete inFactory; }

    // The style that setStyleForWidget() / setNativeStyleForWidget() give widget trees of
    // this class, made once and kept by the factory: widgets do not own their style.
    QStyle* widgetStyle(ZuStyleFactory& ioFactory, const QString& inClassName);

    QMap<QString, ZuColorScheme> schemes;
    QString currentName;
    QPalette nativePalette;
    QString nativeStyleClass;
    ThemeChangeObserver themeChangeObserver;
    QMap<QString, QPointer<QStyle>> widgetStyles; // by lower-case class name
};
