#pragma once

#include <optional>
#include <string>

#include <osg/ref_ptr>
#include <osg/Referenced>

#include "host/Graphics.h"
#include "interaction/MouseInput.h"
#include "records/AttributeTable.h"
#include "records/PGEventSink.h"
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
class VtCPanoramicView : public VtCBase3DView, public VtIRecordOwner, private VtIViewInputOwner
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

    VtISceneObject* getSceneObject() const { return sceneObject.get(); }

    /// What that record holds.
    static const VtCAttributeTable& Attributes();
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(); }
    const std::wstring& GetRecordId() const override { return recordId; }
    void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                            const VtTAttributeValue& value) override;
    void OnRecordChanged() override;

    /// Takes the values of a stored record.
    void ApplyAttributes(const VtISceneObject& record) { sink.Apply(sceneObject.get(), record); }

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
    void valueChanged(std::wstring_view attribute) override { sink.WriteBack(sceneObject.get(), attribute); }
    std::optional<std::wstring> GiveObserver() const;
    void Listen(VtISceneObject* record, const std::wstring& id);

    host::PaneWindow& window;
    VtCViewInput mouseInput;
    host::Rectangle clientRect;
    osg::ref_ptr<VtISceneObject> sceneObject;
    std::wstring recordId; ///< what the store holds it under
    VTIPGEventSink sink{*this};
};

/// Tells the tables of this folder: views and the window layout.
void RegisterViewAttributes();
