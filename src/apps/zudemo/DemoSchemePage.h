#pragma once

#include <QWidget>

class QListWidget;
class ZuStyledWidget;

// The demo host's colour-scheme page: the schemes found in the scheme folder, a switch between
// them, and a gallery of standard widgets drawn in the scheme in force.
class DemoSchemePage : public QWidget
{
    Q_OBJECT
public:
    explicit DemoSchemePage(QWidget* inParent = nullptr);
    ~DemoSchemePage() override;

    // The shipped schemes: $ZUBASE_COLORSCHEMES, the installed data folder next to the
    // program, or the source tree's share/colorschemes.
    static QString schemeFolder();
    // Reads the scheme folder once per process; returns the number of schemes known.
    static int loadSchemes();
    // A window full of standard widgets (check boxes, radios, buttons, tabs, tree, ...).
    static QWidget* createGallery(QWidget* inParent);

private:
    void selectScheme(const QString& inName);

    QListWidget* mSchemeList = nullptr;
};
