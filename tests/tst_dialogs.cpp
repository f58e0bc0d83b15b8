// Top-level dialogs: default parent, placement, the "Showed dialog" trace, the guarded exec()
// and the static functions on accept and cancel (driven from a timer while they run).
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

#include <QAbstractButton>
#include <QComboBox>
#include <QDialogButtonBox>
#include <QIntValidator>
#include <QLabel>
#include <QLayout>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPointer>
#include <QPushButton>
#include <QSplashScreen>
#include <QTemporaryDir>
#include <QtTest>

#include <clocale>
#include <functional>

namespace {

// Runs inAction on the next modal widget, once it is up.
void whenModal(std::function<void(QWidget*)> inAction)
{
    auto* timer = new QTimer;
    timer->setInterval(5);
    QObject::connect(timer, &QTimer::timeout, [timer, inAction] {
        QWidget* modal = QApplication::activeModalWidget();
        if (!modal)
            return;
        timer->stop();
        timer->deleteLater();
        inAction(modal);
    });
    timer->start();
}

void finish(QWidget* inModal, bool inAccept)
{
    auto* dialog = qobject_cast<QDialog*>(inModal);
    if (!dialog)
        return;
    if (inAccept)
        dialog->accept();
    else
        dialog->reject();
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
    explicit Provider(QWidget* inWidget) : mWidget(inWidget) {}
    QWidget* defaultParent() const override { return mWidget; }
    QPointer<QWidget> mWidget;
};

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
    void movedByCaller();
    void execKeepsDialog_data();
    void execKeepsDialog();
    void colorAndFont();
    void inputNumbers();
    void inputItem_data();
    void inputItem();
    void inputTexts();
    void fileDialogs();
    void messageBoxes_data();
    void messageBoxes();
    void overwrite_data();
    void overwrite();
    void messageBoxSplashAndCursor();
    void messageBoxWidth_data();
    void messageBoxWidth();

private:
    std::unique_ptr<QWidget> mMain;
};

void TestDialogs::init()
{
    mMain.reset(new QWidget);
    mMain->setWindowTitle(QStringLiteral("main"));
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

    ZuApplication::instance()->setDefaultParentProvider(nullptr);
    ZuProgressDialog orphan;
    QCOMPARE(orphan.parentWidget(), nullptr);
}

void TestDialogs::centring_data()
{
    // The offscreen screen is 800 x 600; windows have 2-pixel frames there.
    QTest::addColumn<QRect>("main");
    QTest::addColumn<QSize>("size");
    QTest::addColumn<QPoint>("frameTopLeft");
    QTest::newRow("centred") << QRect(100, 100, 400, 300) << QSize(200, 100) << QPoint(200, 200);
    QTest::newRow("main over the bottom-right edge")
        << QRect(600, 400, 400, 300) << QSize(200, 100) << QPoint(595, 495);
    QTest::newRow("main over the left edge")
        << QRect(-100, 50, 400, 300) << QSize(200, 100) << QPoint(0, 150);
    QTest::newRow("larger than the screen")
        << QRect(100, 100, 400, 300) << QSize(1000, 700) << QPoint(0, 0);
}

