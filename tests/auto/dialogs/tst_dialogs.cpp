// Top-level dialogs: default parent, placement, the "Showed dialog" trace, the guarded exec()
// and the static functions on accept and cancel (driven from a timer while they run). The
// message-box width rule is checked on a real screen size in tst_appframe_xvfb.
#include "zubase/ZuApplication.h"
#include "zubase/ZuColorDialog.h"
#include "zubase/ZuDialog.h"
#include "zubase/ZuFileDialog.h"
#include "zubase/ZuFontDialog.h"
#include "zubase/ZuInputDialog.h"
#include "zubase/ZuMessageBox.h"
#include "zubase/ZuProgressDialog.h"

#include "rklib/RkDbC.h"
#include "rklib/RkLogFile.h"

#include <QIntValidator>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPointer>
#include <QPushButton>
#include <QSplashScreen>
#include <QTemporaryDir>
#include <QtTest>

#include <clocale>
#include <functional>

using Call = std::function<QVariant()>;
using Act = std::function<void(QWidget*)>;
using Full = QMessageBox::StandardButton (*)(QWidget*, const QString&, const QString&,
                                             QMessageBox::StandardButtons,
                                             QMessageBox::StandardButton);
using Short = QMessageBox::StandardButton (*)(const QString&, QMessageBox::StandardButtons,
                                              QMessageBox::StandardButton);
Q_DECLARE_METATYPE(Call)
Q_DECLARE_METATYPE(Act)
Q_DECLARE_METATYPE(Full)
Q_DECLARE_METATYPE(Short)

namespace {

// Runs inAction on the next modal widget, once it is up.
void whenModal(std::function<void(QWidget*)> inAction)
{
    auto* timer = new QTimer;
    timer->setInterval(5);
    QObject::connect(timer, &QTimer::timeout, [timer, inAction] {
        if (QWidget* modal = QApplication::activeModalWidget()) {
            timer->stop();
            timer->deleteLater();
            inAction(modal);
        }
    });
    timer->start();
}

void finish(QWidget* inModal, bool inAccept)
{
    if (auto* dialog = qobject_cast<QDialog*>(inModal))
        inAccept ? dialog->accept() : dialog->reject();
}

QStringList shownLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        const QString text = QString::fromStdString(entry.text);
        if (text.startsWith(QLatin1String("Showed dialog")))
            lines << QStringLiteral("%1 %2 %3")
                         .arg(entry.level)
                         .arg(QString::fromStdString(entry.category), text);
    }
    return lines;
}

class Provider : public ZuApplication::DefaultParentProvider
{
public:
    explicit Provider(QWidget* inWidget) : mWidget(inWidget) { ++sLiving; }
    ~Provider() override { --sLiving; }
    QWidget* defaultParent() const override { return mWidget; }
    QPointer<QWidget> mWidget;
    static int sLiving;
};
int Provider::sLiving = 0;

// A dialog of class T found as the modal widget; inAction runs on it.
template <class T> Act on(std::function<void(T*)> inAction)
{
    return [inAction](QWidget* inModal) {
        if (T* dialog = qobject_cast<T*>(inModal))
            inAction(dialog);
    };
}

} // namespace

class TestDialogs : public QObject
{
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void defaultParent();
    void centring_data();
    void centring();
    void positionWindowAlignments_data();
    void positionWindowAlignments();
    void execKeepsDialog_data();
    void execKeepsDialog();
    void staticFunctions_data();
    void staticFunctions();
    void messageBoxes_data();
    void messageBoxes();
    void overwrite_data();
    void overwrite();
    void messageBoxSplashAndCursor();
    void parentDeletedDuringExec_data();
    void parentDeletedDuringExec();
    void boxOnSplash_data();
    void boxOnSplash();

private:
    std::unique_ptr<QWidget> mMain;
    QTemporaryDir mDir;
};

