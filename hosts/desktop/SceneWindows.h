#pragma once

#include <functional>
#include <string>

#include <QPointer>

#include "host/ViewWindows.h"

class QWidget;

namespace desktop
{

class ViewArea;
class ViewSurroundings;

/// Makes the window of a scene in the middle of the main window.
class SceneWindows : public host::ViewWindows
{
public:
    /// `place` shows the window of a scene it is given, null when it goes.
    SceneWindows(ViewSurroundings& programAround, std::function<void(ViewArea*)> placeArea);

    /// The grid of the scene that is open; null while there is none.
    ViewArea* GetArea() const;

    std::unique_ptr<host::ChildFrameWindow> MakeChildFrame() override;

    /// Refused: the main window with its panes is the only one that this program shows a scene in.
    host::OpenedWindow OpenWindow(const host::WindowRequest& request) override;

private:
    class Frame;

    ViewSurroundings& surroundings;
    std::function<void(ViewArea*)> place;
    QPointer<ViewArea> area;
};

} // namespace desktop