void TestDialogs::centring()
{
    QFETCH(QRect, main);
    QFETCH(QSize, size);
    QFETCH(QPoint, frameTopLeft);
    mMain->setGeometry(main);
    RkLogCapture capture;
    ZuDialog dialog(nullptr);
    dialog.setWindowTitle(QStringLiteral("Centred dialog"));
    dialog.resize(size);
    dialog.show();
    QCOMPARE(dialog.frameGeometry().topLeft(), frameTopLeft);
    QCOMPARE(shownLines(capture), QStringList("1 ZuBase Showed dialog: Centred dialog"));

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

void TestDialogs::movedByCaller()
{
    RkLogCapture capture;
    ZuDialog dialog(nullptr);
    dialog.setWindowTitle(QStringLiteral("Placed"));
    dialog.resize(200, 100);
    dialog.move(33, 44);
    dialog.show();
    QCOMPARE(dialog.frameGeometry().topLeft(), QPoint(33, 44));

    ZuDialog untitled(nullptr);
    untitled.resize(200, 100);
    untitled.show();
    QCOMPARE(untitled.frameGeometry().topLeft(), QPoint(200, 200));
    QCOMPARE(shownLines(capture), QStringList());
}

void TestDialogs::execKeepsDialog_data()
{
    QTest::addColumn<QString>("how");
    QTest::addColumn<int>("result");
    QTest::newRow("accept") << "accept" << 1;
    QTest::newRow("reject") << "reject" << 0;
    QTest::newRow("close") << "close" << 0;
    QTest::newRow("done(5)") << "done" << 5;
}

void TestDialogs::execKeepsDialog()
{
    QFETCH(QString, how);
    QFETCH(int, result);
    QPointer<ZuDialog> dialog = new ZuDialog(nullptr);
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    bool modalInside = false;
    whenModal([&, how](QWidget* inModal) {
        modalInside = inModal == dialog;
        if (how == QLatin1String("accept"))
            dialog->accept();
        else if (how == QLatin1String("reject"))
            dialog->reject();
        else if (how == QLatin1String("close"))
            dialog->close();
        else
            dialog->done(5);
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

void TestDialogs::colorAndFont()
{
    QString title;
    QWidget* parent = nullptr;
    whenModal([&](QWidget* inModal) {
        title = inModal->windowTitle();
        parent = inModal->parentWidget();
        auto* dialog = qobject_cast<QColorDialog*>(inModal);
        if (dialog)
            dialog->setCurrentColor(Qt::red);
        finish(inModal, true);
    });
    QCOMPARE(ZuColorDialog::getColor(Qt::blue, nullptr, QString()), QColor(Qt::red));
    QCOMPARE(parent, mMain.get());
    QVERIFY(!title.isEmpty()); // the dialog's own title

    whenModal([&](QWidget* inModal) {
        title = inModal->windowTitle();
        finish(inModal, false);
    });
    QVERIFY(!ZuColorDialog::getColor(Qt::blue, nullptr, QStringLiteral("Pick")).isValid());
    QCOMPARE(title, QStringLiteral("Pick"));

    QFont initial(QStringLiteral("Sans"), 11);
    QFont chosen(QStringLiteral("Serif"), 17);
    bool ok = false;
    whenModal([&](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QFontDialog*>(inModal))
            dialog->setCurrentFont(chosen);
        finish(inModal, true);
    });
    QCOMPARE(ZuFontDialog::getFont(&ok, initial, nullptr, QStringLiteral("Font")).pointSize(), 17);
    QVERIFY(ok);
    whenModal([&](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QFontDialog*>(inModal))
            dialog->setCurrentFont(chosen);
        finish(inModal, false);
    });
    QCOMPARE(ZuFontDialog::getFont(&ok, initial), initial);
    QVERIFY(!ok);
}

void TestDialogs::inputNumbers()
{
    bool ok = false;
    whenModal([](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QInputDialog*>(inModal))
            dialog->setIntValue(7);
        finish(inModal, true);
    });
    QCOMPARE(ZuInputDialog::getInt(nullptr, "Count", "How many?", 3, 0, 10, 1, &ok), 7);
    QVERIFY(ok);
    whenModal([](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QInputDialog*>(inModal))
            dialog->setIntValue(7);
        finish(inModal, false);
    });
    QCOMPARE(ZuInputDialog::getInt(nullptr, "Count", "How many?", 3, 0, 10, 1, &ok), 3);
    QVERIFY(!ok);

    int decimals = -1;
    whenModal([&](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QInputDialog*>(inModal)) {
            decimals = dialog->doubleDecimals();
            dialog->setDoubleValue(2.25);
        }
        finish(inModal, true);
    });
    QCOMPARE(ZuInputDialog::getDouble(nullptr, "Factor", "Factor:", 1.5, 0, 10, 2, &ok), 2.25);
    QVERIFY(ok);
    QCOMPARE(decimals, 2);
    whenModal([](QWidget* inModal) { finish(inModal, false); });
    QCOMPARE(ZuInputDialog::getDouble(nullptr, "Factor", "Factor:", 1.5, 0, 10, 2, &ok), 1.5);
    QVERIFY(!ok);
}

void TestDialogs::inputItem_data()
{
    QTest::addColumn<int>("current");
    QTest::addColumn<bool>("accept");
    QTest::addColumn<QString>("typed"); // entered in the editable combo box; empty: nothing
    QTest::addColumn<QString>("result");
    QTest::newRow("second, accepted") << 1 << true << ""
                                      << "b";
    QTest::newRow("second, changed and cancelled") << 1 << false << "typed"
                                                   << "b";
    // Out of range the initial text is empty, and a cancel gives it back.
    QTest::newRow("-1, cancelled") << -1 << false << ""
                                   << "";
    QTest::newRow("past the end, cancelled") << 3 << false << ""
                                             << "";
    QTest::newRow("past the end, typed and accepted") << 3 << true << "typed"
                                                      << "typed";
}

