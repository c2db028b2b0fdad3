#include "interaction/Observers.h"

#include <algorithm>

#include "base/IniFile.h"
#include "base/Numbers.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "interaction/InteractionServices.h"
#include "interaction/Observer.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

constexpr std::uint32_t textFollowModes = 6221;
constexpr std::uint32_t messageNoBodies = 304;
constexpr std::size_t modelEndingLength = 4; // ".dae"

// The numbers of `text`, separated by blanks; what is missing or no number is 0.
template <std::size_t count>
std::array<double, count> Numbers(const std::wstring& text)
{
    std::array<double, count> numbers{};
    std::size_t used = 0;
    for (const std::wstring& field : base::Split(text, L' '))
        if (!field.empty() && used < count)
            numbers[used++] = base::ParseDouble(base::Utf8(field)).value_or(0.0);
    return numbers;
}

std::size_t TrailingHashes(const std::wstring& name)
{
    return name.size() - (name.find_last_not_of(L'#') + 1);
}

} // namespace

VtC3DObservers::VtC3DObservers(VtISceneDocument& owningDocument, VtIInteractionServices& interactionServices,
                               const host::Clock& hostClock, std::filesystem::path defaultsFile)
    : VtCGlidePanelAbstractNavigatorObject(owningDocument, nullptr, L"Observers", true, {}),
      interaction(interactionServices),
      clock(hostClock),
      defaultObservers(std::move(defaultsFile)),
      followModeNames(base::Split(owningDocument.GetServices().texts.GetText(textFollowModes), L'|'))
{
    if (VtCSceneObjects* objects = GetSceneObjects())
        objects->AddListener(*this);
}

VtC3DObservers::~VtC3DObservers()
{
    if (VtCSceneObjects* objects = GetSceneObjects())
        objects->RemoveListener(*this);
    LeaveScene();
}

void VtC3DObservers::CreateFreeObservers()
{
    const auto make = [this](const wchar_t* name)
    {
        auto* observer = new VtC3DObserver(GetDocument(), *this, name, true, true, {}, VtEBirth::stepsFollow);
        observer->SetFollowModeIndex(followFree);
        observer->EnterScene();
        return observer;
    };
    free1 = make(L"Free1");
    free2 = make(L"Free2");
}

VtC3DObserver& VtC3DObservers::CreateObserver(const std::wstring& name, bool inTree, const std::wstring& id,
                                              VtEBirth birth)
{
    std::wstring used = name;
    for (int number = 1; used.empty(); ++number)
        if (const std::wstring candidate = L"Observer_" + std::to_wstring(number); !FindObserverByName(candidate))
            used = candidate;
    auto* observer = new VtC3DObserver(GetDocument(), *this, used, inTree, false, id, birth);
    GetDocument().SetModified(true);
    return *observer;
}

VtC3DObserver* VtC3DObservers::ChildAt(std::size_t index) const
{
    return static_cast<VtC3DObserver*>(GetChildren()[index]); // only observers are made below the collection
}

std::vector<VtC3DObserver*> VtC3DObservers::GetObservers() const
{
    std::vector<VtC3DObserver*> observers;
    for (std::size_t i = 0; i < GetChildren().size(); ++i)
        observers.push_back(ChildAt(i));
    return observers;
}

VtC3DObserver* VtC3DObservers::FindObserverByName(std::wstring_view name) const
{
    for (std::size_t i = 0; i < GetChildren().size(); ++i)
        if (base::EqualsNoCase(ChildAt(i)->GetName(), name))
            return ChildAt(i);
    return nullptr;
}

bool VtC3DObservers::RemoveObserver(std::wstring_view name)
{
    VtC3DObserver* observer = FindObserverByName(name);
    if (!observer || IsFreeObserver(*observer))
        return false;
    RemoveChild(*observer);
    GetDocument().SetModified(true);
    return true;
}

void VtC3DObservers::RemoveNonFreeObservers()
{
    for (VtC3DObserver* observer : GetObservers())
    {
        if (IsFreeObserver(*observer))
            continue;
        if (free1)
            interaction.ReplaceObserverInViews(*observer, *free1);
        RemoveChild(*observer);
    }
}

int VtC3DObservers::RemoveObserversOfBody(const VtC3DMovableBody& body)
{
    std::vector<std::wstring> names;
    for (const VtC3DObserver* observer : GetObservers())
        if (observer->GetConnectedBody() == &body)
            names.push_back(observer->GetName());
    return static_cast<int>(
        std::count_if(names.begin(), names.end(), [this](const std::wstring& name) { return RemoveObserver(name); }));
}

void VtC3DObservers::UpdateObservers()
{
    for (std::size_t i = 0; i < GetChildren().size(); ++i)
        ChildAt(i)->Update();
}