void TestDialogs::init()
{
    mMain.reset(new QWidget);
    mMain->setGeometry(100, 100, 400, 300);
    mMain->show();
    ZuApplication::instance()->setDefaultParentProvider(new Provider(mMain.get()));
}

void TestDialogs::cleanup()
{
    ZuApplication::instance()->setDefaultParentProvider(nullptr);
    mMain.reset();
}

void TestDialogs::defaultParent()
{
    ZuDialog dialog(nullptr);
    QCOMPARE(dialog.parentWidget(), mMain.get());
    QVERIFY(!(dialog.windowFlags() & Qt::WindowContextHelpButtonHint));
    QVERIFY(dialog.testAttribute(Qt::WA_WindowPropagation));

    QWidget other;
    ZuMessageBox box(&other);
    QCOMPARE(box.parentWidget(), &other);
    QVERIFY(box.windowFlags() & Qt::WindowStaysOnTopHint);

    // The provider held already, handed in again, stays alive and in use.
    ZuApplication* app = ZuApplication::instance();
    QCOMPARE(Provider::sLiving, 1);
    app->setDefaultParentProvider(
        const_cast<ZuApplication::DefaultParentProvider*>(&app->defaultParentProvider()));
    QCOMPARE(Provider::sLiving, 1);
    QCOMPARE(app->defaultParentProvider().defaultParent(), mMain.get());

    ZuApplication::instance()->setDefaultParentProvider(nullptr);
    QCOMPARE(Provider::sLiving, 0);
    ZuProgressDialog orphan;
    QCOMPARE(orphan.parentWidget(), nullptr);
}

void TestDialogs::centring_data()
{
    // The offscreen screen is 800 x 600; windows have 2-pixel frames there.
    QTest::addColumn<QRect>("main");
    QTest::addColumn<QSize>("size");
    QTest::addColumn<QString>("title");
    QTest::addColumn<QVariant>("moveTo"); // invalid: not placed by the caller
    QTest::addColumn<QPoint>("frameTopLeft");
    QTest::addColumn<bool>("traced");
    const QRect main(100, 100, 400, 300);
    const QSize size(200, 100);
    QTest::newRow("centred") << main << size << "Centred" << QVariant() << QPoint(200, 200) << true;
    QTest::newRow("main over the bottom-right edge")
        << QRect(600, 400, 400, 300) << size << "Corner" << QVariant() << QPoint(595, 495) << true;
    QTest::newRow("main over the left edge")
        << QRect(-100, 50, 400, 300) << size << "Left" << QVariant() << QPoint(0, 150) << true;
    QTest::newRow("larger than the screen")
        << main << QSize(1000, 700) << "Large" << QVariant() << QPoint(0, 0) << true;
    QTest::newRow("untitled") << main << size << "" << QVariant() << QPoint(200, 200) << false;
    QTest::newRow("moved by the caller")
        << main << size << "Placed" << QVariant(QPoint(33, 44)) << QPoint(33, 44) << false;
}

void TestDialogs::centring()
{
    QFETCH(QRect, main);
    QFETCH(QSize, size);
    QFETCH(QString, title);
    QFETCH(QVariant, moveTo);
    QFETCH(QPoint, frameTopLeft);
    QFETCH(bool, traced);
    mMain->setGeometry(main);
    RkLogCapture capture;
    ZuDialog dialog(nullptr);
    dialog.setWindowTitle(title);
    dialog.resize(size);
    if (moveTo.isValid())
        dialog.move(moveTo.toPoint());
    dialog.show();
    QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
    QCOMPARE(shownLines(capture),
             traced ? QStringList("1 ZuBase Showed dialog: " + title) : QStringList());

    // Shown again after being hidden: the place it was given is kept.
    dialog.hide();
    mMain->move(0, 0);
    dialog.show();
    QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
}

