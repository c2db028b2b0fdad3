#pragma once

#include <cmath>
#include <string>

#include <gtest/gtest.h>
#include <osg/Geode>
#include <osg/Material>

#include "scene/MovableBody.h"
#include "scene/Scene3D.h"
#include "scene/StaticBody.h"
#include "tests/support/FakeScene.h"

/// A scene in a fake document, and the making of bodies in it.
class SceneFixture : public testing::Test
{
protected:
    VtC3DMovableBody& AddMovable(const std::wstring& name, const std::wstring& path = L"\\m\\car.dae")
    {
        return *new VtC3DMovableBody(document, *scene.GetMovableBodies(0), name, path, osg::Matrixd(), true, nullptr,
                                     {});
    }

    VtC3DStaticBody& AddStatic(const std::wstring& name, const std::wstring& path = L"\\m\\house.dae",
                               const osg::Matrixd& insertTransform = {})
    {
        return *new VtC3DStaticBody(document, *scene.GetStaticBodies(), name, path, insertTransform, true, {});
    }

    /// What an editor does: a write to the record.
    static void Write(VtC3DBody& body, const std::wstring& name, VtTAttributeValue value)
    {
        body.GetAttributeObject()->Write(name, std::move(value));
    }

    static std::wstring Stored(VtC3DBody& body, const std::wstring& name)
    {
        const VtISceneAttribute* attribute = body.GetAttributeObject()->GetAttribute(name);
        return attribute ? attribute->GetValueText() : L"missing";
    }

    /// Where the model's point ends up below the body's parent node.
    static osg::Vec3d Placed(const VtC3DBody& body, const osg::Vec3d& point) { return point * body.GetTransform(); }

    static const osg::Material& MaterialOf(osg::Node& model)
    {
        osg::Node* geode = model.asGroup()->getChild(0);
        return static_cast<const osg::Material&>(
            *geode->asGroup()->getChild(0)->getStateSet()->getAttribute(osg::StateAttribute::MATERIAL));
    }

    fake::SceneDocument document;
    VtCScene3D scene{document};
};

inline void ExpectNear(const osg::Vec3d& actual, const osg::Vec3d& expected, double tolerance = 1e-5)
{
    EXPECT_NEAR(actual.x(), expected.x(), tolerance);
    EXPECT_NEAR(actual.y(), expected.y(), tolerance);
    EXPECT_NEAR(actual.z(), expected.z(), tolerance);
}
