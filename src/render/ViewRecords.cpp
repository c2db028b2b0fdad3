// How the panes take the stored views and the stored layout of a scene file.
#include "records/RecordTables.h"
#include "render/ChildFrame.h"
#include "scene/RecordBuilders.h"

namespace
{

using Records = VtTRecordBuilder::Records;

void ApplyViews(VtCChildFrame& frame, VtCSceneLoad& load, const Records& records)
{
    for (const auto& record : records)
    {
        load.Describe(TextOf(*record, L"name"));
        frame.ApplyViewRecord(NumberOf(*record, L"view_pos", 0), *record, load.Needed(*record, L"internal_id"));
        load.Step();
    }
    frame.ActivateObserver();
}

} // namespace

void RegisterViewRecords(VtCRecordBuilders& builders, VtCChildFrame& frame)
{
    builders.Register({objectTypeView, phaseViews, false,
                       [&frame](VtCSceneLoad& load, const Records& records) { ApplyViews(frame, load, records); }});
    builders.Register({objectTypeWindowLayout, phaseLayout, false,
                       [&frame](VtCSceneLoad&, const Records& records)
                       {
                           if (!records.empty())
                               frame.ApplyLayoutRecord(TextOf(*records.back(), L"internal_id"));
                       }});
}
