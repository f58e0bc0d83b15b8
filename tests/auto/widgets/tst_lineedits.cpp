// Line edits and validators: the validators' answers (with what they write back), and the
// edits driven by keys and the clipboard as a user would.
#include "zubase/ZuAutoTrimLineEdit.h"
#include "zubase/ZuContainsStringValidator.h"
#include "zubase/ZuIntValidator.h"
#include "zubase/ZuLineEdit.h"
#include "zubase/ZuRegExpValidator.h"
#include "zubase/ZuStartsWithStringValidator.h"

#include <QClipboard>
#include <QSignalSpy>
#include <QtTest>

#include <cmath>
#include <functional>
#include <limits>

using MakeValidator = std::function<QValidator*()>;
Q_DECLARE_METATYPE(MakeValidator)
Q_DECLARE_METATYPE(QValidator::State)

class tst_LineEdits : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void validate_data();
    void validate();
    void intRangeFromDoubles_data();
    void intRangeFromDoubles();
    void intValidatorClampsOnEnter();
    void prefixCannotBeRemoved();
    void autoTrimOnEditingFinished_data();
    void autoTrimOnEditingFinished();
    void sizedToSampleOrText();
};

void tst_LineEdits::validate_data()
{
    QTest::addColumn<MakeValidator>("make");
    QTest::addColumn<QString>("input");
    QTest::addColumn<int>("pos");
    QTest::addColumn<QValidator::State>("state");
    QTest::addColumn<QString>("output");
    QTest::addColumn<int>("outPos");

    const auto V = QValidator::Invalid;
    const auto I = QValidator::Intermediate;
    const auto A = QValidator::Acceptable;
    const MakeValidator int1to10 = [] {
        return new ZuIntValidator(1, 10, nullptr);
    };
    QTest::newRow("int in range") << int1to10 << "5" << 1 << A << "5" << 1;
    QTest::newRow("int empty") << int1to10 << "" << 0 << I << "" << 0;
    // Qt 5.15 keeps numbers with no more digits than the top Intermediate (Qt 5.5 said
    // Invalid and clamped to 10); QLineEdit clamps them through fixup() when editing ends.
    QTest::newRow("int 25, Qt 5.15") << int1to10 << "25" << 2 << I << "25" << 2;
    QTest::newRow("int too long") << int1to10 << "250" << 3 << V << "10" << 3;
    QTest::newRow("int below") << int1to10 << "-5" << 2 << V << "1" << 2;
    QTest::newRow("int zero") << int1to10 << "0" << 1 << I << "0" << 1;
    QTest::newRow("int letters") << int1to10 << "x" << 1 << V << "x" << 1;

    const MakeValidator threeDigits = [] {
        return new ZuRegExpValidator(QRegExp(QStringLiteral("\\d{3}")), nullptr);
    };
    QTest::newRow("regexp partial") << threeDigits << "12" << 2 << V << "12" << 2;
    QTest::newRow("regexp full") << threeDigits << "123" << 3 << A << "123" << 3;
    QTest::newRow("regexp too long") << threeDigits << "1234" << 4 << V << "1234" << 4;
    QTest::newRow("regexp empty") << threeDigits << "" << 0 << V << "" << 0;

    const MakeValidator colon = [] {
        return new ZuContainsStringValidator(":", nullptr);
    };
    QTest::newRow("contains, empty filled") << colon << "" << 0 << A << ":" << 0;
    QTest::newRow("contains, missing") << colon << "abc" << 1 << V << "abc" << 1;
    QTest::newRow("contains") << colon << "a:b" << 2 << A << "a:b" << 2;

    const MakeValidator prefix = [] {
        return new ZuStartsWithStringValidator("ID-", nullptr);
    };
    QTest::newRow("prefix, cursor moved") << prefix << "ID-5" << 1 << A << "ID-5" << 3;
    QTest::newRow("prefix, cursor behind") << prefix << "ID-5" << 4 << A << "ID-5" << 4;
    QTest::newRow("prefix broken") << prefix << "I-5" << 0 << V << "I-5" << 3;
    QTest::newRow("prefix other case") << prefix << "id-5" << 4 << V << "id-5" << 4;
    QTest::newRow("prefix, empty filled") << prefix << "" << 0 << A << "ID-" << 3;
}

void tst_LineEdits::validate()
{
    QFETCH(MakeValidator, make);
    QFETCH(QString, input);
    QFETCH(int, pos);
    const std::unique_ptr<QValidator> validator(make());
    QTEST(validator->validate(input, pos), "state");
    QTEST(input, "output");
    QTEST(pos, "outPos");
}

