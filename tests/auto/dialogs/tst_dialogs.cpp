// Top-level dialogs: default parent, placement, the "Showed dialog" trace, the guarded exec(),
// the static functions when accepted, cancelled or left by a parent deleted while they run,
// and the message box. The offscreen screen is 800 x 600, windows have 2-pixel frames there.
#include "zubase/ZuApplication.h"
#include "zubase/ZuColorDialog.h"
#include "zubase/ZuDialog.h"
#include "zubase/ZuFileDialog.h"
#include "zubase/ZuFontDialog.h"
#include "zubase/ZuInputDialog.h"
#include "zubase/ZuMessageBox.h"
#include "zubase/ZuProgressDialog.h"

#include "TestSupport.h"
#include "rklib/RkDbC.h"

#include <QIntValidator>
#include <QLabel>
#include <QLayout>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QSplashScreen>
#include <QTemporaryDir>

#include <clocale>
#include <functional>

using Call = std::function<QVariant(QWidget*)>;
using Act = std::function<void(QWidget*)>;
Q_DECLARE_METATYPE(Call)
Q_DECLARE_METATYPE(Act)

namespace {

// Runs inAction on the next modal widget, once it is up.
void whenModal(const Act& inAction)
{
    auto* timer = new QTimer;
    timer->setInterval(5);
    QObject::connect(timer, &QTimer::timeout, [timer, inAction] {
        if (QWidget* modal = QApplication::activeModalWidget()) {
            timer->deleteLater();
            timer->stop();
            inAction(modal);
        }
    });
    timer->start();
}

void click(QWidget* inModal, QMessageBox::StandardButton inButton)
{
    qobject_cast<QMessageBox*>(inModal)->button(inButton)->click();
}

const QTemporaryDir sDir;
const QString sFile = sDir.filePath(QStringLiteral("study one.dcm"));

// Does what a user would before accepting: picks another value, types, selects, confirms.
void change(QWidget* inModal)
{
    if (auto* color = qobject_cast<QColorDialog*>(inModal))
        color->setCurrentColor(Qt::red);
    if (auto* font = qobject_cast<QFontDialog*>(inModal))
        font->setCurrentFont(QFont("Serif", 17));
    auto* input = qobject_cast<QInputDialog*>(inModal);
    if (input && input->inputMode() == QInputDialog::IntInput)
        input->setIntValue(7);
    else if (input && (input->isComboBoxEditable() || input->findChild<QPlainTextEdit*>()))
        input->setTextValue("typed");
    auto* edit = inModal->findChild<QLineEdit*>();
    if (edit && edit->echoMode() == QLineEdit::Password)
        QTest::keyClicks(edit, QStringLiteral("12a3")); // replaces the selected "5"
    auto* files = qobject_cast<QFileDialog*>(inModal);
    if (files && files->acceptMode() == QFileDialog::AcceptOpen)
        files->selectFile(sFile);
    if (auto* box = qobject_cast<QMessageBox*>(inModal)) {
        QAbstractButton* yes = box->button(QMessageBox::Yes);
        (yes ? yes : box->button(QMessageBox::Ok))->click();
    }
}

struct Provider : ZuApplication::DefaultParentProvider
{
    explicit Provider(QWidget* inWidget) : widget(inWidget) { ++sLiving; }
    ~Provider() override { --sLiving; }
    QWidget* defaultParent() const override { return widget; }
    QPointer<QWidget> widget;
    static int sLiving;
};
int Provider::sLiving = 0;

} // namespace

class TestDialogs : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void init();
    void cleanup() { ZuApplication::instance()->setDefaultParentProvider(nullptr); }
    void setUpAndDefaultParent();
    void placement();
    void exec();
    void staticFunctions_data();
    void staticFunctions();
    void messageBoxes();
    void messageBoxWidth();
    void splashScreen();

private:
    std::unique_ptr<QWidget> mMain;
};

void TestDialogs::init()
{
    mMain.reset(new QWidget);
    mMain->setGeometry(100, 100, 400, 300);
    mMain->show();
    ZuApplication::instance()->setDefaultParentProvider(new Provider(mMain.get()));
}

