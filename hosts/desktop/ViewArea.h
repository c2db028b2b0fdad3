#pragma once

#include <array>
#include <functional>

#include <QWidget>

#include "host/ViewWindows.h"

class VtCChildFrame;
class VtCPanoramicView;
class VtCSplitterEx;

namespace desktop
{

class ViewPane;

/// What the panes ask of the program around them. The main window implements it.
class ViewSurroundings
{
public:
    virtual ~ViewSurroundings() = default;

    /// The frame of the open scene's views; null while there is none.
    virtual VtCChildFrame* GetChildFrame() const = 0;

    /// The user drives the camera, so pictures must follow one another without a rest.
    virtual void SetFlying(bool flag) = 0;

    /// Opens the menu of a pane; the position is one on the screen.
    virtual void ShowPaneMenu(VtCPanoramicView& view, const QPoint& position) = 0;
};

/// The 2 by 2 grid of panes with the bars between them, which are dragged where the layout lets them.
///
/// All sizes it tells are device pixels.
class ViewArea : public QWidget, public host::SplitterWindow
{
public:
    explicit ViewArea(ViewSurroundings& programAround);

    /// Null while there are no views.
    VtCSplitterEx* GetSplitterEx() const;
    VtCPanoramicView* GetView(int pane) const;
    ViewPane& GetPaneWindow(int pane) const { return *panes[static_cast<std::size_t>(pane - 1)]; }

    void SetFlying(bool flag) { surroundings.SetFlying(flag); }
    void ShowMenu(int pane, const QPoint& position);

    /// Has the views drawn when the events that wait have been handled, once however many panes ask.
    void RequestPaint();

    host::Rectangle GetClientRectangle() const override;
    host::PaneWindow& GetPane(int row, int column) override;
    void Hide() override { hide(); }
    void ShowMaximised() override { show(); }

protected:
    void resizeEvent(QResizeEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;

private:
    struct Bars
    {
        bool columns = false; ///< the upright one
        bool rows = false;
    };

    Bars BarsAt(const QPointF& position) const;

    ViewSurroundings& surroundings;
    std::array<ViewPane*, 4> panes{}; ///< children
    Bars dragged;
    bool paintRequested = false;
};

} // namespace desktop