void TestDialogs::positionWindowAlignments_data()
{
    QTest::addColumn<int>("align");
    QTest::addColumn<QPoint>("pos");
    QTest::addColumn<QPoint>("frameTopLeft");
    // A 100 x 50 client area: a 104 x 54 frame.
    QTest::newRow("centre") << int(Qt::AlignCenter) << QPoint(400, 300) << QPoint(348, 273);
    QTest::newRow("right bottom") << int(Qt::AlignRight | Qt::AlignBottom) << QPoint(400, 300)
                                  << QPoint(296, 246);
    QTest::newRow("left top") << int(Qt::AlignLeft | Qt::AlignTop) << QPoint(400, 300)
                              << QPoint(400, 300);
    QTest::newRow("kept on screen")
        << int(Qt::AlignLeft | Qt::AlignTop) << QPoint(790, 590) << QPoint(695, 545);
}

void TestDialogs::positionWindowAlignments()
{
    QFETCH(int, align);
    QFETCH(QPoint, pos);
    QFETCH(QPoint, frameTopLeft);
    ZuDialog dialog(nullptr);
    dialog.resize(100, 50);
    QVERIFY(!dialog.testAttribute(Qt::WA_WState_Created));
    dialog.positionWindow(pos, Qt::AlignmentFlag(align));
    QVERIFY(!dialog.isVisible());
    QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
}

void TestDialogs::execKeepsDialog_data()
{
    QTest::addColumn<Act>("end");
    QTest::addColumn<int>("result");
    QTest::newRow("accept") << on<QDialog>([](QDialog* d) { d->accept(); }) << 1;
    QTest::newRow("reject") << on<QDialog>([](QDialog* d) { d->reject(); }) << 0;
    QTest::newRow("close") << on<QDialog>([](QDialog* d) { d->close(); }) << 0;
    QTest::newRow("done(5)") << on<QDialog>([](QDialog* d) { d->done(5); }) << 5;
}

void TestDialogs::execKeepsDialog()
{
    QFETCH(Act, end);
    QFETCH(int, result);
    QPointer<ZuDialog> dialog = new ZuDialog(nullptr);
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    bool modalInside = false;
    whenModal([&](QWidget* inModal) {
        modalInside = inModal == dialog;
        end(inModal);
    });
    QCOMPARE(dialog->exec(), result);
    QVERIFY(modalInside);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(!dialog.isNull());
    QVERIFY(!dialog->isVisible());
    QVERIFY(!dialog->testAttribute(Qt::WA_DeleteOnClose));
    QVERIFY(!dialog->testAttribute(Qt::WA_ShowModal));
    delete dialog;
}

