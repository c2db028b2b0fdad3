#include "hosts/desktop/ViewPane.h"

#include <QContextMenuEvent>
#include <QMouseEvent>
#include <QWindow>

#include "hosts/desktop/ViewArea.h"

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
    host::WindowEvents* input = GetEvents();
    if (!input)
        return;
    if (event->button() == Qt::LeftButton)
    {
        input->OnShiftState(event->modifiers().testFlag(Qt::ShiftModifier));
        area.SetFlying(true);
        const QPoint at = Pixels(event->position());
        input->OnLeftButtonDown(at.x(), at.y());
    }
    else if (event->button() == Qt::RightButton)
        input->OnRightButtonDown();
    area.update();
}

void ViewPane::mouseReleaseEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton)
        return;
    area.SetFlying(false);
    const QPoint at = Pixels(event->position());
    if (host::WindowEvents* input = GetEvents())
        input->OnLeftButtonUp(at.x(), at.y());
}

void ViewPane::mouseMoveEvent(QMouseEvent* event)
{
    const QPoint at = Pixels(event->position());
    if (host::WindowEvents* input = GetEvents())
        input->OnMouseMove(at.x(), at.y());
}

void ViewPane::mouseDoubleClickEvent(QMouseEvent* event)
{
    const QPoint at = Pixels(event->position());
    host::WindowEvents* input = GetEvents();
    if (input && event->button() == Qt::LeftButton)
        input->OnLeftDoubleClick(at.x(), at.y());
    else
        mousePressEvent(event);
}

void ViewPane::leaveEvent(QEvent*)
{
    if (host::WindowEvents* input = GetEvents())
        input->OnMouseLeave();
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
    if (host::WindowEvents* input = GetEvents(); input && !event.isAutoRepeat())
        input->OnKey(tab                                            ? host::ViewKey::tab
                     : event.nativeVirtualKey() == rightShiftSymbol ? host::ViewKey::shiftRight
                                                                    : host::ViewKey::shiftLeft,
                     down);
    return true;
}

void ViewPane::focusOutEvent(QFocusEvent*)
{
    if (host::WindowEvents* input = GetEvents())
        input->OnFocusLost();
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
