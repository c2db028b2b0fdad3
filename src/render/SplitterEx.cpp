#include "render/SplitterEx.h"

#include <algorithm>
#include <cmath>

#include "base/Ids.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "host/ViewWindows.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "render/PanoramicView.h"
#include "render/Viewer.h"
#include "scene/SceneServices.h"

namespace
{

constexpr std::uint32_t textFirstPane = 9010; // the names of the panes follow one another

struct Place
{
    int row;
    int column;
};

constexpr Place PlaceOf(int pane)
{
    return {(pane - 1) / 2, (pane - 1) % 2};
}

double Fraction(int part, int sum, double before)
{
    if (sum == 0)
        return before;
    const double ratio = static_cast<double>(part) / sum;
    return ratio < 0 || ratio > 1 ? 0.0 : ratio;
}

} // namespace

VtCSplitterEx::VtCSplitterEx(VtIViewFrame& viewFrame, host::SplitterWindow& splitterWindow)
    : frame(viewFrame), window(splitterWindow)
{
    const osg::ref_ptr<VtISceneObject> record = Attributes().MakeRecord();
    const std::wstring id = base::NewId();
    record->Write(attribute::internalId, id);
    frame.GetDocument().GetServices().store.AddObject(id, record.get());
    Listen(record.get(), id);

    const host::Rectangle client = window.GetClientRectangle();
    columns = {client.width / 2, client.width / 2};
    rows = {client.height / 2, client.height / 2};
    for (int pane = 1; pane <= 4; ++pane)
    {
        const Place place = PlaceOf(pane);
        auto view = std::make_unique<VtCPanoramicView>(frame, window.GetPane(place.row, place.column));
        view->setName(frame.GetDocument().GetServices().texts.GetText(textFirstPane + static_cast<unsigned>(pane - 1)));
        view->setViewPosition(pane);
        views[static_cast<std::size_t>(pane - 1)] = std::move(view);
    }
    LayOut();
    proportional = true;
}

VtCSplitterEx::~VtCSplitterEx()
{
    sink.Disconnect();
    frame.GetDocument().GetServices().store.RemoveObject(recordId);
}

const VtCAttributeTable& VtCSplitterEx::Attributes()
{
    using Self = VtCSplitterEx;
    static const VtCAttributeTable table(
        objectTypeWindowLayout,
        {IdentityRows(objectTypeWindowLayout, KeptAttribute(attribute::name, L"Window_Layout", "")),
         {Attribute<Self>(
             attribute::splitterPosition, std::vector<float>{0.5F, 0.5F}, &Self::TakePosition,
             [](const Self& self) {
                 return std::vector<float>{static_cast<float>(self.columnRatio0), static_cast<float>(self.rowRatio0)};
             },
             "fractions of the frame, from the left and from the top")}});
    return table;
}

void VtCSplitterEx::OnAttributeChanged(const std::wstring&, const std::wstring& attributeName,
                                       const VtTAttributeValue& value)
{
    Attributes().Take(*this, attributeName, value);
}

void VtCSplitterEx::OnRecordChanged()
{
    frame.GetDocument().SetModified(true);
}

void VtCSplitterEx::Listen(VtISceneObject* record, const std::wstring& id)
{
    sink.Connect(record);
    windowLayout = record;
    recordId = id;
}

VtCPanoramicView* VtCSplitterEx::getView(int pane) const
{
    return pane >= 1 && pane <= 4 ? views[static_cast<std::size_t>(pane - 1)].get() : nullptr;
}

void VtCSplitterEx::forEachView(const std::function<void(VtCPanoramicView&)>& visit) const
{
    for (const std::unique_ptr<VtCPanoramicView>& view : views)
        if (view)
            visit(*view);
}

void VtCSplitterEx::setLayout(std::int32_t newLayout)
{
    const host::Rectangle client = window.GetClientRectangle();
    const int w = client.width;
    const int h = client.height;
    switch (newLayout)
    {
    case layoutSingle:
    {
        const VtCBase3DView* active = frame.GetActiveView();
        if (!active || !getView(active->getViewPosition()))
            return;
        const Place place = PlaceOf(active->getViewPosition());
        rows = place.row == 0 ? Extent{h, 0} : Extent{0, h};
        columns = place.column == 0 ? Extent{w, 0} : Extent{0, w};
        break;
    }
    case layoutTwoColumns:
        rows = {h, 0};
        columns = {w / 2, w / 2};
        break;
    case layoutTwoRows:
        rows = {h / 2, h / 2};
        columns = {w, w};
        break;
    case layoutFour:
        rows = {h / 2, h / 2};
        columns = {w / 2, w / 2};
        break;
    default:
        return;
    }
    layout = newLayout;
    resizing = false;
    LayOut();
}

void VtCSplitterEx::setSplitterPosition(double x, double y)
{
    PlaceBars(x, y, false);
}

