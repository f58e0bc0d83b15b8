// ZuDateTimeEdit driven from the keyboard under German and English default locales.
#include "zubase/ZuDateTimeEdit.h"

#include <QLineEdit>
#include <QtTest>

#include <memory>

class TstDateTimeEdit : public QObject
{
    Q_OBJECT
    std::unique_ptr<ZuDateTimeEdit> mEdit;

    // A German or English edit showing 2020-Jan-15 with the section selected. The format is set
    // through ZuDateTimeEdit, the displayFormat property or a QDateTimeEdit pointer.
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

private Q_SLOTS:
    void cleanup()
    {
        mEdit.reset();
        QLocale::setDefault(QLocale::c());
    }

    // English names switch a German edit to C; numbers are taken for names and completed, and the
    // focus moves on to the day.
    void typeMonth_data()
    {
        QTest::addColumn<bool>("german");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<int>("route");
        QTest::addColumn<QString>("result"); // the text, the edit's language, the month
        QTest::newRow("de Mar") << true << "Mar" << 0 << "2020-Mar-15 C 3";
        QTest::newRow("de Ma") << true << "Ma" << 0 << "2020-Ma-15 German 1";
        QTest::newRow("de März") << true << "März" << 0 << "2020-März-15 German 3";
        QTest::newRow("de 3") << true << "3" << 0 << "2020-März-15 German 3";
        QTest::newRow("en März") << false << "März" << 0 << "2020-M-15 English 1";
        QTest::newRow("en 3") << false << "3" << 0 << "2020-Mar-15 English 3";
        QTest::newRow("en mar") << false << "mar" << 0 << "2020-Mar-15 English 3";
        QTest::newRow("format property") << true << "Mar" << 1 << "2020-Mar-15 C 3";
        QTest::newRow("format via base") << true << "3" << 2 << "2020-März-15 German 3";
    }
    void typeMonth()
    {
        QFETCH(bool, german);
        QFETCH(QString, typed);
        QFETCH(int, route);
        makeEdit(german, QDateTimeEdit::MonthSection, route);
        QSignalSpy changed(mEdit.get(), &QDateTimeEdit::dateTimeChanged);
        for (const QChar c : typed) { // with their text, also "ä" that keyClicks cannot send
            for (QEvent::Type type : {QEvent::KeyPress, QEvent::KeyRelease}) {
                QKeyEvent event(type, c.toUpper().unicode(), Qt::NoModifier, QString(c));
                QApplication::sendEvent(mEdit.get(), &event);
            }
        }
        const QString language = QLocale::languageToString(mEdit->locale().language());
        QTEST(QString("%1 %2 %3").arg(line()->text(), language).arg(mEdit->date().month()),
              "result");
        const bool accepted = mEdit->date().month() == 3;
        QCOMPARE(changed.count(), int(accepted));
        QTRY_COMPARE(mEdit->currentSection(),
                     accepted ? QDateTimeEdit::DaySection : QDateTimeEdit::MonthSection);
    }

    // Backspace and Delete select the section; a half-typed month gets its old text back. Other
    // keys elsewhere work as in QDateTimeEdit.
    void otherKeys_data()
    {
        QTest::addColumn<int>("section");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<int>("key");
        QTest::addColumn<QString>("result"); // the text and the selection afterwards
        QTest::newRow("day") << int(QDateTimeEdit::DaySection) << "" << int(Qt::Key_Backspace)
                             << "2020-Jan-15 15";
        QTest::newRow("year") << int(QDateTimeEdit::YearSection) << "" << int(Qt::Key_Delete)
                              << "2020-Jan-15 2020";
        QTest::newRow("pending month") << int(QDateTimeEdit::MonthSection) << "F"
                                       << int(Qt::Key_Backspace) << "2020-Jan-15 Jan";
        QTest::newRow("year typed")
            << int(QDateTimeEdit::YearSection) << "199" << int(Qt::Key_3) << "1993-Jan-15 Jan";
    }
    void otherKeys()
    {
        QFETCH(int, section);
        QFETCH(QString, typed);
        QFETCH(int, key);
        makeEdit(false, QDateTimeEdit::Section(section));
        QTest::keyClicks(mEdit.get(), typed);
        QTest::keyClick(mEdit.get(), Qt::Key(key));
        QTEST(line()->text() + " " + line()->selectedText(), "result");
    }
};

QTEST_MAIN(TstDateTimeEdit)
#include "tst_datetimeedit.moc"