void VtC3DObservers::ObjectRemoved(VtCGlidePanelAbstractNavigatorObject& object)
{
    for (VtC3DObserver* observer : GetObservers())
        if (observer->GetConnectedBody() == &object)
            observer->Disconnect();
}

void VtC3DObservers::ClearFollowers()
{
    for (std::size_t i = 0; i < GetChildren().size(); ++i)
        ChildAt(i)->ClearFollower();
}

std::int32_t VtC3DObservers::GetFollowModeIndex(std::wstring_view name) const
{
    for (std::size_t i = 0; i < followModeNames.size(); ++i)
        if (base::EqualsNoCase(followModeNames[i], name))
            return static_cast<std::int32_t>(i);
    return 0;
}

std::wstring VtC3DObservers::GetFollowModeName(std::int32_t index) const
{
    return index >= 0 && static_cast<std::size_t>(index) < followModeNames.size()
               ? followModeNames[static_cast<std::size_t>(index)]
               : std::wstring();
}

void VtC3DObservers::LoadFreeObserver(VtC3DObserver* observer, int number, const VtISettingsReader& reader)
{
    if (!observer)
        return;
    const std::wstring section = L"Scene Settings";
    const std::wstring suffix = L"FreeObserver" + std::to_wstring(number);
    std::wstring text;

    if (reader.ReadText(section, L"LastPosition" + suffix, text) == VtISettingsReader::found)
    {
        const std::array<double, 3> eye = Numbers<3>(text);
        observer->setPosition(osg::Vec3f(osg::Vec3d(eye[0], eye[1], eye[2])), true);
    }
    if (reader.ReadText(section, L"LastOrientation" + suffix, text) == VtISettingsReader::found)
    {
        const std::array<double, 4> q = Numbers<4>(text);
        const osg::Quat orientation(q[0], q[1], q[2], q[3]);
        const osg::Vec3d xAxis(1, 0, 0);
        observer->StoreFreeView(observer->GetPosition(),
                                osg::Quat(-osg::PI_2, xAxis) * orientation * osg::Quat(osg::PI_2, xAxis));
        observer->PushViewMatrix();
    }
}

void VtC3DObservers::LoadFreeObserverSettings(const VtISettingsReader& reader)
{
    LoadFreeObserver(free1, 1, reader);
    LoadFreeObserver(free2, 2, reader);
}

void VtC3DObservers::LoadDefaultObservers(const std::wstring& modelName)
{
    const std::unique_ptr<VtISettingsReader> reader = OpenSettings(defaultObservers);
    if (!reader)
        return;

    const std::wstring model = modelName.substr(0, modelName.size() - std::min(modelName.size(), modelEndingLength));
    std::vector<VtC3DObserver*> made;
    for (int number = 1, status = 0; status == VtISettingsReader::found; ++number)
    {
        VtC3DObserver& observer = CreateObserver({}, true, {}, VtEBirth::stepsFollow);
        status = observer.LoadSettings(L"OBSERVER_" + std::to_wstring(number), *reader);
        if (status != VtISettingsReader::found)
        {
            RemoveChild(observer);
            break;
        }
        observer.SetName(model + L" " + observer.GetName());
        made.push_back(&observer);
    }
    MakeNamesDistinct(made);
    for (VtC3DObserver* observer : made)
        observer->EnterScene();
}

void VtC3DObservers::MakeNamesDistinct(const std::vector<VtC3DObserver*>& made)
{
    const std::vector<VtC3DObserver*> all = GetObservers();
    const bool clash =
        std::any_of(made.begin(), made.end(),
                    [&](const VtC3DObserver* one)
                    {
                        return std::count_if(all.begin(), all.end(),
                                             [&](const VtC3DObserver* other)
                                             { return base::EqualsNoCase(other->GetName(), one->GetName()); }) > 1;
                    });
    if (!clash)
        return;
    std::size_t longest = 0;
    for (const VtC3DObserver* observer : all)
        longest = std::max(longest, TrailingHashes(observer->GetName()));
    for (VtC3DObserver* observer : made)
        observer->SetName(observer->GetName() + L" " + std::wstring(longest + 1, L'#'));
}

void VtC3DObservers::GenerateDefaultObservers(const std::wstring& movables)
{
    const VtCScene3D* scene = GetDocument().GetScene();
    const VtCMovableBodies* bodies = scene ? scene->GetMovableBodies(0) : nullptr;
    if (!bodies)
        return;
    if (bodies->GetChildren().empty())
    {
        GetServices().messages.ShowInformation(messageNoBodies);
        return;
    }
    for (const std::wstring& name : base::Split(movables, L'|'))
    {
        VtC3DMovableBody* body = scene->FindMovableByName(name);
        if (!body)
            continue;
        LoadDefaultObservers(name);
        for (VtC3DObserver* observer : GetObservers())
        {
            if (observer->IsValidConfiguration())
                continue;
            observer->SetConnectedBody(body);
        }
    }
}
