#include "hosts/desktop/ViewPane.h"

#include <QContextMenuEvent>
#include <QMouseEvent>
#include <QWindow>

#include "hosts/desktop/ViewArea.h"
#include "render/PanoramicView.h"

namespace desktop
{

namespace
{

constexpr quint32 rightShiftSymbol = 0xFFE2; // the toolkit has one Shift, X has two

} // namespace

ViewPane::ViewPane(ViewArea& viewArea, int paneNumber) : QWidget(&viewArea), area(viewArea), number(paneNumber)
{
    setAttribute(Qt::WA_PaintOnScreen);
    setAttribute(Qt::WA_NoSystemBackground);
    setAttribute(Qt::WA_OpaquePaintEvent);
    setAttribute(Qt::WA_DontCreateNativeAncestors);
    setAttribute(Qt::WA_NativeWindow);
    setMouseTracking(true);
    setCursor(Qt::ArrowCursor); // not that of the bars
    setFocusPolicy(Qt::ClickFocus);
    setMinimumSize(0, 0);
    hide();
}

VtCPanoramicView* ViewPane::GetView() const
{
    return area.GetView(number);
}

void ViewPane::SetFormat(const QSurfaceFormat& format)
{
    winId();
    QWindow* window = windowHandle();
    if (!window || (window->surfaceType() == QSurface::OpenGLSurface && window->requestedFormat() == format))
        return;
    const bool shown = window->isVisible();
    window->destroy();
    window->setSurfaceType(QSurface::OpenGLSurface);
    window->setFormat(format);
    window->create();
    window->setVisible(shown);
}

bool ViewPane::CanBeSeen() const
{
    const QWindow* handle = windowHandle();
    return isVisible() && !window()->isMinimized() && handle && handle->isExposed() && place.width > 0 &&
           place.height > 0;
}

host::Rectangle ViewPane::GetClientRectangle() const
{
    return {0, 0, place.width, place.height};
}

void ViewPane::SetRectangle(const host::Rectangle& rectangle)
{
    place = rectangle;
    if (rectangle.width <= 0 || rectangle.height <= 0)
    {
        hide();
        return;
    }
    const double ratio = devicePixelRatioF();
    const auto logical = [ratio](int pixels) { return qRound(pixels / ratio); };
    setGeometry(logical(rectangle.x), logical(rectangle.y), logical(rectangle.width), logical(rectangle.height));
    show();
}

QPoint ViewPane::Pixels(const QPointF& position) const
{
    return (position * devicePixelRatioF()).toPoint();
}

bool ViewPane::event(QEvent* event)
{
    // Asked before the shortcuts of the main window are: the view's keys are never one of those.
    if (event->type() == QEvent::ShortcutOverride)
        if (const int key = static_cast<QKeyEvent*>(event)->key();
            key == Qt::Key_Tab || key == Qt::Key_Backtab || key == Qt::Key_Shift)
        {
            event->accept();
            return true;
        }
    return QWidget::event(event);
}

void ViewPane::mousePressEvent(QMouseEvent* event)
{
    VtCPanoramicView* view = GetView();
    if (!view)
        return;
    if (event->button() == Qt::LeftButton)
    {
        // A Shift that was pressed while another window had the keyboard.
        SetKey(VtEViewKey::shiftLeft,
               event->modifiers().testFlag(Qt::ShiftModifier) && !keyDown[static_cast<int>(VtEViewKey::shiftRight)]);
        pointerInside = true;
        area.SetFlying(true);
        const QPoint at = Pixels(event->position());
        view->OnLeftButtonDown(at.x(), at.y());
        area.update();
    }
    else if (event->button() == Qt::RightButton)
    {
        view->OnRightButtonDown();
        area.update();
    }
}

void ViewPane::mouseReleaseEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton)
        return;
    area.SetFlying(false);
    const QPoint at = Pixels(event->position());
    if (VtCPanoramicView* view = GetView())
        view->OnLeftButtonUp(at.x(), at.y());
}

void ViewPane::mouseMoveEvent(QMouseEvent* event)
{
    VtCPanoramicView* view = GetView();
    if (!view)
        return;
    // The toolkit goes on telling of a held pointer outside; for the view it has left.
    const bool inside = rect().contains(event->position().toPoint());
    if (pointerInside && !inside)
        view->OnMouseLeave();
    pointerInside = inside;
    const QPoint at = Pixels(event->position());
    if (inside)
        view->OnMouseMove(at.x(), at.y());
}

void ViewPane::mouseDoubleClickEvent(QMouseEvent* event)
{
    VtCPanoramicView* view = GetView();
    const QPoint at = Pixels(event->position());
    if (view && event->button() == Qt::LeftButton)
        view->OnLeftDoubleClick(at.x(), at.y());
    else
        mousePressEvent(event);
}

void ViewPane::leaveEvent(QEvent*)
{
    if (VtCPanoramicView* view = GetView())
        view->OnMouseLeave();
}

void ViewPane::keyPressEvent(QKeyEvent* event)
{
    if (!TellKey(*event, true))
        QWidget::keyPressEvent(event);
}

void ViewPane::keyReleaseEvent(QKeyEvent* event)
{
    if (!TellKey(*event, false))
        QWidget::keyReleaseEvent(event);
}

bool ViewPane::TellKey(const QKeyEvent& event, bool down)
{
    const bool tab = event.key() == Qt::Key_Tab || event.key() == Qt::Key_Backtab;
    if (!tab && event.key() != Qt::Key_Shift)
        return false;
    if (!event.isAutoRepeat())
        SetKey(tab                                            ? VtEViewKey::tab
               : event.nativeVirtualKey() == rightShiftSymbol ? VtEViewKey::shiftRight
                                                              : VtEViewKey::shiftLeft,
               down);
    return true;
}

void ViewPane::SetKey(VtEViewKey key, bool down)
{
    bool& known = keyDown[static_cast<int>(key)];
    if (known == down)
        return;
    known = down;
    if (VtCPanoramicView* view = GetView())
        view->OnKey(key, down);
}

void ViewPane::ReleaseKeys()
{
    for (const VtEViewKey key : {VtEViewKey::tab, VtEViewKey::shiftLeft, VtEViewKey::shiftRight})
        SetKey(key, false);
}

void ViewPane::focusOutEvent(QFocusEvent*)
{
    // Whoever has the keyboard now hears of the release; the view would keep the key held.
    ReleaseKeys();
}

void ViewPane::contextMenuEvent(QContextMenuEvent* event)
{
    const bool fromKeyboard = event->reason() == QContextMenuEvent::Keyboard;
    area.ShowMenu(number, fromKeyboard ? mapToGlobal(rect().center()) : event->globalPos());
}

void ViewPane::paintEvent(QPaintEvent*)
{
    area.RequestPaint();
}

} // namespace desktop
