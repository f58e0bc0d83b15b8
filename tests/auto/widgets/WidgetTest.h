#pragma once

// Shared by the widget tests: a main() on the library's application object, and a count of the
// QObjects made minus destroyed (QtCore's object hooks, stable in Qt 5), to show that a widget
// leaves nothing behind.
#include "zubase/ZuApplication.h"

#include <QtTest>

extern Q_CORE_EXPORT quintptr qtHookData[];

class LiveObjects
{
public:
    LiveObjects() : mAdd(qtHookData[3]), mRemove(qtHookData[4])
    {
        count() = 0;
        qtHookData[3] = reinterpret_cast<quintptr>(+[](QObject*) { ++count(); });
        qtHookData[4] = reinterpret_cast<quintptr>(+[](QObject*) { --count(); });
    }
    ~LiveObjects() { qtHookData[3] = mAdd, qtHookData[4] = mRemove; }
    static int& count()
    {
        static int sCount = 0;
        return sCount;
    }

private:
    const quintptr mAdd, mRemove;
};

#define ZU_WIDGET_TEST_MAIN(TestClass)                                                             \
    int main(int argc, char** argv)                                                                \
    {                                                                                              \
        ZuApplication* application = ZuApplication::createInstance(argc, argv, nullptr);           \
        TestClass test;                                                                            \
        const int result = application ? QTest::qExec(&test, argc, argv) : 1;                      \
        delete application;                                                                        \
        return result;                                                                             \
    }
