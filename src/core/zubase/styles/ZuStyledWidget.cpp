#include "zubase/ZuStyledWidget.h"

#include "zubase/ZuStyleFactory.h"
#include "zubase/styles/ZuStyledWidget_p.h"

ZuStyledWidgetPrivate::ZuStyledWidgetPrivate(QWidget* inWidget) : mWidget(inWidget) {}

void ZuStyledWidgetPrivate::slotApplyColorScheme()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QPalette palette = factory.standardPalette();
    const QColor foregroundFallback =
        mForegroundDefault.isValid() ? mForegroundDefault : palette.color(QPalette::Text);
    const QColor backgroundFallback =
        mBackgroundDefault.isValid() ? mBackgroundDefault : palette.color(QPalette::Base);
    // No name means the fallback, even in a scheme that keeps an entry without an Id (stored
    // under the empty name): a widget nobody named colours for must not pick it up.
    const QColor foreground = mForegroundName.isEmpty()
                                  ? foregroundFallback
                                  : factory.userDefinedColor(mForegroundName, foregroundFallback);
    const QColor background = mBackgroundName.isEmpty()
                                  ? backgroundFallback
                                  : factory.userDefinedColor(mBackgroundName, backgroundFallback);
    palette.setBrush(QPalette::All, QPalette::Base, QBrush(background, Qt::SolidPattern));
    palette.setBrush(QPalette::All, QPalette::WindowText, QBrush(foreground, Qt::SolidPattern));
    palette.setBrush(QPalette::All, QPalette::Text, QBrush(foreground, Qt::SolidPattern));
    if (mWidget)
        mWidget->setPalette(palette);
}

ZuStyledWidget::ZuStyledWidget(QWidget* inWidget) : d(new ZuStyledWidgetPrivate(inWidget))
{
    QObject::connect(&ZuStyleFactory::instance(), &ZuStyleFactory::paletteChanged, d.get(),
                     &ZuStyledWidgetPrivate::slotApplyColorScheme);
    d->slotApplyColorScheme();
}

ZuStyledWidget::~ZuStyledWidget() = default;

void ZuStyledWidget::setForegroundColorName(const char* inName)
{
    d->mForegroundName = QString::fromLatin1(inName);
    d->slotApplyColorScheme();
}

void ZuStyledWidget::setBackgroundColorName(const char* inName)
{
    d->mBackgroundName = QString::fromLatin1(inName);
    d->slotApplyColorScheme();
}

void ZuStyledWidget::setForegroundColorDefault(const QColor& inColor)
{
    d->mForegroundDefault = inColor;
    d->slotApplyColorScheme();
}

void ZuStyledWidget::setBackgroundColorDefault(const QColor& inColor)
{
    d->mBackgroundDefault = inColor;
    d->slotApplyColorScheme();
}
