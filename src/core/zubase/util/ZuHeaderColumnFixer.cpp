#include "zubase/ZuHeaderColumnFixer.h"

#include <QHeaderView>

class ZuHeaderColumnFixer::Private
{
public:
    int column = 0;
};

ZuHeaderColumnFixer::ZuHeaderColumnFixer(QHeaderView* inHeader, int inColumn)
    : QObject(inHeader), d(new Private)
{
    d->column = inColumn;
    if (inHeader)
        connect(inHeader, SIGNAL(sectionMoved(int, int, int)), this,
                SLOT(ensureColumnIsFix(int, int, int)));
}

ZuHeaderColumnFixer::~ZuHeaderColumnFixer() = default;

void ZuHeaderColumnFixer::ensureColumnIsFix(int logicalIndex, int oldVisualIndex,
                                            int newVisualIndex)
{
    auto* header = qobject_cast<QHeaderView*>(sender());
    if (!header)
        return;
    const int fixed = d->column;
    // Each corrective move raises sectionMoved() again and ends up in a branch that does
    // nothing, since the column is then back at its place.
    if (logicalIndex == fixed) {
        if (newVisualIndex != fixed)
            header->moveSection(newVisualIndex, fixed);
    } else if (newVisualIndex == fixed) {
        header->moveSection(fixed, oldVisualIndex);
    } else {
        // Dragged across the column: that shifted it by one. (A column the header does not
        // have is at -1, which moveSection() ignores.)
        const int shifted = header->visualIndex(fixed);
        if (shifted != fixed)
            header->moveSection(shifted, fixed);
    }
}
