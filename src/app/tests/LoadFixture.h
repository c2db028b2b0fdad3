#pragma once

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "app/SceneLoader.h"
#include "interaction/tests/InteractionFixture.h"
#include "records/RecordTables.h"
#include "records/tests/SceneFileFixture.h"
#include "scene/StaticBody.h"

/// A scene with observers and no panes, and a folder with scene files and a model for them.
struct LoadWorld
{
    LoadWorld()
    {
        RegisterInteractionAttributes();
        document.texts.known[6221] = L"free|fixed|Fixed_to_Object|heading|smooth|look at|position|along x|along y";
        document.paths.objects = folder.Inner("objects/advanced");
        document.paths.customer = folder.Inner("customer");
        folder.Write("objects/advanced/Cars/$Sedan/Sedan.dae", "a model");
        scene = std::make_unique<VtCScene3D>(document);
        observers = new VtC3DObservers(document, interaction, clock, folder.path / "defaults.ini");
        scene->SetObservers(observers);
        observers->CreateFreeObservers();
        RegisterSceneRecords(builders);
        RegisterObserverRecords(builders, *observers);
    }
    ~LoadWorld() { End(); }
    LoadWorld(const LoadWorld&) = delete;
    LoadWorld& operator=(const LoadWorld&) = delete;

    void End()
    {
        if (!scene)
            return;
        scene->SetObservers(nullptr);
        observers->Release();
        scene.reset();
    }

    VtCSceneLoader Loader() { return {*scene, builders}; }

    bool Load(const std::string& objects)
    {
        return Loader().Load(folder.Write("scene.xml", scenefile::Scene(objects)));
    }

    std::string Saved()
    {
        EXPECT_TRUE(scene->SaveScene(folder.Inner("saved.xml"))) << base::Utf8(scene->GetFileError());
        return folder.Read("saved.xml");
    }

    VtCMovableBodies& Movables() const { return *scene->GetMovableBodies(0); }
    VtC3DMovableBody& Movable(const wchar_t* name) const { return *scene->FindMovableByName(name); }

    const scenefile::Folder folder;
    fake::SceneDocument document;
    fake::Clock clock;
    FakeInteraction interaction;
    std::unique_ptr<VtCScene3D> scene;
    VtC3DObservers* observers = nullptr;
    VtCRecordBuilders builders;
};

inline std::string BodyRecord(int type, const std::string& id, const std::string& more = {},
                              const std::string& file = "%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae")
{
    return scenefile::Object(type, id, "name of " + id, scenefile::Attribute("file_path", file) + more);
}

inline std::string ObserverRecord(const std::string& id, const std::string& target, const std::string& more = {})
{
    using scenefile::Attribute;
    return scenefile::Object(5, id, "eye " + id,
                             Attribute("behaviour", "1", "int") + Attribute("attached_to", target) + more);
}
