// ZuDateTimeEdit driven from the keyboard under German and English default locales.
#include "zubase/ZuDateTimeEdit.h"

#include <QLineEdit>
#include <QtTest>

#include <memory>

class TstDateTimeEdit : public QObject
{
    Q_OBJECT
    std::unique_ptr<ZuDateTimeEdit> mEdit;

    // A German or English edit showing 2020-Jan-15 with the section selected. The format is
    // set through ZuDateTimeEdit, the displayFormat property or a QDateTimeEdit pointer.
    void makeEdit(bool inGerman, QDateTimeEdit::Section inSection, int inRoute = 0)
    {
        QLocale::setDefault(inGerman ? QLocale(QLocale::German, QLocale::Germany)
                                     : QLocale(QLocale::English, QLocale::UnitedStates));
        mEdit = std::make_unique<ZuDateTimeEdit>();
        const QString format = "yyyy-MMM-dd";
        if (inRoute == 0)
            mEdit->setDisplayFormat(format);
        else if (inRoute == 1)
            mEdit->setProperty("displayFormat", format);
        else
            static_cast<QDateTimeEdit*>(mEdit.get())->setDisplayFormat(format);
        mEdit->setDateTime(QDateTime(QDate(2020, 1, 15), QTime(0, 0)));
        mEdit->show();
        mEdit->activateWindow();
        QVERIFY(QTest::qWaitForWindowActive(mEdit.get()));
        mEdit->setCurrentSection(inSection);
        mEdit->setSelectedSection(inSection);
    }
    QLineEdit* line() const { return mEdit->findChild<QLineEdit*>(); }
    // Key events with their text, also for letters QTest::keyClicks cannot send ("ä").
    void type(const QString& inText)
    {
        for (const QChar c : inText) {
            for (QEvent::Type type : {QEvent::KeyPress, QEvent::KeyRelease}) {
                QKeyEvent event(type, c.toUpper().unicode(), Qt::NoModifier, QString(c));
                QApplication::sendEvent(mEdit.get(), &event);
            }
        }
    }

private Q_SLOTS:
    void cleanup()
    {
        mEdit.reset();
        QLocale::setDefault(QLocale::c());
    }

    // English names switch a German edit to C; numbers are taken for names and completed.
    void typeMonth_data()
    {
        QTest::addColumn<bool>("german");
        QTest::addColumn<int>("route");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<QString>("result");
        QTest::addColumn<QLocale::Language>("language"); // of the edit afterwards
        QTest::addColumn<bool>("accepted");              // and on in the day section
        QTest::newRow("de Mar") << true << 0 << "Mar"
                                << "2020-Mar-15" << QLocale::C << true;
        QTest::newRow("de Ma") << true << 0 << "Ma"
                               << "2020-Ma-15" << QLocale::German << false;
        QTest::newRow("de März") << true << 0 << "März"
                                 << "2020-März-15" << QLocale::German << true;
        QTest::newRow("de 3") << true << 0 << "3"
                              << "2020-März-15" << QLocale::German << true;
        QTest::newRow("en Mar") << false << 0 << "Mar"
                                << "2020-Mar-15" << QLocale::English << true;
        QTest::newRow("en März") << false << 0 << "März"
                                 << "2020-M-15" << QLocale::English << false;
        QTest::newRow("en 3") << false << 0 << "3"
                              << "2020-Mar-15" << QLocale::English << true;
        QTest::newRow("format property") << true << 1 << "Mar"
                                         << "2020-Mar-15" << QLocale::C << true;
        QTest::newRow("format via base") << true << 2 << "3"
                                         << "2020-März-15" << QLocale::German << true;
    }
    void typeMonth()
    {
        QFETCH(bool, german);
        QFETCH(int, route);
        QFETCH(QString, typed);
        QFETCH(QString, result);
        QFETCH(QLocale::Language, language);
        QFETCH(bool, accepted);
        makeEdit(german, QDateTimeEdit::MonthSection, route);
        QSignalSpy changed(mEdit.get(), &QDateTimeEdit::dateTimeChanged);
        type(typed);
        QCOMPARE(line()->text(), result);
        QCOMPARE(mEdit->locale().language(), language);
        QCOMPARE(mEdit->date(), QDate(2020, accepted ? 3 : 1, 15));
        QCOMPARE(changed.count(), accepted ? 1 : 0);
        QTRY_COMPARE(mEdit->currentSection(),
                     accepted ? QDateTimeEdit::DaySection : QDateTimeEdit::MonthSection);
    }

    // Backspace and Delete select the section; a half-typed month gets its old text back.
    void deleteKeys_data()
    {
        QTest::addColumn<int>("section");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<int>("key");
        QTest::addColumn<QString>("selected");
        QTest::newRow("day") << int(QDateTimeEdit::DaySection) << "" << int(Qt::Key_Backspace)
                             << "15";
        QTest::newRow("year") << int(QDateTimeEdit::YearSection) << "" << int(Qt::Key_Delete)
                              << "2020";
        QTest::newRow("pending month")
            << int(QDateTimeEdit::MonthSection) << "F" << int(Qt::Key_Backspace) << "Jan";
    }
    void deleteKeys()
    {
        QFETCH(int, section);
        QFETCH(QString, typed);
        QFETCH(int, key);
        QFETCH(QString, selected);
        makeEdit(false, QDateTimeEdit::Section(section));
        type(typed);
        QTest::keyClick(mEdit.get(), Qt::Key(key));
        QCOMPARE(line()->text(), "2020-Jan-15");
        QCOMPARE(line()->selectedText(), selected);
    }

    // Elsewhere the edit behaves like QDateTimeEdit.
    void otherSections_data()
    {
        QTest::addColumn<int>("section");
        QTest::addColumn<QString>("keys");
        QTest::newRow("year") << int(QDateTimeEdit::YearSection) << "19x93";
        QTest::newRow("day") << int(QDateTimeEdit::DaySection) << "3x1";
    }
    void otherSections()
    {
        QFETCH(int, section);
        QFETCH(QString, keys);
        makeEdit(true, QDateTimeEdit::Section(section));
        QDateTimeEdit plain(mEdit->dateTime());
        plain.setDisplayFormat("yyyy-MMM-dd");
        plain.setSelectedSection(QDateTimeEdit::Section(section));
        for (const QChar key : keys) {
            QTest::keyClick(mEdit.get(), key.toLatin1());
            QTest::keyClick(&plain, key.toLatin1());
            QCOMPARE(line()->text(), plain.findChild<QLineEdit*>()->text());
            QCOMPARE(mEdit->currentSection(), plain.currentSection());
        }
        QCOMPARE(mEdit->locale(), plain.locale());
    }
};

QTEST_MAIN(TstDateTimeEdit)
#include "tst_datetimeedit.moc"
