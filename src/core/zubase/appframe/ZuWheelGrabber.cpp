#include "zubase/ZuWheelGrabber.h"

#include <QObject>
#include <QPointer>

namespace {

// Guarded, so that a destroyed grabber ends its grab by itself.
QPointer<QObject> sGrabObject;

} // namespace

void ZuWheelGrabber::grabWheel(QObject* inObject)
{
    sGrabObject = inObject;
}

void ZuWheelGrabber::releaseWheel(QObject* /*inObject*/)
{
    sGrabObject.clear();
}

QObject* ZuWheelGrabber::grabObject()
{
    return sGrabObject.data();
}
