#pragma once

#include <memory>
#include <string>

#include <osg/ref_ptr>

#include "host/Graphics.h"
#include "records/SceneObject.h"
#include "render/Base3DView.h"

namespace host
{
class PaneWindow;
}
namespace osg
{
class Node;
}
class VtC3DBody;
class VtCBaseMouseInput;

/// Keys that reach a view.
enum class VtEViewKey
{
    tab,
    shiftLeft, ///< also a Shift without a side
    shiftRight,
};

/// One of the four panes of a scene: a window with a view, an observer and a record.
///
/// The host tells of window events by the operations whose names begin with "On"; positions in pixels from the upper
/// left corner. They do nothing unless a scene is loaded and the view exists.
class VtCPanoramicView : public VtCBase3DView, private IPropertyChangedCOMEvents
{
public:
    /// The window outlives the view. The record goes into the document's store.
    VtCPanoramicView(VtIViewFrame& viewFrame, host::PaneWindow& paneWindow);
    ~VtCPanoramicView() override;

    void setName(const std::wstring& newName) override;
    void setViewPosition(std::int32_t position) override;

    /// Makes the `osgViewer::View` with its context for the window as it is now. Once, from the creation timer.
    void createOsgView();

    /// False when there is no scene or no such observer.
    bool assignObserverByName(const std::wstring& observerName);

    host::PaneWindow& getWindow() const { return window; }
    VtCBaseMouseInput* getMouseInput() const { return mouseInput.get(); }

    /// "internal_id", "name", "observer", "track", "view_angle", "front_clip_plane", "back_clip_plane", "view_pos".
    VtISceneObject* getSceneObject() const { return sceneObject.get(); }

    /// Takes the values of a stored record.
    void ApplyAttributes(const VtISceneObject& record);

    /// Takes over the record that the store holds under `id`; nothing without one.
    void RebindAttributes(const std::wstring& id);

    void OnLeftButtonDown(int x, int y);
    void OnLeftButtonUp(int x, int y);
    void OnRightButtonDown();
    void OnMouseMove(int x, int y);
    void OnMouseLeave();

    /// Selects the body under the pointer; a click on nothing lets this view fill the frame.
    void OnLeftDoubleClick(int x, int y);
    void OnKey(VtEViewKey key, bool down);
    void OnPaint();

    /// The window has another size. Without width or height the view leaves the viewer, and joins it again later.
    void OnSize();

private:
    bool TakesInput() const;
    double EventTime() const;
    int Upwards(int y) const;
    void QueueMouse(int eventType, int x, int y);
    VtC3DBody* Pick(int x, int y) const;
    void AttributeChanged(const std::wstring& attribute, const VtTAttributeValue& value);
    void OnPropertyChanged(VtISceneObject& object, VtISceneAttribute& attribute) override;
    void Write(const wchar_t* attribute, VtTAttributeValue value);
    void Listen(VtISceneObject* record);

    host::PaneWindow& window;
    std::unique_ptr<VtCBaseMouseInput> mouseInput;
    host::Rectangle clientRect;
    bool leftButtonDown = false;
    bool writing = false; ///< its own writes don't come back to it
    osg::ref_ptr<VtISceneObject> sceneObject;
};
