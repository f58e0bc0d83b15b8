// Prints what ZuBase::getHardwareType reads, one text per line, for tests that place this
// program and a DMI tool together in an application directory of their choice.
#include "zubase/Hardware.h"

#include <QCoreApplication>

#include <cstdio>

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    QString product;
    QString serial;
    QString bios;
    ZuBase::getHardwareType(product, serial, bios);
    std::printf("%s\n%s\n%s\n", qPrintable(product), qPrintable(serial), qPrintable(bios));
    return 0;
}