void TestDialogs::inputItem()
{
    QFETCH(int, current);
    QFETCH(bool, accept);
    QFETCH(QString, typed);
    QFETCH(QString, result);
    QString seen;
    bool editable = false;
    whenModal([&](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QInputDialog*>(inModal)) {
            seen = dialog->textValue();
            editable = dialog->isComboBoxEditable();
            if (!typed.isEmpty())
                dialog->setTextValue(typed);
        }
        finish(inModal, accept);
    });
    bool ok = !accept;
    QCOMPARE(
        ZuInputDialog::getItem(nullptr, "Item", "Choose:", {"a", "b", "c"}, current, true, &ok),
        result);
    QCOMPARE(ok, accept);
    QVERIFY(editable);
    if (current == 1)
        QCOMPARE(seen, QStringLiteral("b"));
}

void TestDialogs::inputTexts()
{
    // The own getText dialog: label, line edit with validator and echo mode, Ok and Cancel.
    QIntValidator validator(0, 999);
    QString label;
    int echo = -1;
    bool validated = false;
    whenModal([&](QWidget* inModal) {
        auto* edit = inModal->findChild<QLineEdit*>();
        auto* text = inModal->findChild<QLabel*>();
        auto* box = inModal->findChild<QDialogButtonBox*>();
        if (!edit || !text || !box)
            return finish(inModal, false);
        label = text->text();
        echo = edit->echoMode();
        validated = edit->validator() == &validator;
        QTest::keyClicks(edit, QStringLiteral("12a3")); // replaces the selected "5"
        box->button(QDialogButtonBox::Ok)->click();
    });
    bool ok = false;
    QCOMPARE(ZuInputDialog::getText(nullptr, "Number", "Enter:", QLineEdit::Password, "5", &ok, {},
                                    Qt::ImhDigitsOnly, &validator),
             QStringLiteral("123"));
    QVERIFY(ok);
    QCOMPARE(label, QStringLiteral("Enter:"));
    QCOMPARE(echo, int(QLineEdit::Password));
    QVERIFY(validated);

    whenModal([](QWidget* inModal) {
        if (auto* box = inModal->findChild<QDialogButtonBox*>())
            box->button(QDialogButtonBox::Cancel)->click();
    });
    const QString cancelled =
        ZuInputDialog::getText(nullptr, "Number", "Enter:", QLineEdit::Normal, "5", &ok);
    QVERIFY(cancelled.isNull());
    QVERIFY(!ok);

    bool plain = false;
    whenModal([&](QWidget* inModal) {
        plain = inModal->findChild<QPlainTextEdit*>() != nullptr;
        if (auto* dialog = qobject_cast<QInputDialog*>(inModal))
            dialog->setTextValue(QStringLiteral("line 1\nline 2"));
        finish(inModal, true);
    });
    QCOMPARE(ZuInputDialog::getMultiLineText(nullptr, "Notes", "Notes:", "old", &ok),
             QStringLiteral("line 1\nline 2"));
    QVERIFY(plain);
    whenModal([](QWidget* inModal) { finish(inModal, false); });
    QVERIFY(ZuInputDialog::getMultiLineText(nullptr, "Notes", "Notes:", "old", &ok).isNull());
    QVERIFY(!ok);
}