void TestDialogs::staticFunctions_data()
{
    // Each function runs twice: the dialog accepted after inAct, then cancelled after it.
    QTest::addColumn<Call>("call");
    QTest::addColumn<Act>("act");
    QTest::addColumn<QVariant>("accepted"); // invalid: not tried
    QTest::addColumn<QVariant>("cancelled");
    static bool ok = false;
    const auto withOk = [](const QVariant& inValue) {
        return QVariantList{inValue, ok};
    };
    const QString file = mDir.filePath(QStringLiteral("study one.dcm"));
    const QString dir = mDir.path();

    QTest::newRow("color") << Call([] { return QVariant(ZuColorDialog::getColor(Qt::blue)); })
                           << on<QColorDialog>([](QColorDialog* d) { d->setCurrentColor(Qt::red); })
                           << QVariant(QColor(Qt::red)) << QVariant(QColor());
    QTest::newRow("font") << Call([=] {
        return withOk(ZuFontDialog::getFont(&ok, QFont("Sans", 11), nullptr, "Font").pointSize());
    }) << on<QFontDialog>([](QFontDialog* d) { d->setCurrentFont(QFont("Serif", 17)); })
                          << QVariant(QVariantList{17, true}) << QVariant(QVariantList{11, false});
    QTest::newRow("int") << Call([=] {
        return withOk(ZuInputDialog::getInt(nullptr, "Count", "How many?", 3, 0, 10, 1, &ok));
    }) << on<QInputDialog>([](QInputDialog* d) { d->setIntValue(7); })
                         << QVariant(QVariantList{7, true}) << QVariant(QVariantList{3, false});
    // 2.25 survives only with the two decimals asked for.
    QTest::newRow("double") << Call([=] {
        return withOk(ZuInputDialog::getDouble(nullptr, "Factor", "Factor:", 1.5, 0, 10, 2, &ok));
    }) << on<QInputDialog>([](QInputDialog* d) { d->setDoubleValue(2.25); })
                            << QVariant(QVariantList{2.25, true})
                            << QVariant(QVariantList{1.5, false});
    // The combo box is editable; out of range the initial text is empty.
    for (int current : {1, -1, 3}) {
        QTest::addRow("item %d", current)
            << Call([=] {
                   return withOk(ZuInputDialog::getItem(nullptr, "Item", "Choose:", {"a", "b", "c"},
                                                        current, true, &ok));
               })
            << (current == 3 ? on<QInputDialog>([](QInputDialog* d) { d->setTextValue("typed"); })
                             : Act())
            << (current == 3   ? QVariant(QVariantList{"typed", true})
                : current == 1 ? QVariant(QVariantList{"b", true})
                               : QVariant())
            << QVariant(QVariantList{current == 1 ? "b" : "", false});
    }
    QTest::newRow("multi-line") << Call([=] {
        return withOk(ZuInputDialog::getMultiLineText(nullptr, "Notes", "Notes:", "old", &ok));
    }) << on<QInputDialog>([](QInputDialog* d) {
        if (d->findChild<QPlainTextEdit*>())
            d->setTextValue("line 1\nline 2");
    }) << QVariant(QVariantList{"line 1\nline 2", true})
                                << QVariant(QVariantList{QString(), false});
    // The own text dialog: password echo, and a validator that drops the letter.
    static QIntValidator validator(0, 999);
    QTest::newRow("text") << Call([=] {
        const QString text =
            ZuInputDialog::getText(nullptr, "Number", "Enter:", QLineEdit::Password, "5", &ok, {},
                                   Qt::ImhDigitsOnly, &validator);
        return QVariantList{text, text.isNull(), ok};
    }) << Act([](QWidget* inModal) {
        auto* edit = inModal->findChild<QLineEdit*>();
        if (edit && edit->echoMode() == QLineEdit::Password)
            QTest::keyClicks(edit, QStringLiteral("12a3")); // replaces the selected "5"
    }) << QVariant(QVariantList{"123", false, true})
                          << QVariant(QVariantList{QString(), true, false});
    const Act select = on<QFileDialog>([file](QFileDialog* d) { d->selectFile(file); });
    QTest::newRow("open file") << Call([=] {
        return QVariant(ZuFileDialog::getOpenFileName(nullptr, "Open", dir, "Studies (*.dcm)"));
    }) << select << QVariant(file)
                               << QVariant(QString());
    QTest::newRow("open files") << Call([=] {
        return QVariant(ZuFileDialog::getOpenFileNames(nullptr, "Open", dir));
    }) << select << QVariant(QStringList(file))
                                << QVariant(QStringList());
    QTest::newRow("save file") << Call([=] {
        return QVariant(ZuFileDialog::getSaveFileName(nullptr, "Save", dir, QString(), nullptr,
                                                      QFileDialog::DontConfirmOverwrite));
    }) << select << QVariant(file)
                               << QVariant(QString());
    QTest::newRow("directory") << Call([=] {
        return QVariant(ZuFileDialog::getExistingDirectory(nullptr, "Dir", dir));
    }) << Act() << QVariant() << QVariant(QString());
}

