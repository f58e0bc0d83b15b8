// Line edits and validators: the validators' answers with what they write back, and the edits
// driven by keys and the clipboard as a user would.
#include "zubase/ZuAutoTrimLineEdit.h"
#include "zubase/ZuContainsStringValidator.h"
#include "zubase/ZuIntValidator.h"
#include "zubase/ZuLineEdit.h"
#include "zubase/ZuRegExpValidator.h"
#include "zubase/ZuStartsWithStringValidator.h"

#include <QClipboard>
#include <QtTest>

#include <cmath>
#include <functional>

using MakeValidator = std::function<QValidator*()>;
Q_DECLARE_METATYPE(MakeValidator)

class tst_LineEdits : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void validate_data()
    {
        QTest::addColumn<MakeValidator>("make");
        QTest::addColumn<QString>("input");
        QTest::addColumn<int>("pos");
        QTest::addColumn<QString>("result"); // state (0 Invalid, 1 Intermediate, 2 Acceptable),
                                             // the input and the position afterwards
        const auto row = [](const char* inTag, const MakeValidator& inMake, const char* inInput,
                            int inPos, const char* inResult) {
            QTest::newRow(inTag) << inMake << QString(inInput) << inPos << QString(inResult);
        };
        const auto range = [](double inBottom, double inTop) {
            return [=] {
                return new ZuIntValidator(inBottom, inTop, nullptr);
            };
        };
        // Qt 5.15 keeps a number with no more digits than the top Intermediate (Qt 5.5: Invalid,
        // clamped to 10); a QLineEdit clamps it through fixup() when editing ends.
        row("int 25, Qt 5.15", range(1, 10), "25", 2, "1 25 2");
        row("int above", range(1, 10), "250", 3, "0 10 3");
        row("int below", range(1, 10), "-5", 2, "0 1 2");
        row("int letters", range(1, 10), "1a", 2, "0 1a 2");
        row("int bounds truncated", range(0.9, 10.7), "0", 1, "2 0 1");
        row("int top truncated", range(0.9, 10.7), "100", 3, "0 10 3");
        row("int bounds beyond int", range(-1e10, 1e10), "-7", 2, "2 -7 2");
        row("int nan is open", range(std::nan(""), -5), "-2147483648", 1, "2 -2147483648 1");
        const MakeValidator digits = [] {
            return new ZuRegExpValidator(QRegExp("\\d{3}"), nullptr);
        };
        row("regexp partial", digits, "12", 2, "0 12 2");
        row("regexp full", digits, "123", 3, "2 123 3");
        const MakeValidator colon = [] {
            return new ZuContainsStringValidator(":", nullptr);
        };
        row("contains, empty filled", colon, "", 0, "2 : 0");
        row("contains, missing", colon, "abc", 1, "0 abc 1");
        row("contains", colon, "a:b", 2, "2 a:b 2");
        const MakeValidator prefix = [] {
            return new ZuStartsWithStringValidator("ID-", nullptr);
        };
        row("prefix, cursor moved", prefix, "ID-5", 1, "2 ID-5 3");
        row("prefix broken", prefix, "I-5", 4, "0 I-5 4");
        row("prefix other case", prefix, "id-5", 4, "0 id-5 4");
        row("prefix, empty filled", prefix, "", 0, "2 ID- 3");
    }
    void validate()
    {
        QFETCH(MakeValidator, make);
        QFETCH(QString, input);
        QFETCH(int, pos);
        const std::unique_ptr<QValidator> validator(make());
        const int state = validator->validate(input, pos);
        QTEST(QStringLiteral("%1 %2 %3").arg(state).arg(input).arg(pos), "result");
    }

    void clampedWhenEditingEnds()
    {
        QLineEdit number;
        number.setValidator(new ZuIntValidator(1, 10, &number));
        QSignalSpy finished(&number, &QLineEdit::editingFinished);
        QTest::keyClicks(&number, "250");
        QCOMPARE(number.text(), "25"); // the third digit is refused
        QTest::keyClick(&number, Qt::Key_Return);
        QCOMPARE(number.text(), "10");
        QCOMPARE(finished.count(), 1);
    }

    // Pasted text is left alone while the user edits, and trimmed when editing ends.
    void autoTrim_data()
    {
        QTest::addColumn<QString>("pasted");
        QTest::addColumn<QString>("cleaned");
        QTest::newRow("lines") << " a\nb "
                               << "a b";
        QTest::newRow("crlf, tabs, inner blanks") << "\ta\r\nb  c\t\n"
                                                  << "a  b  c";
    }
    void autoTrim()
    {
        QFETCH(QString, pasted);
        ZuAutoTrimLineEdit edit;
        QApplication::clipboard()->setText(pasted);
        QTest::keyClick(&edit, Qt::Key_V, Qt::ControlModifier);
        QCOMPARE(edit.text(), pasted);
        QTest::keyClick(&edit, Qt::Key_Return);
        QTEST(edit.text(), "cleaned");
    }

    void sizedToSampleOrText()
    {
        ZuLineEdit edit;
        edit.setTextForMinimumSize("0000");
        const QFontMetrics metrics(edit.font());
        const int height = QLineEdit().minimumSizeHint().height();
        QCOMPARE(edit.minimumSizeHint(), QSize(metrics.horizontalAdvance("0000"), height));
        QTest::keyClicks(&edit, "00000000");
        QCOMPARE(edit.sizeHint(), QSize(metrics.horizontalAdvance("00000000"), height));
    }
};

QTEST_MAIN(tst_LineEdits)
#include "tst_lineedits.moc"
