// How observers come from the records of a scene file, and what becomes of those whose body it doesn't hold.
#include <algorithm>

#include "base/Text.h"
#include "host/Questions.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/MovableBody.h"
#include "scene/ObjectHandle.h"
#include "scene/RecordBuilders.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

using Records = VtTRecordBuilder::Records;

void ApplyDefaultObservers(VtC3DObservers& observers, VtCSceneLoad& load, const Records& records)
{
    for (const auto& record : records)
    {
        const std::wstring id = TextOf(*record, L"internal_id");
        VtC3DObserver* observer = base::EqualsNoCase(id, L"Free1") ? observers.GetFree1() : observers.GetFree2();
        if (!observer)
            continue;
        observer->ApplyAttributes(*record);
        // The values bring the record's id with them; the observer keeps its own, and its own record alone.
        if (base::EqualsNoCase(id, observer->GetInternalId()))
            continue;
        if (const osg::ref_ptr<VtISceneObject> own = observer->GetAttributeObject())
            own->Write(L"internal_id", observer->GetInternalId());
        load.GetServices().store.RemoveObject(id);
    }
}

void BuildObservers(VtC3DObservers& observers, VtCSceneLoad& load, const Records& records)
{
    for (const auto& record : records)
    {
        // Copies for a track are made anew with it.
        if (NumberOf(*record, L"cloned", 0) == 1)
            continue;
        const std::wstring name = TextOf(*record, L"name");
        load.Describe(name);
        const std::wstring id = load.Needed(*record, L"internal_id");
        if (!base::EqualsNoCase(id, L"Free1") && !base::EqualsNoCase(id, L"Free2"))
        {
            VtC3DObserver& observer = observers.CreateObserver(name, true, id, VtEBirth::recordFollows);
            observer.ApplyAttributes(*record);
            observer.FinishLoad(id);
        }
        load.Step();
    }
}

/// Observers that ride on a body that the scene doesn't hold. While the user is asked, they may go.
struct MissingBody
{
    std::wstring name;
    std::vector<VtCObjectHandle<VtC3DObserver>> observers;
};

// Grouped by the name of the body without regard to case, in the order of the collection.
std::vector<MissingBody> MissingBodies(const VtC3DObservers& observers)
{
    std::vector<MissingBody> missing;
    for (VtC3DObserver* observer : observers.GetObservers())
    {
        const std::wstring name = observer->GetConnectedBodyName();
        if (observers.IsFreeObserver(*observer) || observer->GetConnectedBody() || name.empty())
            continue;
        auto at = std::find_if(missing.begin(), missing.end(),
                               [&](const MissingBody& body) { return base::EqualsNoCase(body.name, name); });
        if (at == missing.end())
            at = missing.insert(missing.end(), {name, {}});
        at->observers.push_back(observer);
    }
    return missing;
}

} // namespace

void RegisterObserverRecords(VtCRecordBuilders& builders, VtC3DObservers& observers)
{
    builders.Register({objectTypeDefaultObserver, phaseDefaultObservers, false,
                       [&observers](VtCSceneLoad& load, const Records& records)
                       { ApplyDefaultObservers(observers, load, records); }});
    builders.Register({objectTypeObserver, phaseObservers, false,
                       [&observers](VtCSceneLoad& load, const Records& records)
                       { BuildObservers(observers, load, records); }});
}

void VtC3DObservers::ResolveTargets()
{
    host::Questions* questions = GetServices().questions;
    const VtCScene3D* scene = GetDocument().GetScene();
    if (!questions || !scene)
        return;
    for (const MissingBody& missing : MissingBodies(*this))
    {
        std::vector<VtCObjectHandle<VtC3DMovableBody>> bodies;
        host::ReplacementQuestion question{missing.name, {}, {}};
        for (const auto& observer : missing.observers)
            if (observer)
                question.observers.push_back(observer.Get()->GetName());
        for (VtC3DMovableBody* body : scene->GetMovableBodies(0)->GetBodies())
        {
            bodies.emplace_back(body);
            question.candidates.push_back(body->GetName());
        }
        const std::optional<std::size_t> chosen = questions->AskReplacement(question);
        VtC3DMovableBody* body = chosen && *chosen < bodies.size() ? bodies[*chosen].Get() : nullptr;
        for (const auto& handle : missing.observers)
            if (VtC3DObserver* observer = handle.Get(); observer && body)
                observer->SetConnectedBody(body);
    }
}
