// The quick search field: reports after a typing pause, at once on Clear and Escape.
#include "ObjectCount.h"

#include "zubase/ZuApplication.h"
#include "zubase/ZuQuickSearchWidget.h"

#include <QAccessible>
#include <QAction>
#include <QDialog>
#include <QElapsedTimer>
#include <QLineEdit>
#include <QPushButton>
#include <QSignalSpy>
#include <QVBoxLayout>
#include <QtTest>

namespace {

QStringList reported(const QSignalSpy& inSpy)
{
    QStringList texts;
    for (const QList<QVariant>& arguments : inSpy)
        texts << arguments.at(0).toString();
    return texts;
}

} // namespace

class tst_QuickSearchWidget : public QObject
{
    Q_OBJECT

private slots:
    void reportsAfterTypingPause();
    void reportsEveryEditWithoutDelay_data();
    void reportsEveryEditWithoutDelay();
    void clearReportsAtOnce();
    void programTextNotReported();
    void escape_data();
    void escape();
    void forScreenReader();
    void nothingOutlivesWidget();
};

void tst_QuickSearchWidget::reportsAfterTypingPause()
{
    ZuQuickSearchWidget search(nullptr);
    QCOMPARE(search.searchDelay(), 400);
    auto* edit = search.findChild<QLineEdit*>();
    QSignalSpy spy(&search, &ZuQuickSearchWidget::searchStringChanged);

    QTest::keyClick(edit, Qt::Key_A);
    QTest::qWait(100);
    QTest::keyClicks(edit, QStringLiteral("bc"));
    QElapsedTimer sinceLastKey;
    sinceLastKey.start();
    QCOMPARE(spy.count(), 0);
    QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 10000);
    // A coarse timer may run out up to 5 % early; load only makes it later.
    QVERIFY2(sinceLastKey.elapsed() >= 380, qPrintable(QString::number(sinceLastKey.elapsed())));
    QCOMPARE(reported(spy), QStringList({"abc"}));
    QTest::qWait(500);
    QCOMPARE(spy.count(), 1);
}

void tst_QuickSearchWidget::reportsEveryEditWithoutDelay_data()
{
    QTest::addColumn<int>("delay");
    QTest::newRow("0") << 0;
    QTest::newRow("negative") << -5;
}

void tst_QuickSearchWidget::reportsEveryEditWithoutDelay()
{
    QFETCH(int, delay);
    ZuQuickSearchWidget search(nullptr);
    search.setSearchDelay(delay);
    auto* edit = search.findChild<QLineEdit*>();
    QSignalSpy spy(&search, &ZuQuickSearchWidget::searchStringChanged);
    QTest::keyClicks(edit, QStringLiteral("ct"));
    QTest::keyClick(edit, Qt::Key_Backspace);
    QCOMPARE(reported(spy), QStringList({"c", "ct", "c"}));
}

void tst_QuickSearchWidget::clearReportsAtOnce()
{
    ZuQuickSearchWidget search(nullptr);
    search.setSearchDelay(200);
    auto* edit = search.findChild<QLineEdit*>();
    auto* clear = search.findChild<QPushButton*>();
    QCOMPARE(clear->text(), QStringLiteral("Clear"));
    QSignalSpy spy(&search, &ZuQuickSearchWidget::searchStringChanged);

    // An empty field still reports, on the press already.
    QTest::mousePress(clear, Qt::LeftButton);
    QCOMPARE(reported(spy), QStringList({""}));
    QTest::mouseRelease(clear, Qt::LeftButton);
    QCOMPARE(spy.count(), 1);

    // While a report waits: cleared and reported at once, the wait still runs out later.
    QTest::keyClicks(edit, QStringLiteral("mr"));
    QTest::mouseClick(clear, Qt::LeftButton);
    QCOMPARE(edit->text(), QString());
    QCOMPARE(reported(spy), QStringList({"", ""}));
    QTRY_COMPARE_WITH_TIMEOUT(reported(spy), QStringList({"", "", ""}), 10000);
}

