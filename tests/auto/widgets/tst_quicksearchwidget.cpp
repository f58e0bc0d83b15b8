// The quick search field: reports after a typing pause, at once on Clear and Escape.
#include "WidgetTest.h"
#include "zubase/ZuQuickSearchWidget.h"

#include <QAccessible>
#include <QAction>
#include <QDialog>
#include <QElapsedTimer>
#include <QLayout>
#include <QLineEdit>
#include <QPushButton>

class tst_QuickSearchWidget : public QObject
{
    Q_OBJECT
private slots:
    void reporting();
    void escape_data();
    void escape();
};

void tst_QuickSearchWidget::reporting()
{
    auto* search = new ZuQuickSearchWidget(nullptr);
    auto* edit = search->findChild<QLineEdit*>();
    auto* clear = search->findChild<QPushButton*>();
    QStringList reported;
    connect(search, &ZuQuickSearchWidget::searchStringChanged,
            [&](const QString& inText) { reported << inText; });
    QCOMPARE(search->searchDelay(), 400);
    search->setSearchDelay(800); // so that a busy machine does not end a wait early
    QTest::keyClick(edit, Qt::Key_A);
    QTest::qWait(100);
    QTest::keyClicks(edit, QStringLiteral("bc"));
    QElapsedTimer quiet;
    quiet.start();
    QCOMPARE(reported, QStringList());
    QTRY_COMPARE_WITH_TIMEOUT(reported, QStringList({"abc"}), 10000);
    QVERIFY(quiet.elapsed() >= 760); // a coarse timer may be 5 % early; load only makes it late

    // Clear reports at once on the press; the report still waiting comes too.
    QTest::keyClick(edit, Qt::Key_D);
    QTest::mousePress(clear, Qt::LeftButton);
    QCOMPARE(reported, QStringList({"abc", ""}));
    QTest::mouseRelease(clear, Qt::LeftButton);
    QTRY_COMPARE_WITH_TIMEOUT(reported, QStringList({"abc", "", ""}), 10000);

    // Without a delay every edit reports at once; text set by code is not reported.
    search->setSearchDelay(0);
    QTest::keyClicks(edit, QStringLiteral("ct"));
    QTest::keyClick(edit, Qt::Key_Backspace);
    edit->setText(QStringLiteral("by code"));
    QCOMPARE(reported.mid(3), QStringList({"c", "ct", "c"}));
    QCOMPARE(QAccessible::queryAccessibleInterface(edit)->text(QAccessible::Name),
             QStringLiteral("Search filter"));
    QCOMPARE(edit->placeholderText(), QStringLiteral("Enter Search Filter"));
    QCOMPARE(clear->text(), QStringLiteral("Clear"));
    search->layout()->activate();
    QVERIFY(edit->geometry().right() < clear->x()); // side by side

    search->setSearchDelay(100);
    QTest::keyClick(edit, Qt::Key_X);
    delete search; // while a report waits: its timer goes with it
    QTest::qWait(200);
    QCOMPARE(reported.size(), 6);
}

void tst_QuickSearchWidget::escape_data()
{
    QTest::addColumn<bool>("inDialog"); // else Escape is a shortcut of the window
    QTest::addColumn<QString>("text");
    QTest::newRow("dialog, filled field") << true << "ct";
    QTest::newRow("dialog, empty field") << true << "";
    QTest::newRow("window, filled field") << false << "ct";
    QTest::newRow("window, empty field") << false << "";
}

void tst_QuickSearchWidget::escape()
{
    QFETCH(bool, inDialog);
    QFETCH(QString, text);
    QDialog window;
    auto* search = new ZuQuickSearchWidget(&window);
    QAction shortcut(&window);
    shortcut.setShortcut(Qt::Key_Escape);
    if (!inDialog)
        window.addAction(&shortcut); // which takes Escape before the dialog
    QSignalSpy rejected(&window, &QDialog::rejected);
    QSignalSpy triggered(&shortcut, &QAction::triggered);
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    auto* edit = search->findChild<QLineEdit*>();
    edit->setFocus();
    QTest::keyClicks(edit, text);
    QSignalSpy reported(search, &ZuQuickSearchWidget::searchStringChanged);
    QTest::keyClick(edit, Qt::Key_Escape);
    // A filled field is emptied and reported at once; an empty one leaves Escape to the window.
    QCOMPARE(edit->text(), QString());
    QCOMPARE(reported.count(), text.isEmpty() ? 0 : 1);
    QCOMPARE((inDialog ? rejected : triggered).count(), text.isEmpty() ? 1 : 0);
    QCOMPARE(rejected.count() + triggered.count(), text.isEmpty() ? 1 : 0);
}

ZU_WIDGET_TEST_MAIN(tst_QuickSearchWidget)
#include "tst_quicksearchwidget.moc"
