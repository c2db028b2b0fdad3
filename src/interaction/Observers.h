#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "scene/AbstractNavigatorObject.h"
#include "scene/SceneObjects.h"
#include "scene/SceneServices.h"

namespace host
{
class Clock;
}
class VtC3DMovableBody;
class VtC3DObserver;
class VtCRecordBuilders;
class VtIInteractionServices;
class VtISettingsReader;

/// The observers of a scene. Two of them, "Free1" and "Free2", can't be removed. All names are compared without regard
/// to case.
class VtC3DObservers : public VtCGlidePanelAbstractNavigatorObject, public VtISceneObservers, private VtISceneListener
{
public:
    /// `defaultsFile` holds the observers that a new model is given; it need not exist.
    VtC3DObservers(VtISceneDocument& owningDocument, VtIInteractionServices& interactionServices,
                   const host::Clock& hostClock, std::filesystem::path defaultsFile);

    std::wstring GetSectionFormat() const override { return L"OBSERVER_%d"; }

    /// Makes "Free1" and "Free2". Once, when the scene is built.
    void CreateFreeObservers();
    VtC3DObserver* GetFree1() const { return free1; }
    VtC3DObserver* GetFree2() const { return free2; }
    bool IsFreeObserver(const VtC3DObserver& observer) const { return &observer == free1 || &observer == free2; }

    /// An empty name becomes "Observer_%i" with the smallest free number from 1 up; an empty id a fresh one.
    VtC3DObserver& CreateObserver(const std::wstring& name, bool inTree, const std::wstring& id = {},
                                  VtEBirth birth = VtEBirth::complete);

    /// False when there is none of that name. A view that looks through it isn't switched.
    bool RemoveObserver(std::wstring_view name);

    /// Removes all but the free ones; their views switch to "Free1".
    void RemoveNonFreeObservers();

    /// Removes the observers that ride on `body`; their number.
    int RemoveObserversOfBody(const VtC3DMovableBody& body);

    VtC3DObserver* FindObserverByName(std::wstring_view name) const;
    std::vector<VtC3DObserver*> GetObservers() const;

    void UpdateObservers() override;
    void ClearFollowers() override;

    /// Has the user choose bodies for the observers whose body is missing. Nothing without a user.
    void ResolveTargets();

    const std::vector<std::wstring>& GetFollowModeNames() const { return followModeNames; }

    /// 0 when the name isn't in the list.
    std::int32_t GetFollowModeIndex(std::wstring_view name) const;

    /// Empty when out of range.
    std::wstring GetFollowModeName(std::int32_t index) const;

    /// Placement of the free observers from an older settings file.
    void LoadFreeObserverSettings(const VtISettingsReader& reader);

    /// Makes the default observers for a model of that file name ("Sedan.dae"); nothing without their file.
    void LoadDefaultObservers(const std::wstring& modelName);

    /// Default observers for each name of `movables` ("Sedan|Van") that is a body of the scene, riding on it. Says so
    /// when the scene has no bodies.
    void GenerateDefaultObservers(const std::wstring& movables);

    VtIInteractionServices& GetInteraction() const { return interaction; }
    const host::Clock& GetClock() const { return clock; }

protected:
    ~VtC3DObservers() override;

private:
    /// Of a body: observers that ride on it stay where they are, not connected.
    void ObjectRemoved(VtCGlidePanelAbstractNavigatorObject& object) override;

    VtC3DObserver* ChildAt(std::size_t index) const;
    void MakeNamesDistinct(const std::vector<VtC3DObserver*>& made);
    void LoadFreeObserver(VtC3DObserver* observer, int number, const VtISettingsReader& reader);

    VtIInteractionServices& interaction;
    const host::Clock& clock;
    std::filesystem::path defaultObservers;
    VtC3DObserver* free1 = nullptr;
    VtC3DObserver* free2 = nullptr;
    std::vector<std::wstring> followModeNames;
};

/// Tells the tables of this folder: observers.
void RegisterInteractionAttributes();

/// The builders of observers and default observers. `observers` outlives `builders`.
void RegisterObserverRecords(VtCRecordBuilders& builders, VtC3DObservers& observers);
