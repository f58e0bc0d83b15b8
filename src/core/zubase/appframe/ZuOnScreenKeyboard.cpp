#include "zubase/ZuOnScreenKeyboard.h"

#include "zubase/PnResource.h"
#include "zubase/ZuMessageBox.h"
#include "zubase/ZuPopupMenuComboBox.h"
#include "zubase/platform/SysInput.h"
#include "zubase/platform/SysProcess.h"

#include <QAbstractSpinBox>
#include <QComboBox>
#include <QDir>
#include <QGuiApplication>
#include <QLineEdit>
#include <QPointer>
#include <QSettings>
#include <QStandardPaths>
#include <QTextEdit>
#include <QTimer>
#include <QWindow>
#include <QWindowStateChangeEvent>
#include <QX11Info>

const char* const ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_MODE_ID = "UI.OnScreenKeyboardMode";
const char* const ZuOnScreenKeyboard::ON_SCREEN_KEYBOARD_CMD_ID = "UI.OnScreenKeyboardCommand";
const char* const ZuOnScreenKeyboard::DEFAULT_KEYBOARD_CMD = "C:\\Windows\\System32\\osk.exe";

namespace {

// Debian's on-screen keyboard; it does not take the focus.
const char* const kLinuxKeyboardCommand = "onboard";
const char* const kOptOutProperty = "ZuOnScreenKeyboard.blocked";
constexpr int kActivationBlockMs = 100;

// Set after a failed start, for the whole process: one message box, then silence.
bool sCommandFailed = false;

bool isTextInput(QObject* inObject)
{
    if (qobject_cast<QTextEdit*>(inObject) || qobject_cast<QLineEdit*>(inObject) ||
        qobject_cast<QAbstractSpinBox*>(inObject))
        return true;
    const auto* combo = qobject_cast<QComboBox*>(inObject);
    return combo && combo->isEditable();
}

// The program of the command text: a bare name is found in PATH, as the shell would.
QString programPath(const QString& inCommand)
{
    if (inCommand.contains(QLatin1Char('/')))
        return inCommand;
    const QString found = QStandardPaths::findExecutable(inCommand);
    return found.isEmpty() ? inCommand : found;
}

} // namespace

class ZuOnScreenKeyboard::Private
{
public:
    bool blocked = false;
    // Guarded: the window or the input may be gone by the time the focus goes back.
    QPointer<QWindow> focusWindow;
    QPointer<ZuPopupMenuComboBox> comboBox;
    ZuPlatform::Handle process = ZuPlatform::kNullHandle;
    unsigned processId = 0;

    bool processRunning() const
    {
        if (process == ZuPlatform::kNullHandle)
            return false;
        int code = 0;
        bool ended = false;
        return ZuPlatform::exitCodeProcess(process, code) == 0 &&
               code == ZuPlatform::kStillActive && ZuPlatform::processEnded(process, ended) == 0 &&
               !ended;
    }

    void releaseProcess()
    {
        if (process != ZuPlatform::kNullHandle)
            ZuPlatform::closeHandle(process);
        process = ZuPlatform::kNullHandle;
        processId = 0;
    }
};

ZuOnScreenKeyboard::ZuOnScreenKeyboard() : d(new Private) {}

ZuOnScreenKeyboard::~ZuOnScreenKeyboard()
{
    // Only our record of the program goes; the program itself keeps running.
    d->releaseProcess();
}

bool ZuOnScreenKeyboard::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if (d->blocked)
        return false;
    const QEvent::Type type = inEvent->type();
    if ((type == QEvent::FocusIn || type == QEvent::FocusOut) &&
        inWatched->property(kOptOutProperty).isValid())
        return false;

    switch (type) {
    case QEvent::ApplicationDeactivate:
        // The keyboard program has just taken the foreground: take it back once control
        // returns to the event loop.
        if (d->focusWindow)
            QTimer::singleShot(0, this, &ZuOnScreenKeyboard::activateWindow);
        break;
    case QEvent::ApplicationActivate:
        // The focus events that follow an activation must not start the keyboard again.
        d->blocked = true;
        QTimer::singleShot(kActivationBlockMs, this, &ZuOnScreenKeyboard::unblockKeyboard);
        break;
    case QEvent::WindowStateChange:
        if (auto* window = qobject_cast<QWindow*>(inWatched)) {
            const auto* change = static_cast<QWindowStateChangeEvent*>(inEvent);
            const bool wasMinimised = change->oldState() & Qt::WindowMinimized;
            const bool isMinimised = window->windowStates() & Qt::WindowMinimized;
            if (wasMinimised != isMinimised)
                closeKeyboard();
        }
        break;
    case QEvent::FocusIn:
        if (isTextInput(inWatched) && isKeyboardEnabled()) {
            d->focusWindow = QGuiApplication::focusWindow();
            d->comboBox = qobject_cast<ZuPopupMenuComboBox*>(inWatched);
            showKeyboard();
        }
        break;
    default:
        break;
    }
    return false;
}

