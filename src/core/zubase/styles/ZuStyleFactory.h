#pragma once

#include "zubase/zubase_export.h"

#include <QColor>
#include <QObject>
#include <QPalette>
#include <QString>
#include <QStringList>

#include <memory>

class QStyle;
class QWidget;
class ZuStyleFactoryPrivate;

// The process-wide registry of colour schemes read from "ColorScheme" XML files. It switches the
// application to a scheme (palette first, then style, then paletteChanged()), applies a scheme
// to one widget tree, creates styles by class name, and answers widgets' colour questions.
// Create it (instance()) only after the application object. It persists nothing.
class ZUBASE_EXPORT ZuStyleFactory : public QObject
{
    Q_OBJECT
public:
    static ZuStyleFactory& instance();

    // Reads one scheme file; true when it was stored (replacing a scheme of the same name).
    // A rejected file writes one warning to the log and leaves the table unchanged.
    bool addStyle(const QString& inFileName);
    // Reads every "*.xml" file (any letter case) of the folder; returns how many were stored.
    int addStylesFromPath(const QString& inPath);

    unsigned int count() const;
    // Scheme names in ascending order.
    QStringList styleNames();
    // Empty until setCurrentStyle() has succeeded once.
    const QString& currentStyle() const;
    // Switches the application to the scheme; an unknown name, or a style class that cannot be
    // created, is ignored. Emits paletteChanged() once per actual switch.
    void setCurrentStyle(const QString& inName);

    // A new style the caller owns: "ZuStyle" and "Native" (any case) name this library's style
    // and the platform's own; anything else goes to QStyleFactory (null when unknown).
    QStyle* createStyleFromClass(const QString& inClassName);
    // Null for an unknown scheme, else a new style of the scheme's class.
    QStyle* createStyleFromName(const QString& inSchemeName);
    // Gives the widget and all its descendants the scheme's style and palette; false, changing
    // nothing, for an unknown scheme or a style that cannot be created. All trees styled with
    // one style class share one style object, which the factory keeps.
    bool setStyleForWidget(const QString& inSchemeName, QWidget* inWidget);
    // The same with the platform's own style and the palette the application started with.
    bool setNativeStyleForWidget(QWidget* inWidget);

    // The current scheme's palette; the application's palette while there is none.
    QPalette standardPalette();
    // The current scheme's user-defined colour of that exact name, else inFallback.
    QColor userDefinedColor(const QString& inId, const QColor& inFallback);

    // The current scheme uses the platform's own style class.
    bool currentStyleIsOSNative() const;
    // The current scheme's Active Midlight colour is light (weighted grey above 200).
    bool currentStyleIsTesselNative() const;
    bool showToolCardChooserButton() const;
    bool showSplitterButton() const;

Q_SIGNALS:
    // The application palette and style have been switched to another scheme.
    void paletteChanged();

private:
    ZuStyleFactory();
    ~ZuStyleFactory() override;
    ZuStyleFactory(const ZuStyleFactory&) = delete;
    ZuStyleFactory& operator=(const ZuStyleFactory&) = delete;

    friend class ZuStyleFactoryPrivate;
    std::unique_ptr<ZuStyleFactoryPrivate> const d;
};
