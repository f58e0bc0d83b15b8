#pragma once

#include "zubase/zubase_export.h"

#include <QColor>

#include <memory>

class QWidget;
class ZuStyledWidgetPrivate;

// Binds a widget's text and background colours to two user-defined colours of the colour
// scheme, with fallbacks, and recolours the widget on every scheme switch. Usually a member of
// the widget it styles; the widget may also die first. Not copyable: one handle, one binding.
class ZUBASE_EXPORT ZuStyledWidget
{
public:
    explicit ZuStyledWidget(QWidget* inWidget);
    ~ZuStyledWidget();
    ZuStyledWidget(const ZuStyledWidget&) = delete;
    ZuStyledWidget& operator=(const ZuStyledWidget&) = delete;

    // Names of the scheme's user-defined colours for Text/WindowText and for Base (Latin-1).
    void setForegroundColorName(const char* inName);
    void setBackgroundColorName(const char* inName);
    // Used when the scheme lacks the named colour; invalid means the scheme's Text or Base.
    void setForegroundColorDefault(const QColor& inColor);
    void setBackgroundColorDefault(const QColor& inColor);

private:
    std::unique_ptr<ZuStyledWidgetPrivate> const d;
};
