#pragma once

#include "zubase/zubase_export.h"

class QObject;

// Lets one object take every mouse-wheel event of the application, wherever the pointer is,
// for as long as it holds the grab. ZuApplication::notify() consults grabObject() for each
// wheel event. GUI thread only.
class ZUBASE_EXPORT ZuWheelGrabber
{
public:
    // inObject takes the grab from whoever holds it; null clears the grab.
    static void grabWheel(QObject* inObject);
    // Clears the grab, whichever object holds it (the argument is not compared).
    static void releaseWheel(QObject* inObject);
    // The grabbing object; null when nobody grabs or the grabber has been destroyed.
    static QObject* grabObject();

    // The class has no per-object state; copying copies nothing.
    ZuWheelGrabber& operator=(const ZuWheelGrabber&) { return *this; }
};
