#pragma once

#include "zubase/zubase_export.h"

#include <QComboBox>

// A combo box of the user-interface languages the installation has translations for
// (<root>/share/translations/tessel_<code>.qm, English always), preselecting the stored
// language, else the system's (LC_ALL, LC_MESSAGES, LANG), else English. Each item's data
// (Qt::UserRole) is its two-letter code. It never stores on its own: the host calls
// saveToRegistry(language()) when the user confirms.
class ZUBASE_EXPORT PnLanguageSelector : public QComboBox
{
    Q_OBJECT
public:
    explicit PnLanguageSelector(QWidget* parent = nullptr);
    ~PnLanguageSelector() override;

    // The code of the current item; empty when there is none.
    QString language() const;
    // Makes the (last) item with this code current; an unknown code changes nothing.
    void setLanguage(const QString& inCode);

    // The code stored under "language" in the application settings; empty when absent.
    static QString loadFromRegistry();
    static void saveToRegistry(const QString& inCode);
};