void TestDialogs::fileDialogs()
{
    QTemporaryDir dir;
    QVERIFY(dir.isValid());
    const QString file = dir.filePath(QStringLiteral("study one.dcm"));
    {
        QFile f(file);
        QVERIFY(f.open(QIODevice::WriteOnly));
    }
    QVERIFY(!rkProbeDellBackupAndRecoveryCrashEnabled());
    std::setlocale(LC_ALL, "C.UTF-8");

    bool probeOn = false;
    QWidget* parent = nullptr;
    whenModal([&](QWidget* inModal) {
        probeOn = rkProbeDellBackupAndRecoveryCrashEnabled();
        parent = inModal->parentWidget();
        if (auto* dialog = qobject_cast<QFileDialog*>(inModal))
            dialog->selectFile(file);
        finish(inModal, true);
    });
    QCOMPARE(ZuFileDialog::getOpenFileName(nullptr, "Open", dir.path(), "Studies (*.dcm)"), file);
    QVERIFY(probeOn);
    QCOMPARE(parent, mMain.get());
    QVERIFY(!rkProbeDellBackupAndRecoveryCrashEnabled());
    QCOMPARE(QByteArray(std::setlocale(LC_ALL, nullptr)), QByteArray("C"));

    // A probe that was on stays on.
    rkEnableProbeDellBackupAndRecoveryCrash(true);
    whenModal([](QWidget* inModal) { finish(inModal, false); });
    QCOMPARE(ZuFileDialog::getOpenFileNames(nullptr, "Open", dir.path()), QStringList());
    QVERIFY(rkProbeDellBackupAndRecoveryCrashEnabled());
    rkEnableProbeDellBackupAndRecoveryCrash(false);

    whenModal([&](QWidget* inModal) {
        if (auto* dialog = qobject_cast<QFileDialog*>(inModal))
            dialog->selectFile(dir.filePath(QStringLiteral("new.dcm")));
        finish(inModal, true);
    });
    QCOMPARE(ZuFileDialog::getSaveFileName(nullptr, "Save", dir.path(), QString(), nullptr,
                                           QFileDialog::DontConfirmOverwrite),
             dir.filePath(QStringLiteral("new.dcm")));

    whenModal([](QWidget* inModal) { finish(inModal, false); });
    QCOMPARE(ZuFileDialog::getExistingDirectory(nullptr, "Folder", dir.path()), QString());
}

void TestDialogs::messageBoxes_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<bool>("withParent");
    QTest::addColumn<int>("icon");
    for (bool withParent : {true, false}) {
        const char* form = withParent ? "parent" : "text only";
        QTest::addRow("critical, %s", form)
            << "critical" << withParent << int(QMessageBox::Critical);
        QTest::addRow("information, %s", form)
            << "information" << withParent << int(QMessageBox::Information);
        QTest::addRow("question, %s", form)
            << "question" << withParent << int(QMessageBox::Question);
        QTest::addRow("warning, %s", form) << "warning" << withParent << int(QMessageBox::Warning);
    }
}

void TestDialogs::messageBoxes()
{
    QFETCH(QString, kind);
    QFETCH(bool, withParent);
    QFETCH(int, icon);
    QCoreApplication::setApplicationName(QStringLiteral("zutest"));
    QWidget owner;
    QString title, text;
    int seenIcon = -1;
    QWidget* parent = nullptr;
    bool defaultIsNo = false;
    whenModal([&](QWidget* inModal) {
        auto* box = qobject_cast<ZuMessageBox*>(inModal);
        if (!box)
            return finish(inModal, false);
        title = box->windowTitle();
        text = box->text();
        seenIcon = box->icon();
        parent = box->parentWidget();
        defaultIsNo = box->defaultButton() == box->button(QMessageBox::No);
        box->button(QMessageBox::Yes)->click();
    });
    const auto buttons = QMessageBox::Yes | QMessageBox::No;
    QMessageBox::StandardButton result = QMessageBox::NoButton;
    using Full =
        QMessageBox::StandardButton (*)(QWidget*, const QString&, const QString&,
                                        QMessageBox::StandardButtons, QMessageBox::StandardButton);
    using Short = QMessageBox::StandardButton (*)(const QString&, QMessageBox::StandardButtons,
                                                  QMessageBox::StandardButton);
    const QMap<QString, QPair<Full, Short>> functions = {
        {"critical", {&ZuMessageBox::critical, &ZuMessageBox::critical}},
        {"information", {&ZuMessageBox::information, &ZuMessageBox::information}},
        {"question", {&ZuMessageBox::question, &ZuMessageBox::question}},
        {"warning", {&ZuMessageBox::warning, &ZuMessageBox::warning}}};
    if (withParent)
        result = functions[kind].first(&owner, "Title", "Some text", buttons, QMessageBox::No);
    else
        result = functions[kind].second("Some text", buttons, QMessageBox::No);
    QCOMPARE(result, QMessageBox::Yes);
    QCOMPARE(seenIcon, icon);
    QCOMPARE(text, QStringLiteral("Some text"));
    QCOMPARE(title, withParent ? QStringLiteral("Title") : QStringLiteral("zutest"));
    QCOMPARE(parent, withParent ? &owner : mMain.get());
    QVERIFY(defaultIsNo);
}

