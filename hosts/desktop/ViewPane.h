#pragma once

#include <QSurfaceFormat>
#include <QWidget>

#include "host/ViewWindows.h"

namespace desktop
{

class ViewArea;

/// The window of one pane: a native window of its own that the view's context draws to, with nothing of the toolkit in
/// it. It tells the view of its input, positions in device pixels.
class ViewPane : public QWidget, public host::PaneWindow
{
public:
    ViewPane(ViewArea& viewArea, int paneNumber);

    /// Pane 1 to 4.
    int GetNumber() const { return number; }

    /// The window takes this format, by becoming another one if it had another.
    void SetFormat(const QSurfaceFormat& format);

    /// Is there anything of it on the screen?
    bool CanBeSeen() const;

    host::Rectangle GetClientRectangle() const override;
    host::Rectangle GetRectangleInParent() const override { return place; }
    void SetRectangle(const host::Rectangle& rectangle) override;

    /// The toolkit must not draw here.
    QPaintEngine* paintEngine() const override { return nullptr; }

protected:
    bool event(QEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseDoubleClickEvent(QMouseEvent* event) override;
    void leaveEvent(QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void keyReleaseEvent(QKeyEvent* event) override;
    void focusOutEvent(QFocusEvent* event) override;
    void contextMenuEvent(QContextMenuEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    bool focusNextPrevChild(bool) override { return false; } // Tab is the view's

private:
    QPoint Pixels(const QPointF& position) const;
    bool TellKey(const QKeyEvent& event, bool down);

    ViewArea& area;
    int number;
    host::Rectangle place;
};

} // namespace desktop
