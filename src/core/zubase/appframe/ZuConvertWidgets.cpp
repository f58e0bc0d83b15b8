// The one widget helper declared in ZuConvert.h. It lives with the Qt Widgets families so that
// the text family needs nothing but Qt Core.
#include "zubase/ZuConvert.h"

#include <QLayout>
#include <QScrollArea>
#include <QWidget>

namespace Zu {

void resizeWidgetToViewport(QWidget* inWidget, QScrollArea* inArea)
{
    if (!inWidget || !inArea)
        return;
    if (QLayout* layout = inWidget->layout())
        layout->activate();
    inWidget->updateGeometry();
    if (QWidget* content = inArea->widget())
        inWidget->resize(inWidget->size() + content->sizeHint() - inArea->maximumViewportSize());
}

} // namespace Zu
