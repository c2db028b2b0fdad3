#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <osg/ref_ptr>

#include "host/Graphics.h"
#include "records/AttributeTable.h"
#include "records/PGEventSink.h"
#include "records/SceneObject.h"

namespace host
{
class SplitterWindow;
}
class VtCPanoramicView;
class VtIViewFrame;

/// How the four panes share the frame.
enum VtEViewLayout : std::int32_t
{
    layoutSingle = 0,     ///< one pane
    layoutTwoColumns = 1, ///< panes 1 and 2
    layoutTwoRows = 2,    ///< panes 1 and 3
    layoutFour = 3,
};

/// The 2 by 2 grid of panes: 1 and 2 above, 3 and 4 below.
///
/// All four always exist; the layout decides which of them have a size. A row or column that would get fewer than 100
/// pixels collapses, and the other takes its room with the gap. The host places the windows and tells of drags of the
/// bars and of its own size.
class VtCSplitterEx : public VtIRecordOwner
{
public:
    static constexpr int minimumSize = 100; ///< pixels
    static constexpr int gap = 4;

    /// Makes the panes, with half the client size each. The window outlives this.
    VtCSplitterEx(VtIViewFrame& viewFrame, host::SplitterWindow& splitterWindow);
    virtual ~VtCSplitterEx();
    VtCSplitterEx(const VtCSplitterEx&) = delete;
    VtCSplitterEx& operator=(const VtCSplitterEx&) = delete;

    /// Pane 1 to 4; null for other numbers.
    VtCPanoramicView* getView(int pane) const;

    /// Calls `visit` with each of the four.
    void forEachView(const std::function<void(VtCPanoramicView&)>& visit) const;

    /// With `layoutSingle` the active view fills the frame; without an active view nothing changes.
    void setLayout(std::int32_t newLayout);
    std::int32_t getLayout() const { return layout; }

    /// Fractions of the frame, 0 to 1, from the left and from the top.
    void setSplitterPosition(double x, double y);

    /// Gives the pane of the active view this size in pixels, the other row and column the rest.
    void setPaneSizeFromActiveView(int width, int height);

    /// Fractions of the first column and the first row.
    std::array<double, 2> getFirstPaneRatios() const { return {columnRatio0, rowRatio0}; }

    /// Whether the user may drag the bar between the columns, and that between the rows.
    bool canDragColumns() const { return layout == layoutTwoColumns || layout == layoutFour; }
    bool canDragRows() const { return layout == layoutTwoRows || layout == layoutFour; }

    /// The user has dragged a bar to this place, in pixels from the left or the top. A bar that can't be dragged stays.
    void OnColumnBarMoved(int x);
    void OnRowBarMoved(int y);

    /// The window has another size: the panes keep their ratios.
    void OnSize();

    /// The record "Window_Layout" with "splitter_position".
    VtISceneObject* getWindowLayout() const { return windowLayout.get(); }

    /// What that record holds.
    static const VtCAttributeTable& Attributes();
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(); }
    const std::wstring& GetRecordId() const override { return recordId; }
    void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                            const VtTAttributeValue& value) override;
    void OnRecordChanged() override;

    /// Takes over the record that the store holds under `id`, and its splitter position.
    void ApplyLayoutRecord(const std::wstring& id);

    host::SplitterWindow& getWindow() const { return window; }

private:
    /// Sizes in pixels as wished for, of the first and the second row or column.
    struct Extent
    {
        int first = 0;
        int second = 0;
    };

    void LayOut(bool fromRecord = false);
    void UpdateRatios(const Extent& columns, const Extent& rows);
    void PlaceBars(double x, double y, bool fromRecord);
    void TakePosition(const std::vector<float>& position);
    void Listen(VtISceneObject* record, const std::wstring& id);
    static Extent Share(const Extent& wished, int available);

    VtIViewFrame& frame;
    host::SplitterWindow& window;
    std::array<std::unique_ptr<VtCPanoramicView>, 4> views;
    osg::ref_ptr<VtISceneObject> windowLayout;
    std::wstring recordId; ///< what the store holds it under
    VTIPGEventSink sink{*this};
    bool proportional = false;
    bool resizing = true;
    double columnRatio0 = 0.5;
    double columnRatio1 = 0.5;
    double rowRatio0 = 0.5;
    double rowRatio1 = 0.5;
    std::int32_t layout = layoutFour;
    Extent columns;
    Extent rows;
};
