#pragma once

#include <filesystem>
#include <list>
#include <memory>
#include <unistd.h>

#include <gtest/gtest.h>
#include <osgViewer/View>

#include "interaction/CameraManipulator.h"
#include "interaction/InteractionServices.h"
#include "interaction/Observer.h"
#include "interaction/Observers.h"
#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "tests/support/FakeScene.h"

/// Answers as the application does, and remembers.
class FakeInteraction : public VtIInteractionServices
{
public:
    std::uint32_t GetMouseSensitivity() const override { return sensitivity; }
    bool IsActiveView(const osgViewer::View* view) const override { return view == activeView; }
    const VtC3DObserver* GetActiveObserver() const override { return activeObserver; }
    void SetHeadLightPosition(const osg::Vec3f& position) override
    {
        headLight = position;
        ++headLightMoves;
    }
    void ReplaceObserverInViews(const VtC3DObserver& gone, VtC3DObserver&) override
    {
        replaced.push_back(gone.GetName());
    }

    std::uint32_t sensitivity = 5;
    const osgViewer::View* activeView = nullptr;
    const VtC3DObserver* activeObserver = nullptr;
    osg::Vec3f headLight;
    int headLightMoves = 0;
    std::vector<std::wstring> replaced;
};

/// A scene with observers and one body, and views whose cameras have manipulators.
class InteractionFixture : public testing::Test
{
protected:
    InteractionFixture()
    {
        RegisterInteractionAttributes();
        document.texts.known[6221] = L"free|fixed|Fixed_to_Object|heading|smooth|look at|position|along x|along y";
        scene = std::make_unique<VtCScene3D>(document);
        observers = new VtC3DObservers(document, interaction, clock, defaultsFile);
        scene->SetObservers(observers);
        observers->CreateFreeObservers();
        car = &MakeBody(L"Car");
    }

    ~InteractionFixture() override
    {
        for (View& view : views)
            view.view->setCameraManipulator(nullptr);
        scene->SetObservers(nullptr);
        observers->Release();
        scene.reset();
    }

    struct View
    {
        osg::ref_ptr<osgViewer::View> view;
        osg::ref_ptr<VtCOsgCameramanipulator> manipulator;
    };

    VtC3DMovableBody& MakeBody(const wchar_t* name)
    {
        return *new VtC3DMovableBody(document, *scene->GetMovableBodies(0), name, L"", osg::Matrixd(), true, nullptr,
                                     {});
    }

    /// A view that looks through `observer`.
    View& Look(VtC3DObserver& observer)
    {
        View made{new osgViewer::View, new VtCOsgCameramanipulator(interaction)};
        made.view->setCameraManipulator(made.manipulator.get(), false);
        made.manipulator->setObserver(&observer, made.view.get());
        observer.AddCamera(made.view->getCamera());
        observer.SetAssigned(true);
        observer.PushViewMatrix();
        views.push_back(made);
        return views.back();
    }

    VtC3DObserver& Rider(VtEFollowMode mode, const wchar_t* name = L"Rider")
    {
        VtC3DObserver& observer = observers->CreateObserver(name, true);
        observer.SetFollowModeIndex(mode);
        if (FollowModeNeedsBody(mode))
            observer.SetConnectedBody(car);
        return observer;
    }

    fake::SceneDocument document;
    fake::Clock clock;
    FakeInteraction interaction;
    std::filesystem::path defaultsFile =
        std::filesystem::temp_directory_path() / ("panoramic_observers_" + std::to_string(getpid()) + ".ini");
    std::unique_ptr<VtCScene3D> scene;
    VtC3DObservers* observers = nullptr;
    VtC3DMovableBody* car = nullptr;
    std::list<View> views;
};