void TestDialogs::setUpAndDefaultParent()
{
    QApplication::setWindowIcon(QIcon(QStringLiteral(":/Tessel7")));
    ZuDialog dialog(nullptr);
    QCOMPARE(dialog.parentWidget(), mMain.get());
    QVERIFY(!(dialog.windowFlags() & Qt::WindowContextHelpButtonHint));
    QVERIFY(dialog.testAttribute(Qt::WA_WindowPropagation));
    QCOMPARE(dialog.windowIcon().cacheKey(), QApplication::windowIcon().cacheKey());
    QWidget other;
    ZuMessageBox box(&other);
    QVERIFY(box.parentWidget() == &other && box.windowFlags() & Qt::WindowStaysOnTopHint);
    // The provider held already, handed in again, stays alive and in use.
    ZuApplication* app = ZuApplication::instance();
    app->setDefaultParentProvider(
        const_cast<ZuApplication::DefaultParentProvider*>(&app->defaultParentProvider()));
    QCOMPARE(app->defaultParentProvider().defaultParent(), mMain.get());
    app->setDefaultParentProvider(nullptr);
    QCOMPARE(Provider::sLiving, 0);
    QCOMPARE(ZuProgressDialog(QStringLiteral("Busy"), QString(), 0, 5).parentWidget(), nullptr);
}

void TestDialogs::placement()
{
    // Centred on the main window's frame and kept on the screen, unless the caller placed it;
    // "Showed dialog" for a titled dialog that was not placed by the caller. Shown again, it
    // keeps its place.
    const QRect main(100, 100, 400, 300);
    const QList<std::tuple<QRect, QSize, QString, QPoint, QPoint>> cases = {
        {main, QSize(200, 100), "Centred", QPoint(), QPoint(200, 200)},
        {QRect(600, 400, 400, 300), QSize(200, 100), "Corner", QPoint(), QPoint(595, 495)},
        {QRect(-100, 50, 400, 300), QSize(200, 100), "", QPoint(), QPoint(0, 150)},
        {main, QSize(1000, 700), "Large", QPoint(), QPoint(0, 0)},
        {main, QSize(200, 100), "Placed", QPoint(33, 44), QPoint(33, 44)}};
    for (const auto& [mainGeometry, size, title, moveTo, frameTopLeft] : cases) {
        init(); // a fresh main window
        mMain->setGeometry(mainGeometry);
        RkLogCapture capture;
        ZuDialog dialog(nullptr);
        dialog.setWindowTitle(title);
        dialog.resize(size);
        if (!moveTo.isNull())
            dialog.move(moveTo);
        for (int shown = 0; shown < 2; ++shown, dialog.hide(), mMain->move(0, 0)) {
            dialog.show();
            QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
        }
        const bool traced = !title.isEmpty() && moveTo.isNull();
        QCOMPARE(TestSupport::logLines(capture, "ZuBase", RkLogInfo),
                 traced ? QStringList("Showed dialog: " + title) : QStringList());
    }
    // positionWindow() on a dialog not created yet: a 100 x 50 client area is a 104 x 54
    // frame, kept one pixel off the last row and column.
    const QList<std::tuple<int, QPoint, QPoint>> positions = {
        {Qt::AlignCenter, QPoint(400, 300), QPoint(348, 273)},
        {Qt::AlignRight | Qt::AlignBottom, QPoint(400, 300), QPoint(296, 246)},
        {Qt::AlignLeft | Qt::AlignTop, QPoint(696, 590), QPoint(695, 545)}};
    for (const auto& [align, pos, frameTopLeft] : positions) {
        ZuDialog dialog(nullptr);
        dialog.resize(100, 50);
        dialog.positionWindow(pos, Qt::AlignmentFlag(align));
        QVERIFY(!dialog.isVisible());
        QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
    }
}

void TestDialogs::exec()
{
    // A dialog that deletes itself on close survives its exec(), which the caller owns; a
    // dialog deleted with its parent while it runs ends it as rejected.
    const QList<QPair<Act, int>> ends = {
        {[](QWidget* d) { qobject_cast<QDialog*>(d)->close(); }, 0},
        {[](QWidget* d) { qobject_cast<QDialog*>(d)->done(5); }, 5},
        {[](QWidget* d) { delete d->parentWidget(); }, -1}};
    for (const auto& [end, result] : ends) {
        auto* parent = new QWidget;
        QPointer<ZuDialog> dialog = new ZuDialog(parent);
        dialog->setAttribute(Qt::WA_DeleteOnClose);
        whenModal(end);
        QCOMPARE(dialog->exec(), qMax(result, 0));
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        QCOMPARE(dialog.isNull(), result < 0);
        if (result < 0)
            continue;
        QVERIFY(!dialog->isVisible() && !dialog->testAttribute(Qt::WA_DeleteOnClose));
        QVERIFY(!dialog->testAttribute(Qt::WA_ShowModal));
        delete parent;
    }
}

