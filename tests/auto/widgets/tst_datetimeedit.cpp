// ZuDateTimeEdit driven from the keyboard under German and English default locales.
#include "zubase/ZuDateTimeEdit.h"

#include <QLineEdit>
#include <QtTest>

#include <memory>

class TstDateTimeEdit : public QObject
{
    Q_OBJECT
    std::unique_ptr<ZuDateTimeEdit> mEdit;

    void makeEdit(const QLocale& inDefault, QDateTimeEdit::Section inSection)
    {
        QLocale::setDefault(inDefault);
        mEdit = std::make_unique<ZuDateTimeEdit>();
        mEdit->setDisplayFormat("yyyy-MMM-dd");
        mEdit->setDateTime(QDateTime(QDate(2020, 1, 15), QTime(0, 0)));
        mEdit->show();
        mEdit->activateWindow();
        QVERIFY(QTest::qWaitForWindowActive(mEdit.get()));
        mEdit->setFocus();
        mEdit->setCurrentSection(inSection);
        mEdit->setSelectedSection(inSection);
    }
    QString text() const { return mEdit->findChild<QLineEdit*>()->text(); }
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

    void typeMonth_data()
    {
        QTest::addColumn<QLocale>("locale");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<QString>("result");
        QTest::addColumn<QLocale::Language>("language"); // of the edit afterwards
        QTest::addColumn<bool>("nextSection");
        const QLocale german(QLocale::German, QLocale::Germany);
        const QLocale english(QLocale::English, QLocale::UnitedStates);
        QTest::newRow("de Mar") << german << "Mar"
                                << "2020-Mar-15" << QLocale::C << true;
        QTest::newRow("de Ma") << german << "Ma"
                               << "2020-Ma-15" << QLocale::German << false;
        QTest::newRow("de März") << german << "März"
                                 << "2020-März-15" << QLocale::German << true;
        QTest::newRow("de 3") << german << "3"
                              << "2020-März-15" << QLocale::German << true;
        QTest::newRow("en Mar") << english << "Mar"
                                << "2020-Mar-15" << QLocale::English << true;
        QTest::newRow("en März") << english << "März"
                                 << "2020-M-15" << QLocale::English << false;
        QTest::newRow("en 3") << english << "3"
                              << "2020-Mar-15" << QLocale::English << true;
    }
    void typeMonth()
    {
        QFETCH(QLocale, locale);
        QFETCH(QString, typed);
        QFETCH(QString, result);
        QFETCH(QLocale::Language, language);
        QFETCH(bool, nextSection);
        makeEdit(locale, QDateTimeEdit::MonthSection);
        QSignalSpy changed(mEdit.get(), &QDateTimeEdit::dateTimeChanged);
        type(typed);
        QCOMPARE(text(), result);
        QCOMPARE(mEdit->locale().language(), language);
        const bool accepted = nextSection;
        QCOMPARE(mEdit->date(), QDate(2020, accepted ? 3 : 1, 15));
        QCOMPARE(changed.count(), accepted ? 1 : 0);
        QTRY_COMPARE(mEdit->currentSection(),
                     nextSection ? QDateTimeEdit::DaySection : QDateTimeEdit::MonthSection);
    }

    // Backspace and Delete select the section; a half-typed month gets its old text back.
    void deleteKeys_data()
    {
        QTest::addColumn<int>("section");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<int>("key");
        QTest::addColumn<QString>("result");
        QTest::addColumn<QString>("selected");
        QTest::newRow("day backspace")
            << int(QDateTimeEdit::DaySection) << "" << int(Qt::Key_Backspace) << "2020-Jan-15"
            << "15";
        QTest::newRow("year delete")
            << int(QDateTimeEdit::YearSection) << "" << int(Qt::Key_Delete) << "2020-Jan-15"
            << "2020";
        QTest::newRow("month pending")
            << int(QDateTimeEdit::MonthSection) << "F" << int(Qt::Key_Backspace) << "2020-Jan-15"
            << "Jan";
    }
    void deleteKeys()
    {
        QFETCH(int, section);
        QFETCH(QString, typed);
        QFETCH(int, key);
        QFETCH(QString, result);
        QFETCH(QString, selected);
        makeEdit(QLocale(QLocale::English, QLocale::UnitedStates), QDateTimeEdit::Section(section));
        type(typed);
        QTest::keyClick(mEdit.get(), Qt::Key(key));
        QCOMPARE(text(), result);
        QCOMPARE(mEdit->findChild<QLineEdit*>()->selectedText(), selected);
        QCOMPARE(mEdit->date(), QDate(2020, 1, 15));
    }

    // A format set past the hiding setDisplayFormat still gets the month handling.
    void formatFromProperty_data()
    {
        QTest::addColumn<bool>("throughBase");
        QTest::newRow("property") << false;
        QTest::newRow("QDateTimeEdit pointer") << true;
    }
    void formatFromProperty()
    {
        QFETCH(bool, throughBase);
        makeEdit(QLocale(QLocale::German, QLocale::Germany), QDateTimeEdit::MonthSection);
        if (throughBase)
            static_cast<QDateTimeEdit*>(mEdit.get())->setDisplayFormat("dd/MMM/yyyy");
        else
            mEdit->setProperty("displayFormat", "dd/MMM/yyyy");
        mEdit->setSelectedSection(QDateTimeEdit::MonthSection);
        type("Mar");
        QCOMPARE(text(), QString("15/Mar/2020"));
        QCOMPARE(mEdit->date(), QDate(2020, 3, 15));
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
        makeEdit(QLocale(QLocale::German, QLocale::Germany), QDateTimeEdit::Section(section));
        QDateTimeEdit plain;
        plain.setDisplayFormat("yyyy-MMM-dd");
        plain.setDateTime(mEdit->dateTime());
        plain.setCurrentSection(QDateTimeEdit::Section(section));
        plain.setSelectedSection(QDateTimeEdit::Section(section));
        for (const QChar key : keys) {
            QTest::keyClick(mEdit.get(), key.toLatin1());
            QTest::keyClick(&plain, key.toLatin1());
            QCOMPARE(text(), plain.findChild<QLineEdit*>()->text());
            QCOMPARE(mEdit->currentSection(), plain.currentSection());
        }
        QCOMPARE(mEdit->dateTime(), plain.dateTime());
        QCOMPARE(mEdit->locale(), plain.locale());
    }
};

QTEST_MAIN(TstDateTimeEdit)
#include "tst_datetimeedit.moc"