void TestDialogs::overwrite_data()
{
    QTest::addColumn<QString>("how");
    QTest::addColumn<bool>("result");
    QTest::newRow("Overwrite") << "ok" << true;
    QTest::newRow("Cancel") << "cancel" << false;
    QTest::newRow("Escape") << "escape" << false;
}

void TestDialogs::overwrite()
{
    QFETCH(QString, how);
    QFETCH(bool, result);
    QString text, okText;
    bool defaultCancel = false;
    int icon = -1;
    whenModal([&, how](QWidget* inModal) {
        auto* box = qobject_cast<QMessageBox*>(inModal);
        if (!box)
            return finish(inModal, false);
        text = box->text();
        okText = box->button(QMessageBox::Ok)->text();
        defaultCancel = box->defaultButton() == box->button(QMessageBox::Cancel);
        icon = box->icon();
        if (how == QLatin1String("ok"))
            box->button(QMessageBox::Ok)->click();
        else if (how == QLatin1String("cancel"))
            box->button(QMessageBox::Cancel)->click();
        else
            QTest::keyClick(box, Qt::Key_Escape);
    });
    QCOMPARE(ZuMessageBox::overwrite(nullptr, QStringLiteral("/data/a b.txt")), result);
    QCOMPARE(text, QStringLiteral("/data/a b.txt already exists."));
    QCOMPARE(okText, QStringLiteral("Overwrite"));
    QVERIFY(defaultCancel);
    QCOMPARE(icon, int(QMessageBox::Information));
}

void TestDialogs::messageBoxSplashAndCursor()
{
    QPixmap pixmap(30, 20);
    pixmap.fill(Qt::green);
    QPointer<QSplashScreen> splash = new QSplashScreen(pixmap);
    ZuApplication::instance()->setSplashScreen(splash);
    QVERIFY(splash);

    ZuApplication::Busy busy(true);
    bool splashGone = false;
    int cursor = -1;
    whenModal([&](QWidget* inModal) {
        splashGone = splash.isNull();
        const QCursor* override = QGuiApplication::overrideCursor();
        cursor = override ? int(override->shape()) : -1;
        finish(inModal, false);
    });
    ZuMessageBox::information(QStringLiteral("Loaded."));
    QVERIFY(splashGone);
    QCOMPARE(cursor, int(Qt::ArrowCursor));
    QCOMPARE(QGuiApplication::overrideCursor()->shape(), Qt::WaitCursor);
}

void TestDialogs::messageBoxWidth_data()
{
    QTest::addColumn<QString>("text");
    QTest::addRow("short") << QStringLiteral("Done.");
    QTest::addRow("long") << QStringLiteral("A rather long message ").repeated(20);
}

void TestDialogs::messageBoxWidth()
{
    // The offscreen work area is 800 pixels wide: W = 799, limit = min(400, 320, 1000) = 320.
    QFETCH(QString, text);
    const int limit = 320;

    // The same box without the rule, measured the way the rule measures.
    QMessageBox twin(QMessageBox::Information, "t", text, QMessageBox::Ok);
    QLabel* twinLabel = twin.findChild<QLabel*>(QStringLiteral("qt_msgbox_label"));
    QVERIFY(twinLabel);
    twinLabel->setWordWrap(false);
    twinLabel->setMinimumWidth(0);
    twin.layout()->activate();
    const int total = twin.layout()->totalMinimumSize().width();
    const int hint = twinLabel->sizeHint().width();

    ZuMessageBox box(nullptr);
    box.setIcon(QMessageBox::Information);
    box.setWindowTitle("t");
    box.setText(text);
    box.setStandardButtons(QMessageBox::Ok);
    QVERIFY(box.findLabel());
    QCOMPARE(box.findLabel(), box.findChild<QLabel*>(QStringLiteral("qt_msgbox_label")));
    box.show();
    const int expected = total > limit ? hint - (total - limit) : hint;
    QCOMPARE(box.findLabel()->minimumWidth(), expected);
    if (text.size() > 100)
        QVERIFY(total > limit);
}

int main(int argc, char** argv, char** envp)
{
    ZuApplication* app = ZuApplication::createInstance(argc, argv, envp);
    int result = 1;
    {
        TestDialogs test;
        result = QTest::qExec(&test, argc, argv);
    }
    delete app;
    return result;
}

#include "tst_dialogs.moc"
