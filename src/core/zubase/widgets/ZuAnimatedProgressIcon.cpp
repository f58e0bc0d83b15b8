#include "zubase/ZuAnimatedProgressIcon.h"

#include <QPixmap>

#include <vector>

ZuAnimatedProgressIcon* ZuAnimatedProgressIcon::mInstance = nullptr;
QIcon ZuAnimatedProgressIcon::sProgressIndicators[12];

ZuAnimatedProgressIcon::ZuAnimatedProgressIcon()
{
    mTimer.setInterval(100);
    mTimer.setSingleShot(false);
    QObject::connect(&mTimer, &QTimer::timeout, [this] { progressAnimation(); });
}

// The instance lives until the process ends: nobody outside can reach it to delete it.
ZuAnimatedProgressIcon::~ZuAnimatedProgressIcon() = default;

ZuAnimatedProgressIcon* ZuAnimatedProgressIcon::instance()
{
    if (!mInstance)
        mInstance = new ZuAnimatedProgressIcon;
    return mInstance;
}

void ZuAnimatedProgressIcon::setIconTo(void* key, std::function<void(const QIcon&)> setter)
{
    instance()->add(key, std::move(setter));
}

void ZuAnimatedProgressIcon::removeIconFrom(void* key)
{
    instance()->remove(key);
}

void ZuAnimatedProgressIcon::add(void* inKey, std::function<void(const QIcon&)> inSetter)
{
    if (mSetters.empty())
        mTimer.start();
    mSetters[inKey] = std::move(inSetter);
    ++mChanges;
}

void ZuAnimatedProgressIcon::remove(void* inKey)
{
    const auto entry = mSetters.find(inKey);
    if (entry == mSetters.end())
        return;
    // Erased before the call: a setter that removes its own key again finds nothing to do.
    const std::function<void(const QIcon&)> setter = std::move(entry->second);
    mSetters.erase(entry);
    ++mChanges;
    if (mSetters.empty()) {
        mTimer.stop();
        mFrameCounter = 0;
    }
    if (setter)
        setter(QIcon());
}

void ZuAnimatedProgressIcon::progressAnimation()
{
    ++mFrameCounter;
    const QIcon& icon = progressIndicator(mFrameCounter);
    // The keys of this frame; keys added by a setter get their first frame next time, keys
    // removed by a setter get none.
    std::vector<void*> keys;
    keys.reserve(mSetters.size());
    for (const auto& entry : mSetters)
        keys.push_back(entry.first);
    // A counter, not a flag: a setter that runs a nested event loop may see a nested frame.
    const unsigned changes = mChanges;
    auto entry = mSetters.begin();
    for (void* key : keys) {
        if (mChanges != changes) {
            entry = mSetters.find(key);
            if (entry == mSetters.end())
                continue;
        }
        // A copy: the setter may replace or remove itself while it runs.
        const std::function<void(const QIcon&)> setter = entry->second;
        ++entry;
        if (setter)
            setter(icon);
    }
}

const QIcon& ZuAnimatedProgressIcon::progressIndicator(int inIndex)
{
    const int frame = (inIndex % 12 + 12) % 12; // the counter is never negative, but int wraps
    QIcon& icon = sProgressIndicators[frame];
    if (icon.isNull()) {
        const QString name = QString::asprintf(":images/DicomJobProcessing%.2i", frame);
        icon = QIcon(QPixmap(name));
    }
    return icon;
}
