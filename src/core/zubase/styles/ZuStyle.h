#pragma once

#include "zubase/zubase_export.h"

#include <QMenu>
#include <QProxyStyle>

// The product's widget style: Cleanlooks (Fusion where the Cleanlooks plugin is missing) with
// Windows dialog-button order, larger tool-bar icons, scalable icons in large-icon menus, its
// own check marks, push-button panels cached per palette, and flat grey disabled icons on dark
// colour schemes. All colours come from the option's palette, i.e. from the scheme in force.
class ZUBASE_EXPORT ZuStyle : public QProxyStyle
{
public:
    // A menu whose item icons are drawn large: 32 pixels times the icon scaling function.
    class ZUBASE_EXPORT QLargeIconMenu : public QMenu
    {
    public:
        explicit QLargeIconMenu(QWidget* inParent = nullptr);
        explicit QLargeIconMenu(const QString& inTitle, QWidget* inParent = nullptr);
        ~QLargeIconMenu() override;
    };

    using IconScalingFunction = float (*)(const QWidget*);

    ZuStyle();
    ~ZuStyle() override;

    // Replaces, for every ZuStyle, the factor applied to the 32-pixel icons of large-icon
    // menus; the widget passed in is the menu. A null function restores the factor 1.0.
    static void setIconScalingFunction(IconScalingFunction inFunction);

    // Empties Qt's pixmap cache, so that nothing rendered with the previous palette survives a
    // scheme switch; the application calls it when the style is set.
    void polish(QApplication* inApplication) override;
    using QProxyStyle::polish;

    void drawPrimitive(PrimitiveElement inElement, const QStyleOption* inOption,
                       QPainter* inPainter, const QWidget* inWidget = nullptr) const override;
    void drawControl(ControlElement inElement, const QStyleOption* inOption, QPainter* inPainter,
                     const QWidget* inWidget = nullptr) const override;
    void drawComplexControl(ComplexControl inControl, const QStyleOptionComplex* inOption,
                            QPainter* inPainter, const QWidget* inWidget = nullptr) const override;
    SubControl hitTestComplexControl(ComplexControl inControl, const QStyleOptionComplex* inOption,
                                     const QPoint& inPos,
                                     const QWidget* inWidget = nullptr) const override;
    int pixelMetric(PixelMetric inMetric, const QStyleOption* inOption = nullptr,
                    const QWidget* inWidget = nullptr) const override;
    QSize sizeFromContents(ContentsType inType, const QStyleOption* inOption,
                           const QSize& inContentsSize,
                           const QWidget* inWidget = nullptr) const override;
    // The text room of a tab with buttons follows this style's tab spacing, not Cleanlooks'.
    QRect subElementRect(SubElement inElement, const QStyleOption* inOption,
                         const QWidget* inWidget = nullptr) const override;
    int styleHint(StyleHint inHint, const QStyleOption* inOption = nullptr,
                  const QWidget* inWidget = nullptr,
                  QStyleHintReturn* outReturnData = nullptr) const override;
    QPixmap generatedIconPixmap(QIcon::Mode inIconMode, const QPixmap& inPixmap,
                                const QStyleOption* inOption) const override;

    // The key under which a rendering of inOption at inPixmapSize is kept in QPixmapCache:
    // "<base>-<state>-<direction>-<palette cache key>-<w>x<h>", for spin boxes followed by
    // "-<button symbols>-<enabled steps>-<frame 1/0>".
    static QString pixmapCacheKey(const QString& inBaseKey, const QStyleOption* inOption,
                                  const QSize& inPixmapSize);

private:
    // The style under Cleanlooks' own code (its proxy base), or the base itself for Fusion.
    QStyle* innerStyle() const;
    void drawButtonPanel(QPainter* inPainter, const QRect& inRect, const QStyleOption* inOption,
                         bool inDefault) const;
    void drawCheckBoxOrRadio(ControlElement inElement, const QStyleOption* inOption,
                             QPainter* inPainter, const QWidget* inWidget) const;
    void drawMenuItem(const QStyleOption* inOption, QPainter* inPainter,
                      const QWidget* inWidget) const;
    void drawTabShape(const QStyleOption* inOption, QPainter* inPainter,
                      const QWidget* inWidget) const;
    void drawProgressContents(const QStyleOption* inOption, QPainter* inPainter,
                              const QWidget* inWidget) const;
};
