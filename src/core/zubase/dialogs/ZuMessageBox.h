#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

class QLabel;

// The message box of the product: stays on top, keeps its text from growing wider than half
// the work area (at most 1000 pixels), closes the splash screen and shows the arrow cursor
// while it runs. The static functions replace those of QMessageBox; the forms without a parent
// use the default parent and the application name as title.
class ZUBASE_EXPORT ZuMessageBox : public ZuTopLevelWidgetWrapper<QMessageBox>
{
    Q_OBJECT
public:
    explicit ZuMessageBox(QWidget* inParent = nullptr);
    ~ZuMessageBox() override;

    void setVisible(bool inVisible) override;
    // Closes the application's splash screen first and shows the arrow cursor meanwhile.
    int exec() override;
    // The label that shows the text; null when there is none.
    QLabel* findLabel() const;

    static StandardButton critical(QWidget* inParent, const QString& inTitle, const QString& inText,
                                   StandardButtons inButtons = Ok,
                                   StandardButton inDefaultButton = NoButton);
    static StandardButton critical(const QString& inText, StandardButtons inButtons = Ok,
                                   StandardButton inDefaultButton = NoButton);
    static StandardButton information(QWidget* inParent, const QString& inTitle,
                                      const QString& inText, StandardButtons inButtons = Ok,
                                      StandardButton inDefaultButton = NoButton);
    static StandardButton information(const QString& inText, StandardButtons inButtons = Ok,
                                      StandardButton inDefaultButton = NoButton);
    static StandardButton question(QWidget* inParent, const QString& inTitle, const QString& inText,
                                   StandardButtons inButtons = StandardButtons(Yes | No),
                                   StandardButton inDefaultButton = NoButton);
    static StandardButton question(const QString& inText,
                                   StandardButtons inButtons = StandardButtons(Yes | No),
                                   StandardButton inDefaultButton = NoButton);
    static StandardButton warning(QWidget* inParent, const QString& inTitle, const QString& inText,
                                  StandardButtons inButtons = Ok,
                                  StandardButton inDefaultButton = NoButton);
    static StandardButton warning(const QString& inText, StandardButtons inButtons = Ok,
                                  StandardButton inDefaultButton = NoButton);

    // Asks whether inFileName may be overwritten; true only for the Overwrite (Ok) button.
    static bool overwrite(QWidget* inParent, const QString& inFileName);
};