void TestDialogs::staticFunctions()
{
    QFETCH(Call, call);
    QFETCH(Act, act);
    QFETCH(QVariant, accepted);
    QFETCH(QVariant, cancelled);
    QFile(mDir.filePath(QStringLiteral("study one.dcm"))).open(QIODevice::WriteOnly);
    // File dialogs run with the crash probe on and leave it as it was (the second round starts
    // with it on), and reset the locale.
    for (bool accept : {true, false}) {
        const QVariant expected = accept ? accepted : cancelled;
        if (!expected.isValid())
            continue;
        rkEnableProbeDellBackupAndRecoveryCrash(!accept);
        std::setlocale(LC_ALL, "C.UTF-8");
        QWidget* parent = nullptr;
        bool isFile = false, probeOn = false;
        whenModal([&](QWidget* inModal) {
            parent = inModal->parentWidget();
            isFile = qobject_cast<QFileDialog*>(inModal);
            probeOn = rkProbeDellBackupAndRecoveryCrashEnabled();
            if (act)
                act(inModal);
            finish(inModal, accept);
        });
        QCOMPARE(call(), expected);
        QCOMPARE(parent, mMain.get());
        QCOMPARE(probeOn, isFile || !accept);
        QCOMPARE(rkEnableProbeDellBackupAndRecoveryCrash(false), !accept);
        if (isFile)
            QCOMPARE(QByteArray(std::setlocale(LC_ALL, nullptr)), QByteArray("C"));
    }
}

void TestDialogs::messageBoxes_data()
{
    QTest::addColumn<Full>("full");
    QTest::addColumn<Short>("brief");
    QTest::addColumn<int>("icon");
    QTest::newRow("critical") << Full(&ZuMessageBox::critical) << Short(&ZuMessageBox::critical)
                              << int(QMessageBox::Critical);
    QTest::newRow("information") << Full(&ZuMessageBox::information)
                                 << Short(&ZuMessageBox::information)
                                 << int(QMessageBox::Information);
    QTest::newRow("question") << Full(&ZuMessageBox::question) << Short(&ZuMessageBox::question)
                              << int(QMessageBox::Question);
    QTest::newRow("warning") << Full(&ZuMessageBox::warning) << Short(&ZuMessageBox::warning)
                             << int(QMessageBox::Warning);
}

void TestDialogs::messageBoxes()
{
    QFETCH(Full, full);
    QFETCH(Short, brief);
    QFETCH(int, icon);
    QCoreApplication::setApplicationName(QStringLiteral("zutest"));
    QWidget owner;
    for (bool withParent : {true, false}) {
        QStringList seen;
        whenModal([&](QWidget* inModal) {
            auto* box = qobject_cast<ZuMessageBox*>(inModal);
            if (!box)
                return finish(inModal, false);
            seen << box->windowTitle() << box->text() << QString::number(box->icon())
                 << QString::number(box->parentWidget() == (withParent ? &owner : mMain.get()))
                 << QString::number(box->defaultButton() == box->button(QMessageBox::No));
            box->button(QMessageBox::Yes)->click();
        });
        const auto buttons = QMessageBox::Yes | QMessageBox::No;
        QCOMPARE(withParent ? full(&owner, "Title", "Some text", buttons, QMessageBox::No)
                            : brief("Some text", buttons, QMessageBox::No),
                 QMessageBox::Yes);
        QCOMPARE(seen, QStringList({withParent ? "Title" : "zutest", "Some text",
                                    QString::number(icon), "1", "1"}));
    }
}

void TestDialogs::overwrite_data()
{
    QTest::addColumn<Act>("answer");
    QTest::addColumn<bool>("result");
    QTest::newRow("Overwrite") << on<QMessageBox>([](QMessageBox* b) {
        b->button(QMessageBox::Ok)->click();
    }) << true;
    QTest::newRow("Cancel") << on<QMessageBox>([](QMessageBox* b) {
        b->button(QMessageBox::Cancel)->click();
    }) << false;
    QTest::newRow("Escape") << on<QMessageBox>([](QMessageBox* b) {
        QTest::keyClick(b, Qt::Key_Escape);
    }) << false;
}

