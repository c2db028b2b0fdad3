#include "hosts/desktop/ViewArea.h"

#include <cmath>

#include <QMouseEvent>
#include <QPainter>
#include <QTimer>

#include "hosts/desktop/ViewPane.h"
#include "render/ChildFrame.h"
#include "render/PanoramicView.h"

namespace desktop
{

namespace
{

constexpr double reach = 3.0; // device pixels beside a bar at which it is still caught
constexpr int markWidth = 2;  // of the active pane's mark

} // namespace

ViewArea::ViewArea(ViewSurroundings& programAround) : surroundings(programAround)
{
    setMouseTracking(true);
    setAttribute(Qt::WA_OpaquePaintEvent);
    for (std::size_t i = 0; i < panes.size(); ++i)
        panes[i] = new ViewPane(*this, static_cast<int>(i) + 1);
}

VtCSplitterEx* ViewArea::GetSplitterEx() const
{
    const VtCChildFrame* frame = surroundings.GetChildFrame();
    return frame ? &frame->getSplitter() : nullptr;
}

VtCPanoramicView* ViewArea::GetView(int pane) const
{
    const VtCSplitterEx* splitter = GetSplitterEx();
    return splitter ? splitter->getView(pane) : nullptr;
}

void ViewArea::ShowMenu(int pane, const QPoint& position)
{
    if (VtCPanoramicView* view = GetView(pane))
        surroundings.ShowPaneMenu(*view, position);
}

void ViewArea::RequestPaint()
{
    if (paintRequested)
        return;
    paintRequested = true;
    QTimer::singleShot(0, this,
                       [this]
                       {
                           paintRequested = false;
                           if (VtCPanoramicView* view = GetView(1))
                               view->OnPaint(); // draws all panes
                       });
}

host::Rectangle ViewArea::GetClientRectangle() const
{
    const double ratio = devicePixelRatioF();
    return {0, 0, static_cast<int>(width() * ratio), static_cast<int>(height() * ratio)};
}

host::PaneWindow& ViewArea::GetPane(int row, int column)
{
    return *panes[static_cast<std::size_t>(row * 2 + column)];
}

void ViewArea::resizeEvent(QResizeEvent*)
{
    if (VtCSplitterEx* splitter = GetSplitterEx())
        splitter->OnSize();
}

void ViewArea::paintEvent(QPaintEvent*)
{
    QPainter painter(this);
    painter.fillRect(rect(), palette().color(QPalette::Window));
    const VtCChildFrame* frame = surroundings.GetChildFrame();
    const VtCBase3DView* active = frame ? frame->GetActiveView() : nullptr;
    if (!active || active->getViewPosition() < 1 || active->getViewPosition() > 4)
        return;
    const ViewPane& pane = GetPaneWindow(active->getViewPosition());
    if (pane.isVisible())
        painter.fillRect(pane.geometry().adjusted(-markWidth, -markWidth, markWidth, markWidth),
                         palette().color(QPalette::Highlight));
}

ViewArea::Bars ViewArea::BarsAt(const QPointF& position) const
{
    const VtCSplitterEx* splitter = GetSplitterEx();
    if (!splitter)
        return {};
    const auto shown = [this](int pane) { return GetPaneWindow(pane).isVisible(); };
    const double ratio = devicePixelRatioF();
    const auto near = [ratio](double at, int paneStart)
    { return std::abs(at * ratio - (paneStart - VtCSplitterEx::gap / 2.0)) <= VtCSplitterEx::gap / 2.0 + reach; };

    Bars bars;
    for (const int pane : {2, 4})
        bars.columns = bars.columns || (shown(pane) && shown(pane - 1) && splitter->canDragColumns() &&
                                        near(position.x(), GetPaneWindow(pane).GetRectangleInParent().x));
    for (const int pane : {3, 4})
        bars.rows = bars.rows || (shown(pane) && shown(pane - 2) && splitter->canDragRows() &&
                                  near(position.y(), GetPaneWindow(pane).GetRectangleInParent().y));
    return bars;
}

void ViewArea::mousePressEvent(QMouseEvent* event)
{
    if (event->button() == Qt::LeftButton)
        dragged = BarsAt(event->position());
}

void ViewArea::mouseMoveEvent(QMouseEvent* event)
{
    const Bars bars = dragged.columns || dragged.rows ? dragged : BarsAt(event->position());
    setCursor(bars.columns && bars.rows ? Qt::SizeAllCursor
              : bars.columns            ? Qt::SplitHCursor
              : bars.rows               ? Qt::SplitVCursor
                                        : Qt::ArrowCursor);
    VtCSplitterEx* splitter = GetSplitterEx();
    if (!splitter || !event->buttons().testFlag(Qt::LeftButton))
        return;
    const QPoint at = (event->position() * devicePixelRatioF()).toPoint();
    if (dragged.columns)
        splitter->OnColumnBarMoved(at.x());
    if (dragged.rows)
        splitter->OnRowBarMoved(at.y());
    update();
}

void ViewArea::mouseReleaseEvent(QMouseEvent*)
{
    dragged = {};
}

} // namespace desktop
