#pragma once

#include "zubase/zubase_export.h"

#include <QObject>

#include <memory>

class QHeaderView;

// Keeps one column of a header at its place while the user drags sections: the column stays
// at the visual position equal to its logical index. Dragging it away puts it back; a section
// dropped onto its place goes back where it came from; a section dragged across it keeps its
// new place and the column moves back next to it.
class ZUBASE_EXPORT ZuHeaderColumnFixer : public QObject
{
    Q_OBJECT
public:
    // inHeader is also the parent; inColumn is the logical index of the fixed column.
    ZuHeaderColumnFixer(QHeaderView* inHeader, int inColumn);
    ~ZuHeaderColumnFixer() override;

public Q_SLOTS:
    // Connected to the header's sectionMoved(); acts only when called by that signal.
    void ensureColumnIsFix(int logicalIndex, int oldVisualIndex, int newVisualIndex);

private:
    class Private;
    std::unique_ptr<Private> const d;
};