void VtCSplitterEx::PlaceBars(double x, double y, bool fromRecord)
{
    const host::Rectangle client = window.GetClientRectangle();
    if (client.width <= 0 || client.height <= 0)
    {
        resizing = true;
        return;
    }
    resizing = false;
    rows = {static_cast<int>(client.height * y), static_cast<int>(client.height * (1 - y))};
    columns = {static_cast<int>(client.width * x), static_cast<int>(client.width * (1 - x))};

    const auto leaveViewer = [this](std::initializer_list<int> panes)
    {
        for (int pane : panes)
            removeViewFromViewer(getView(pane)->getView());
    };
    const bool rowAlone = y == 0.0 || y == 1.0;
    if (x == 1.0 || x == 0.0)
    {
        const int kept = x == 1.0 ? 1 : 2; // the upper pane of the column that is kept
        const int gone = x == 1.0 ? 2 : 1;
        leaveViewer({gone, gone + 2});
        if (rowAlone)
            leaveViewer({y == 0.0 ? kept : kept + 2});
        layout = rowAlone ? layoutSingle : layoutTwoRows;
    }
    else
        layout = rowAlone ? layoutTwoColumns : layoutFour;
    LayOut(fromRecord);
}

void VtCSplitterEx::setPaneSizeFromActiveView(int width, int height)
{
    const VtCBase3DView* active = frame.GetActiveView();
    if (!active || !getView(active->getViewPosition()))
        return;
    const host::Rectangle client = window.GetClientRectangle();
    const Place place = PlaceOf(active->getViewPosition());
    const int restHeight = std::max(0, client.height - height);
    const int restWidth = std::max(0, client.width - width);
    rows = place.row == 0 ? Extent{height, restHeight} : Extent{restHeight, height};
    columns = place.column == 0 ? Extent{width, restWidth} : Extent{restWidth, width};
    LayOut();
}

void VtCSplitterEx::OnColumnBarMoved(int x)
{
    if (!canDragColumns())
        return;
    columns = {x, window.GetClientRectangle().width - x};
    resizing = false;
    LayOut();
}

void VtCSplitterEx::OnRowBarMoved(int y)
{
    if (!canDragRows())
        return;
    rows = {y, window.GetClientRectangle().height - y};
    resizing = false;
    LayOut();
}

void VtCSplitterEx::OnSize()
{
    const host::Rectangle client = window.GetClientRectangle();
    if (!proportional)
    {
        LayOut();
        return;
    }
    // Rounding must not creep into the ratios.
    const bool before = resizing;
    resizing = true;
    rows = {static_cast<int>(client.height * rowRatio0), static_cast<int>(client.height * rowRatio1)};
    columns = {static_cast<int>(client.width * columnRatio0), static_cast<int>(client.width * columnRatio1)};
    LayOut();
    resizing = before;
}

VtCSplitterEx::Extent VtCSplitterEx::Share(const Extent& wished, int available)
{
    if (available <= 0)
        return {0, 0};
    if (wished.first < minimumSize)
        return {0, available};
    const int first = std::min(wished.first, available);
    const int second = available - gap - first;
    return second < minimumSize ? Extent{available, 0} : Extent{first, second};
}

void VtCSplitterEx::LayOut(bool fromRecord)
{
    const host::Rectangle client = window.GetClientRectangle();
    const Extent width = Share(columns, client.width);
    const Extent height = Share(rows, client.height);
    const int secondX = width.first > 0 ? width.first + gap : 0;
    const int secondY = height.first > 0 ? height.first + gap : 0;
    for (int pane = 1; pane <= 4; ++pane)
    {
        const Place place = PlaceOf(pane);
        host::Rectangle rectangle;
        rectangle.x = place.column == 0 ? 0 : secondX;
        rectangle.y = place.row == 0 ? 0 : secondY;
        rectangle.width = place.column == 0 ? width.first : width.second;
        rectangle.height = place.row == 0 ? height.first : height.second;
        if (rectangle.width == 0 || rectangle.height == 0)
            rectangle.width = rectangle.height = 0;
        window.GetPane(place.row, place.column).SetRectangle(rectangle);
        if (VtCPanoramicView* view = getView(pane))
            view->OnSize();
    }
    if (resizing)
        return;
    UpdateRatios(width, height);
    if (!fromRecord)
        sink.WriteBack(windowLayout.get(), attribute::splitterPosition);
}

void VtCSplitterEx::UpdateRatios(const Extent& width, const Extent& height)
{
    const int sumX = width.first + width.second;
    const int sumY = height.first + height.second;
    columnRatio0 = Fraction(width.first, sumX, columnRatio0);
    columnRatio1 = Fraction(width.second, sumX, columnRatio1);
    rowRatio0 = Fraction(height.first, sumY, rowRatio0);
    rowRatio1 = Fraction(height.second, sumY, rowRatio1);
}

void VtCSplitterEx::ApplyLayoutRecord(const std::wstring& id)
{
    VtISceneObjectStore& store = frame.GetDocument().GetServices().store;
    const osg::ref_ptr<VtISceneObject> record = store.GetObject(id);
    if (!record)
        return;
    if (!base::EqualsNoCase(recordId, id))
        store.RemoveObject(recordId);
    Listen(record.get(), id);
    sink.Apply(windowLayout.get(), *record);
}

void VtCSplitterEx::TakePosition(const std::vector<float>& position)
{
    PlaceBars(position[0], position[1], true);
    // The ratios of whole pixels, gap included, would move the bars a little with every load and save.
    const host::Rectangle client = window.GetClientRectangle();
    const auto keep = [](double& first, double& second, double stored, int size)
    {
        constexpr int rounding = gap + 1;
        if (std::abs(first - stored) * size <= rounding)
        {
            first = stored;
            second = 1 - stored;
        }
    };
    keep(columnRatio0, columnRatio1, position[0], client.width);
    keep(rowRatio0, rowRatio1, position[1], client.height);
}