void tst_LineEdits::intRangeFromDoubles_data()
{
    QTest::addColumn<double>("bottom");
    QTest::addColumn<double>("top");
    QTest::addColumn<int>("expectedBottom");
    QTest::addColumn<int>("expectedTop");
    const int lowest = std::numeric_limits<int>::min();
    const int highest = std::numeric_limits<int>::max();
    QTest::newRow("truncated") << 0.9 << 10.7 << 0 << 10;
    QTest::newRow("truncated toward zero") << -10.7 << -0.9 << -10 << 0;
    QTest::newRow("beyond int") << -1e10 << 1e10 << lowest << highest;
    QTest::newRow("top beyond int") << 1.0 << 3e9 << 1 << highest;
    QTest::newRow("nan leaves open") << std::nan("") << 5.0 << lowest << 5;
}

void tst_LineEdits::intRangeFromDoubles()
{
    QFETCH(double, bottom);
    QFETCH(double, top);
    const ZuIntValidator validator(bottom, top, nullptr);
    QTEST(validator.bottom(), "expectedBottom");
    QTEST(validator.top(), "expectedTop");
}

void tst_LineEdits::intValidatorClampsOnEnter()
{
    QLineEdit edit;
    edit.setValidator(new ZuIntValidator(1, 10, &edit));
    QSignalSpy finished(&edit, &QLineEdit::editingFinished);
    QTest::keyClicks(&edit, "250");
    QCOMPARE(edit.text(), QStringLiteral("25")); // the third digit is refused
    QCOMPARE(finished.count(), 0);
    QTest::keyClick(&edit, Qt::Key_Return);
    QCOMPARE(edit.text(), QStringLiteral("10"));
    QCOMPARE(finished.count(), 1);
}

void tst_LineEdits::prefixCannotBeRemoved()
{
    QLineEdit edit;
    edit.setValidator(new ZuStartsWithStringValidator("ID-", &edit));
    edit.setText(QStringLiteral("ID-42"));
    QTest::keyClick(&edit, Qt::Key_Home);
    QTest::keyClick(&edit, Qt::Key_Delete);
    QTest::keyClicks(&edit, "x");
    QCOMPARE(edit.text(), QStringLiteral("ID-42"));
    QTest::keyClick(&edit, Qt::Key_A, Qt::ControlModifier);
    QTest::keyClick(&edit, Qt::Key_Backspace);
    QCOMPARE(edit.text(), QStringLiteral("ID-"));
    QCOMPARE(edit.cursorPosition(), 3);
    QTest::keyClicks(&edit, "7");
    QCOMPARE(edit.text(), QStringLiteral("ID-7"));
}

void tst_LineEdits::autoTrimOnEditingFinished_data()
{
    QTest::addColumn<QString>("pasted");
    QTest::addColumn<QString>("cleaned");
    QTest::newRow("lines") << " a\nb "
                           << "a b";
    QTest::newRow("crlf, inner blanks kept") << "a\r\nb  c"
                                             << "a  b  c";
    QTest::newRow("tab") << "\ta\tb\n"
                         << "a b";
    QTest::newRow("only breaks") << "\r\n\t"
                                 << "";
}

void tst_LineEdits::autoTrimOnEditingFinished()
{
    QFETCH(QString, pasted);
    ZuAutoTrimLineEdit edit;
    QApplication::clipboard()->setText(pasted);
    QTest::keyClick(&edit, Qt::Key_V, Qt::ControlModifier);
    QCOMPARE(edit.text(), pasted); // untouched while the user edits
    QTest::keyClick(&edit, Qt::Key_Return);
    QTEST(edit.text(), "cleaned");
    QCOMPARE(edit.cursorPosition(), edit.text().length());
}

void tst_LineEdits::sizedToSampleOrText()
{
    ZuLineEdit edit;
    edit.setTextForMinimumSize(QStringLiteral("0000"));
    const QFontMetrics metrics(edit.font());
    const int lineHeight = QLineEdit().minimumSizeHint().height();
    QCOMPARE(edit.minimumSizeHint(), QSize(metrics.horizontalAdvance("0000"), lineHeight));
    QCOMPARE(edit.sizeHint(), edit.minimumSizeHint());
    QTest::keyClicks(&edit, "00000000");
    QCOMPARE(edit.minimumSizeHint().width(), metrics.horizontalAdvance("00000000"));
    QCOMPARE(edit.sizeHint().width(), metrics.horizontalAdvance("00000000"));
}

QTEST_MAIN(tst_LineEdits)
#include "tst_lineedits.moc"
