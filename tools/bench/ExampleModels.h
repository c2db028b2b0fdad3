#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "records/SceneObjectStore.h"
#include "scene/SceneServices.h"
#include "tests/support/FakeScene.h"

/// The models of the example that lies beside the program, for the rows that build scenes of them.
namespace bench
{

using ModelList = std::vector<const char*>; ///< files below the example's library

std::filesystem::path ProgramFolder();

/// The folder of the bundled example. Throws when it is missing.
std::filesystem::path ExampleFolder();

/// Throws when the example has no such model.
std::filesystem::path ModelPath(const char* file);

/// A document whose models are the real ones, read by the program's own reader. One at a time.
class ModelDocument : public VtISceneDocument
{
public:
    /// `cached`: finished models are kept on the disk for as long as the program runs.
    ModelDocument(const ModelList& files, bool cached);
    ~ModelDocument() override;

    VtCScene3D* GetScene() const override { return scene; }
    void SetScene(VtCScene3D* newScene) override { scene = newScene; }
    void SetModified(bool) override {}
    VtTSceneServices& GetServices() override { return services; }

    /// One read of each model by a manager that has none.
    void ReadModels();

    fake::LibraryPaths paths;
    fake::MessageHandler messages;
    VtCSceneObjectStore store;
    fake::Texts texts;
    fake::ChannelSource channels;
    fake::Configuration configuration;
    VtTSceneServices services;
    VtCScene3D* scene = nullptr;
    std::vector<std::wstring> models; ///< in the inner form, in the order of the list
};

} // namespace bench