void TestDialogs::staticFunctions_data()
{
    // Each function runs with the default parent, accepted after a change, then cancelled, then
    // with a parent deleted while it runs (which answers as cancelled).
    QTest::addColumn<Call>("call");
    QTest::addColumn<QVariant>("accepted");
    QTest::addColumn<QVariant>("cancelled");
    static bool ok = false;
    const auto withOk = [](const QVariant& inValue) {
        return QVariantList{inValue, ok};
    };
    const QString file = sFile, dir = QFileInfo(sFile).path();
    const auto yesNo = QMessageBox::Yes | QMessageBox::No;
    static QIntValidator digits(0, 999);
    QTest::newRow("color") << Call([](QWidget* p) { return ZuColorDialog::getColor(Qt::blue, p); })
                           << QVariant(QColor(Qt::red)) << QVariant(QColor());
    QTest::newRow("font") << Call([=](QWidget* p) {
        return withOk(ZuFontDialog::getFont(&ok, QFont("Sans", 11), p, "Font").pointSize());
    }) << QVariant(QVariantList{17, true})
                          << QVariant(QVariantList{11, false});
    QTest::newRow("int") << Call([=](QWidget* p) {
        return withOk(ZuInputDialog::getInt(p, "Count", "How many?", 3, 0, 10, 1, &ok));
    }) << QVariant(QVariantList{7, true})
                         << QVariant(QVariantList{3, false});
    // The combo box is editable; out of range the initial text is empty.
    for (int current : {0, 3}) {
        QTest::addRow("item %d", current) << Call([=](QWidget* p) {
            return withOk(ZuInputDialog::getItem(p, "", "", {"a", "b", "c"}, current, true, &ok));
        }) << QVariant(QVariantList{"typed", true})
                                          << QVariant(QVariantList{current ? "" : "a", false});
    }
    QTest::newRow("multi-line") << Call([=](QWidget* p) {
        return withOk(ZuInputDialog::getMultiLineText(p, "Notes", "Notes:", "old", &ok));
    }) << QVariant(QVariantList{"typed", true})
                                << QVariant(QVariantList{QString(), false});
    // The own text dialog: password echo, and a validator that drops the letter typed.
    QTest::newRow("text") << Call([=](QWidget* p) {
        const QString text = ZuInputDialog::getText(p, "Number", "Enter:", QLineEdit::Password, "5",
                                                    &ok, {}, Qt::ImhDigitsOnly, &digits);
        return QVariantList{text, text.isNull(), ok};
    }) << QVariant(QVariantList{"123", false, true})
                          << QVariant(QVariantList{QString(), true, false});
    QTest::newRow("open file") << Call([=](QWidget* p) {
        return ZuFileDialog::getOpenFileName(p, "Open", dir, "Studies (*.dcm)");
    }) << QVariant(file) << QVariant(QString());
    // A file name given as the start is preselected.
    QTest::newRow("save file") << Call([=](QWidget* p) {
        return ZuFileDialog::getSaveFileName(p, "Save", file, {}, nullptr,
                                             QFileDialog::DontConfirmOverwrite);
    }) << QVariant(file) << QVariant(QString());
    QTest::newRow("message box") << Call([=](QWidget* p) {
        return int(ZuMessageBox::question(p, "Title", "Sure?", yesNo));
    }) << QVariant(int(QMessageBox::Yes))
                                 << QVariant(int(QMessageBox::NoButton));
    QTest::newRow("overwrite") << Call([](QWidget* p) {
        return ZuMessageBox::overwrite(p, "/a b");
    }) << QVariant(true) << QVariant(false);
}

void TestDialogs::staticFunctions()
{
    QFETCH(Call, call);
    QFETCH(QVariant, accepted);
    QFETCH(QVariant, cancelled);
    QFile(sFile).open(QIODevice::WriteOnly);
    // File dialogs run with the crash probe on and leave it as it was, and reset the locale.
    for (int round = 0; round < 3; ++round) {
        rkEnableProbeDellBackupAndRecoveryCrash(round == 1);
        std::setlocale(LC_ALL, "C.UTF-8");
        auto* doomed = round == 2 ? new QWidget : nullptr;
        QWidget* parent = nullptr;
        bool isFile = false, probeOn = false;
        whenModal([&](QWidget* inModal) {
            parent = inModal->parentWidget();
            isFile = qobject_cast<QFileDialog*>(inModal);
            probeOn = rkProbeDellBackupAndRecoveryCrashEnabled();
            if (round == 2)
                return delete doomed; // and the dialog with it
            if (round == 0)
                change(inModal);
            if (inModal->isVisible()) // not closed by act already
                round == 0 ? qobject_cast<QDialog*>(inModal)->accept()
                           : qobject_cast<QDialog*>(inModal)->reject();
        });
        QCOMPARE(call(doomed), round == 0 ? accepted : cancelled);
        QCOMPARE(parent, round == 2 ? doomed : mMain.get());
        QCOMPARE(probeOn, isFile || round == 1);
        QCOMPARE(rkEnableProbeDellBackupAndRecoveryCrash(false), round == 1);
        if (isFile)
            QCOMPARE(QByteArray(std::setlocale(LC_ALL, nullptr)), QByteArray("C"));
    }
}