void tst_QuickSearchWidget::programTextNotReported()
{
    ZuQuickSearchWidget search(nullptr);
    search.setSearchDelay(0);
    QSignalSpy spy(&search, &ZuQuickSearchWidget::searchStringChanged);
    search.findChild<QLineEdit*>()->setText(QStringLiteral("set by code"));
    QTest::qWait(50);
    QCOMPARE(spy.count(), 0);
}

void tst_QuickSearchWidget::escape_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("windowGetsEscape");
    QTest::newRow("filled field") << "ct" << false;
    QTest::newRow("empty field") << "" << true;
}

void tst_QuickSearchWidget::escape()
{
    QFETCH(QString, text);
    QFETCH(bool, windowGetsEscape);
    for (const bool inDialog : {true, false}) {
        // In a dialog Escape closes it; elsewhere it may be a window's shortcut.
        std::unique_ptr<QWidget> window(inDialog ? new QDialog : new QWidget);
        auto* search = new ZuQuickSearchWidget(window.get());
        (new QVBoxLayout(window.get()))->addWidget(search);
        QAction shortcut(window.get());
        shortcut.setShortcut(Qt::Key_Escape);
        if (!inDialog)
            window->addAction(&shortcut);
        int windowGot = 0;
        if (inDialog)
            connect(static_cast<QDialog*>(window.get()), &QDialog::rejected, [&] { ++windowGot; });
        else
            connect(&shortcut, &QAction::triggered, [&] { ++windowGot; });
        window->show();
        QVERIFY(QTest::qWaitForWindowActive(window.get()));
        auto* edit = search->findChild<QLineEdit*>();
        edit->setFocus();
        QTest::keyClicks(edit, text);
        QSignalSpy spy(search, &ZuQuickSearchWidget::searchStringChanged);

        QTest::keyClick(edit, Qt::Key_Escape);
        QCOMPARE(edit->text(), QString());
        QCOMPARE(reported(spy), windowGetsEscape ? QStringList() : QStringList({""}));
        QCOMPARE(windowGot, windowGetsEscape ? 1 : 0);
        QCOMPARE(window->isVisible(), !(inDialog && windowGetsEscape));
    }
}

void tst_QuickSearchWidget::forScreenReader()
{
    ZuQuickSearchWidget search(nullptr);
    QAccessibleInterface* widget = QAccessible::queryAccessibleInterface(&search);
    QVERIFY(widget);
    QStringList parts;
    for (int i = 0; i < widget->childCount(); ++i) {
        QAccessibleInterface* child = widget->child(i);
        parts << QStringLiteral("%1:%2").arg(child->role()).arg(child->text(QAccessible::Name));
    }
    QCOMPARE(parts, QStringList({QStringLiteral("%1:Search filter").arg(QAccessible::EditableText),
                                 QStringLiteral("%1:Clear").arg(QAccessible::Button)}));
    QCOMPARE(search.findChild<QLineEdit*>()->placeholderText(),
             QStringLiteral("Enter Search Filter"));
}

void tst_QuickSearchWidget::nothingOutlivesWidget()
{
    int reports = 0;
    auto typeAndDelete = [&reports] {
        auto* search = new ZuQuickSearchWidget(nullptr);
        connect(search, &ZuQuickSearchWidget::searchStringChanged, [&reports] { ++reports; });
        QTest::keyClick(search->findChild<QLineEdit*>(), Qt::Key_X);
        delete search; // while a report waits
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    };
    typeAndDelete(); // whatever Qt makes on first use is not counted
    LiveObjects live;
    typeAndDelete();
    QCOMPARE(live.count(), 0);
    QTest::qWait(500);
    QCOMPARE(reports, 0);
}

int main(int argc, char** argv)
{
    ZuApplication* application = ZuApplication::createInstance(argc, argv, nullptr);
    if (!application)
        return 1;
    tst_QuickSearchWidget test;
    const int result = QTest::qExec(&test, argc, argv);
    delete application;
    return result;
}

#include "tst_quicksearchwidget.moc"
