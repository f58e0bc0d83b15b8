#pragma once

#include "zubase/zubase_export.h"

#include <QObject>
#include <QString>

#include <memory>

// An event filter that brings up the system's on-screen keyboard program when a text input
// (line edit, text edit, editable combo box, spin box) gets the focus and the setting
// "UI.OnScreenKeyboardMode" is "SHOW". It keeps the program as a child, gives the focus back
// to the application window after the program took it, ignores focus changes for 100 ms after
// the application is reactivated, and ends the program when a window is minimised or
// restored. Widgets with the dynamic property "ZuOnScreenKeyboard.blocked" opt out.
//
//     qApp->installEventFilter(new ZuOnScreenKeyboard);
class ZUBASE_EXPORT ZuOnScreenKeyboard : public QObject
{
    Q_OBJECT

public:
    static const char* const ON_SCREEN_KEYBOARD_MODE_ID;
    static const char* const ON_SCREEN_KEYBOARD_CMD_ID;
    // The Windows program; on Linux an empty setting means "onboard", looked up in PATH.
    static const char* const DEFAULT_KEYBOARD_CMD;

    ZuOnScreenKeyboard();
    // Leaves a running keyboard program running.
    ~ZuOnScreenKeyboard() override;

    // Never consumes an event.
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

    // Starts the keyboard program unless it runs with no window minimised. After a failed
    // start the whole process tries no more until resetCommandCheck().
    void showKeyboard();
    // Ends the keyboard program if it still runs.
    void closeKeyboard();
    // Does nothing.
    void hideKeyboard();

public Q_SLOTS:
    void unblockKeyboard();
    // Gives the focus back to the remembered input and window.
    void activateWindow();

protected:
    // A critical message box titled "On-Screen Keyboard".
    virtual void error(const QString& inMessage);
    // Does nothing; derived classes route the diagnostic lines somewhere.
    virtual void log(const QString& inText);
    // The setting "UI.OnScreenKeyboardCommand": the program file, used whole (not split into
    // arguments); a name without "/" is looked up in PATH.
    virtual QString commandLine();

public:
    // Whether the setting "UI.OnScreenKeyboardMode" is "SHOW", in any letter case.
    virtual bool isKeyboardEnabled();

protected:
    void resetCommandCheck();

private:
    class Private;
    std::unique_ptr<Private> const d;
};