void TestDialogs::messageBoxes()
{
    // Each kind has its icon; without a title the application's name, without a parent the
    // default parent. Overwrite asks with an "Overwrite" button and Cancel as the default.
    using Kind = QMessageBox::StandardButton (*)(const QString&, QMessageBox::StandardButtons,
                                                 QMessageBox::StandardButton);
    const QList<QPair<Kind, QMessageBox::Icon>> kinds = {
        {&ZuMessageBox::critical, QMessageBox::Critical},
        {&ZuMessageBox::information, QMessageBox::Information},
        {&ZuMessageBox::question, QMessageBox::Question},
        {&ZuMessageBox::warning, QMessageBox::Warning},
        {nullptr, QMessageBox::Information}};
    QCoreApplication::setApplicationName(QStringLiteral("zutest"));
    for (const auto& [kind, icon] : kinds) {
        QStringList seen;
        whenModal([&](QWidget* inModal) {
            auto* box = qobject_cast<ZuMessageBox*>(inModal);
            seen << box->windowTitle() << box->text() << QString::number(box->icon())
                 << QString::number(box->parentWidget() == mMain.get())
                 << QString::number(box->standardButton(box->defaultButton()))
                 << (box->button(QMessageBox::Ok) ? box->button(QMessageBox::Ok)->text() : "");
            QTest::keyClick(box, Qt::Key_Escape);
        });
        const auto yesNo = QMessageBox::Yes | QMessageBox::No;
        QCOMPARE(kind ? int(kind("Text", yesNo, QMessageBox::No))
                      : int(ZuMessageBox::overwrite(nullptr, "/a b")),
                 kind ? int(QMessageBox::No) : 0);
        QCOMPARE(
            seen.mid(0, 5),
            QStringList({"zutest", kind ? "Text" : "/a b already exists.", QString::number(icon),
                         "1", QString::number(kind ? QMessageBox::No : QMessageBox::Cancel)}));
        QVERIFY(kind || seen.last() == "Overwrite");
    }
}

void TestDialogs::messageBoxWidth()
{
    // W = 799: the limit is min(400, 320, 1000) = 320 pixels of the box's minimum width. A long
    // text gives up its excess, a short one keeps its width, also when the box is shown again.
    ZuMessageBox box(nullptr);
    box.setIcon(QMessageBox::Warning);
    const QString longText = QStringLiteral("Too long ").repeated(30);
    for (const QString& text : {longText, longText, QStringLiteral("Done."), longText}) {
        if (box.text() != text)
            box.setText(text);
        QLabel* label = box.findLabel();
        QVERIFY(label && label == box.findChild<QLabel*>(QStringLiteral("qt_msgbox_label")));
        box.show();
        box.layout()->activate();
        if (text == longText)
            QCOMPARE(box.layout()->totalMinimumSize().width(), 320);
        else
            QCOMPARE(label->minimumWidth(), label->sizeHint().width());
        box.hide();
    }
}

void TestDialogs::splashScreen()
{
    // A message box closes the splash screen first, also when it is its parent or default
    // parent, and shows the arrow cursor inside a busy phase.
    QPixmap pixmap(30, 20);
    for (int parent : {0, 1, 2}) { // the main window, the splash, the splash by default
        QPointer<QSplashScreen> splash = new QSplashScreen(pixmap);
        ZuApplication::instance()->setSplashScreen(splash);
        ZuApplication::instance()->setDefaultParentProvider(
            new Provider(parent == 2 ? splash.data() : mMain.get()));
        ZuApplication::Busy busy(true);
        bool splashGone = false;
        int cursor = -1;
        whenModal([&](QWidget* inModal) {
            splashGone = splash.isNull();
            cursor = QGuiApplication::overrideCursor()->shape();
            click(inModal, QMessageBox::Ok);
        });
        QCOMPARE(ZuMessageBox::information(parent == 1 ? splash.data() : nullptr, "t", "Loaded."),
                 QMessageBox::Ok);
        QVERIFY(splashGone);
        QCOMPARE(cursor, int(Qt::ArrowCursor));
        QCOMPARE(QGuiApplication::overrideCursor()->shape(), Qt::WaitCursor);
    }
}

int main(int argc, char** argv, char** envp)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    TestDialogs test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_dialogs.moc"