bool ZuOnScreenKeyboard::isKeyboardEnabled()
{
    return PnResource::applicationSettings()
               .value(QLatin1String(ON_SCREEN_KEYBOARD_MODE_ID))
               .toString()
               .compare(QLatin1String("SHOW"), Qt::CaseInsensitive) == 0;
}

QString ZuOnScreenKeyboard::commandLine()
{
    const QString command = PnResource::applicationSettings()
                                .value(QLatin1String(ON_SCREEN_KEYBOARD_CMD_ID))
                                .toString();
    return command.isEmpty() ? QString::fromLatin1(kLinuxKeyboardCommand) : command;
}

void ZuOnScreenKeyboard::error(const QString& inMessage)
{
    ZuMessageBox::critical(nullptr, tr("On-Screen Keyboard"), inMessage, QMessageBox::Ok,
                           QMessageBox::NoButton);
}

void ZuOnScreenKeyboard::log(const QString&) {}

void ZuOnScreenKeyboard::showKeyboard()
{
    if (d->processRunning()) {
        // Without an X server to ask (Wayland, no display) the keyboard counts as up.
        bool minimised = false;
        if (QGuiApplication::platformName() != QLatin1String("wayland"))
            ZuPlatform::inputProcessWindowMinimised(
                QX11Info::isPlatformX11() ? QX11Info::display() : nullptr, d->processId, minimised);
        if (!minimised)
            return;
        closeKeyboard();
    }
    if (sCommandFailed)
        return;

    const QString command = commandLine();
    d->blocked = true;
    d->releaseProcess(); // of a program that has ended
    ZuPlatform::ProcessCreation creation;
    const std::string quoted = '"' + QFile::encodeName(programPath(command)).toStdString() + '"';
    int error = ZuPlatform::createProcessSuspended(
        quoted, nullptr, QFile::encodeName(QDir::currentPath()).toStdString(), creation);
    if (error == 0) {
        int previous = 0;
        error = ZuPlatform::resumeThread(creation.thread, previous);
        ZuPlatform::closeHandle(creation.thread);
        if (error != 0) {
            ZuPlatform::terminateProcess(creation.process, 1);
            ZuPlatform::closeHandle(creation.process);
        }
    }
    if (error == 0) {
        d->process = creation.process;
        d->processId = creation.processId;
        log(QStringLiteral("ZuOnScreenKeyboard - keyboard started %1\n")
                .arg(static_cast<qulonglong>(d->process), 0, 16));
    } else {
        // Set before the box: focus changes while it is open must not open another.
        sCommandFailed = true;
        this->error(tr("Failed to open on-screen keyboard '%1'").arg(command));
    }
    d->blocked = false;
}

void ZuOnScreenKeyboard::closeKeyboard()
{
    if (isKeyboardEnabled())
        log(QStringLiteral("ZuOnScreenKeyboard - closing keyboard app.\n"));
    if (d->process == ZuPlatform::kNullHandle)
        return;
    if (d->processRunning()) {
        log(QStringLiteral("ZuOnScreenKeyboard - terminating process\n"));
        // By the handle: the child stays ours until the handle goes, so its id cannot have
        // passed to another process.
        const int error = ZuPlatform::terminateProcess(d->process, 1);
        if (error != 0)
            log(QStringLiteral("ZuOnScreenKeyboard - error %1\n").arg(error));
        else
            log(QStringLiteral("ZuOnScreenKeyboard - success\n"));
    }
    d->releaseProcess();
}

void ZuOnScreenKeyboard::hideKeyboard() {}

void ZuOnScreenKeyboard::unblockKeyboard()
{
    d->blocked = false;
}

void ZuOnScreenKeyboard::activateWindow()
{
    d->blocked = true;
    if (d->comboBox) {
        d->comboBox->activateEditing();
        d->comboBox.clear();
    }
    if (d->focusWindow) {
        d->focusWindow->requestActivate();
        d->focusWindow.clear();
    }
    d->blocked = false;
}

void ZuOnScreenKeyboard::resetCommandCheck()
{
    sCommandFailed = false;
}
