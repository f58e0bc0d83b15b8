#pragma once

#include "zubase/zubase_export.h"

#include <QIcon>
#include <QTimer>

#include <functional>
#include <map>

// The process-wide animator of "work in progress" icons. Places (list items, buttons, tabs)
// register a key and a function that sets an icon; every 100 ms each registered function gets
// the next of twelve frames, the host's resources ":images/DicomJobProcessing00" to "...11"
// (null icons when the host has none). The timer runs only while something is registered.
// GUI thread only.
class ZUBASE_EXPORT ZuAnimatedProgressIcon
{
public:
    // Registers or replaces the setter for the key; it is first called at the next frame.
    static void setIconTo(void* key, std::function<void(const QIcon&)> setter);
    // Unregisters the key and calls its setter once with an empty icon; unknown keys are
    // ignored. Setters may register and unregister keys, also their own, while called.
    static void removeIconFrom(void* key);
    ~ZuAnimatedProgressIcon();

private:
    ZuAnimatedProgressIcon();
    ZuAnimatedProgressIcon(const ZuAnimatedProgressIcon&) = delete;
    ZuAnimatedProgressIcon& operator=(const ZuAnimatedProgressIcon&) = delete;

    static ZuAnimatedProgressIcon* instance();
    void add(void* inKey, std::function<void(const QIcon&)> inSetter);
    void remove(void* inKey);
    void progressAnimation();
    static const QIcon& progressIndicator(int inIndex);

    std::map<void*, std::function<void(const QIcon&)>> mSetters;
    int mFrameCounter = 0;
    QTimer mTimer;
    unsigned mChanges = 0; // counts registrations and removals, to notice them during a frame

    static ZuAnimatedProgressIcon* mInstance;
    static QIcon sProgressIndicators[12];
};
