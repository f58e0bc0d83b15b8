#pragma once

#include "zubase/zubase_export.h"

#include <QFrame>
#include <QIcon>

#include <memory>

// A frame with a header row (expander button, title, a widget of the caller's) and a content
// area that folds away. The widget fixes its own height (minimum = maximum) to what the header,
// or the header and the content, need, so that the layouts around it follow as it folds.
// The expander images ":/icons/ExpanderClosed" and ":/icons/ExpanderOpen" ("_dark" variants on
// a light Base colour) are resources of the host; they are chosen once, at construction.
class ZUBASE_EXPORT ZuCollapsibleWidget : public QFrame
{
    Q_OBJECT
public:
    ZuCollapsibleWidget(const QString& inTitle, QWidget* inParent);
    explicit ZuCollapsibleWidget(QWidget* inParent = nullptr);
    ~ZuCollapsibleWidget() override;

    void setTitle(const QString& inTitle);
    // Shown in the header row after the title; the previous one is taken out of the row only.
    void setHeaderWidget(QWidget* inWidget);
    // Null when none was set or it has been destroyed.
    QWidget* headerWidget() const;
    // The previous content widget is taken out of the content area only (neither deleted nor
    // hidden). Heights are not recomputed: follow with setExpanded() or setExpandedAnimated().
    void setContentWidget(QWidget* inWidget);
    // Null when none was set or it has been destroyed.
    QWidget* contentWidget() const;
    void setHeaderFrameShape(QFrame::Shape inShape);
    void setContentFrameShape(QFrame::Shape inShape);
    // In milliseconds, for the three height animations; 150 by default.
    void setAnimationDuration(int inMilliseconds);
    // When set, an expanded widget measures its content again on every resize (word-wrapped
    // text, flow layouts), unless an animation is running. Off by default.
    void setResizeContentDynamically(bool inDynamic);
    bool isExpanded() const;
    // The expander button's width plus the header's left margin: the indent that lines content
    // up with the title.
    int expanderButtonIndent() const;

public Q_SLOTS:
    // Opens or closes the content area at once.
    void setExpanded(bool expanded);
    // Opens or closes the content area with the height animations.
    void setExpandedAnimated(bool expanded);

private:
    void setupIcons();
    void setupAnimation();
    QIcon getExpanderIcon() const;
    void setExpandedState(bool inExpanded);
    void updateHeights();
    void updateAnimationValues();
    void resizeEvent(QResizeEvent* inEvent) override;

    class Private;
    std::unique_ptr<Private> const d;
};
