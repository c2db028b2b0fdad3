#pragma once

#include <string>

#include <osg/ref_ptr>
#include <osg/Referenced>

#include "host/Graphics.h"
#include "interaction/MouseInput.h"
#include "records/SceneObject.h"
#include "render/Base3DView.h"

namespace host
{
class PaneWindow;
}
class VtCPanoramicView;

/// Tells which pane an `osgViewer::View` belongs to.
class VtCOsgViewUserData : public osg::Referenced
{
public:
    explicit VtCOsgViewUserData(VtCPanoramicView& viewOwner) : owner(&viewOwner) {}

    VtCPanoramicView* owner; ///< not owned; null once the pane is gone
};

/// One of the four panes of a scene: a window with a view, an observer and a record.
///
/// Its input takes what the window tells: a press makes it the active view, a double click selects the body under the
/// pointer, or lets this view fill the frame.
class VtCPanoramicView : public VtCBase3DView, private IPropertyChangedCOMEvents, private VtIViewInputOwner
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
    VtCBaseMouseInput* getMouseInput() override { return &mouseInput; }
    void attachView(osgViewer::View* newView) override;

    /// "internal_id", "name", "observer", "track", "view_angle", "front_clip_plane", "back_clip_plane", "view_pos".
    VtISceneObject* getSceneObject() const { return sceneObject.get(); }

    /// Takes the values of a stored record.
    void ApplyAttributes(const VtISceneObject& record);

    /// Takes over the record that the store holds under `id`; nothing without one.
    void RebindAttributes(const std::wstring& id);

    /// Draws all views, when a scene is loaded and the view exists.
    void OnPaint();

    /// The window has another size. Without width or height the view leaves the viewer, and joins it again later.
    void OnSize();

private:
    bool TakesInput() const override;
    void OnPress() override;
    bool OnPointer() override;
    void OnDoubleClick(int x, int y) override;
    void AttributeChanged(const std::wstring& attribute, const VtTAttributeValue& value);
    void OnPropertyChanged(VtISceneObject& object, VtISceneAttribute& attribute) override;
    void Write(const wchar_t* attribute, VtTAttributeValue value);
    void Listen(VtISceneObject* record);

    host::PaneWindow& window;
    VtCViewInput mouseInput;
    host::Rectangle clientRect;
    bool writing = false; ///< its own writes don't come back to it
    osg::ref_ptr<VtISceneObject> sceneObject;
};