void TestDialogs::overwrite()
{
    QFETCH(Act, answer);
    QFETCH(bool, result);
    QStringList seen;
    whenModal([&](QWidget* inModal) {
        if (auto* box = qobject_cast<QMessageBox*>(inModal))
            seen << box->text() << box->button(QMessageBox::Ok)->text()
                 << QString::number(box->defaultButton() == box->button(QMessageBox::Cancel))
                 << QString::number(box->icon());
        answer(inModal);
    });
    QCOMPARE(ZuMessageBox::overwrite(nullptr, QStringLiteral("/data/a b.txt")), result);
    QCOMPARE(seen, QStringList({"/data/a b.txt already exists.", "Overwrite", "1",
                                QString::number(QMessageBox::Information)}));
}

void TestDialogs::messageBoxSplashAndCursor()
{
    QPixmap pixmap(30, 20);
    pixmap.fill(Qt::green);
    QPointer<QSplashScreen> first = new QSplashScreen(pixmap);
    ZuApplication::instance()->setSplashScreen(first);
    QPointer<QSplashScreen> splash = new QSplashScreen(pixmap);
    ZuApplication::instance()->setSplashScreen(splash); // replaces and deletes the first
    QVERIFY(first.isNull());
    QVERIFY(splash->isVisible());
    ZuApplication::Busy busy(true);
    bool splashGone = false;
    int cursor = -1;
    whenModal([&](QWidget* inModal) {
        splashGone = splash.isNull();
        cursor = QGuiApplication::overrideCursor()->shape();
        finish(inModal, false);
    });
    ZuMessageBox::information(QStringLiteral("Loaded."));
    QVERIFY(splashGone);
    QCOMPARE(cursor, int(Qt::ArrowCursor));
    QCOMPARE(QGuiApplication::overrideCursor()->shape(), Qt::WaitCursor);
}

void TestDialogs::parentDeletedDuringExec_data()
{
    QTest::addColumn<int>("kind");
    QTest::newRow("exec") << 0;
    QTest::newRow("getInt") << 1;
    QTest::newRow("warning") << 2;
    QTest::newRow("open file") << 3;
}

void TestDialogs::parentDeletedDuringExec()
{
    QFETCH(int, kind);
    QWidget* window = new QWidget;
    window->show();
    whenModal([window](QWidget*) { delete window; });
    bool ok = true;
    switch (kind) {
    case 0: {
        auto* dialog = new ZuDialog(window);
        QCOMPARE(dialog->exec(), 0);
        break;
    }
    case 1:
        QCOMPARE(ZuInputDialog::getInt(window, "t", "l", 4, 0, 9, 1, &ok), 4);
        QVERIFY(!ok);
        break;
    case 2:
        ZuMessageBox::warning(window, "t", "x");
        break;
    case 3:
        QCOMPARE(ZuFileDialog::getOpenFileName(window, "t", mDir.path()), QString());
        break;
    }
}

void TestDialogs::boxOnSplash_data()
{
    QTest::addColumn<bool>("asDefault");
    QTest::newRow("parent") << false;
    QTest::newRow("default parent") << true;
}

void TestDialogs::boxOnSplash()
{
    QFETCH(bool, asDefault);
    QPixmap pixmap(30, 20);
    pixmap.fill(Qt::green);
    QPointer<QSplashScreen> splash = new QSplashScreen(pixmap);
    ZuApplication::instance()->setSplashScreen(splash);
    if (asDefault)
        ZuApplication::instance()->setDefaultParentProvider(new Provider(splash));
    whenModal([](QWidget* inModal) {
        qobject_cast<QMessageBox*>(inModal)->button(QMessageBox::Yes)->click();
    });
    QCOMPARE(ZuMessageBox::question(asDefault ? nullptr : splash.data(), "t", "x",
                                    QMessageBox::Yes | QMessageBox::No, QMessageBox::Yes),
             QMessageBox::Yes);
    QVERIFY(splash.isNull());
}

int main(int argc, char** argv, char** envp)
{
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    TestDialogs test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_dialogs.moc"
