#include "scene/StaticBody.h"

#include "base/Text.h"
#include "host/LibraryPaths.h"
#include "records/RecordTables.h"
#include "scene/EulerAngles.h"
#include "scene/LibraryPath.h"
#include "scene/RoadSurface.h"
#include "scene/SceneServices.h"

namespace
{

VtTFloatTupel3 TupelOf(const osg::Vec3d& vector)
{
    return {static_cast<float>(vector.x()), static_cast<float>(vector.y()), static_cast<float>(vector.z())};
}

// A model with the first three is a road.
constexpr const wchar_t* roadParameters[] = {
    L"basetexture",     L"decalMap",        L"batterTexture", L"roadSurfaceTexture", L"roadFrictionMapTexture",
    L"roadSurfaceTexX", L"roadSurfaceTexY",
};
constexpr std::size_t neededParameters = 3;

} // namespace

VtC3DStaticBody::VtC3DStaticBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                                 const std::wstring& name, const std::wstring& path,
                                 const osg::Matrixd& insertTransform, bool inTree, const std::wstring& id,
                                 bool recordFollows)
    : VtC3DBody(owningDocument, &parentObject, name, path, inTree, id)
{
    VtIModelLibrary& models = GetServices().models;
    modelNode = models.loadModel(path, false);

    osg::ref_ptr<osg::MatrixTransform> transform = new osg::MatrixTransform(insertTransform);
    transform->addChild(modelNode);
    transform->setName(base::Utf8(name + L"_Transform"));
    SetTransformNode(transform);
    BuildMaterialMaps();
    if (parentNode)
        parentNode->addChild(transform);

    MakeAttributeObject(models.getXmlAttributes(path), objectTypeStaticBody, recordFollows);
    if (attributeObject)
        FillAttributes(insertTransform);
    PublishAttributes();
}

void VtC3DStaticBody::FillAttributes(const osg::Matrixd& insertTransform)
{
    osg::Vec3d translation;
    osg::Quat turn;
    osg::Vec3d factors;
    osg::Quat scaleTurn;
    insertTransform.decompose(translation, turn, factors, scaleTurn);
    scale = factors * 100.0;

    // A record of another type would come back as something else than a static body.
    attributeObject->SetObjectType(objectTypeStaticBody);
    WriteAttribute(L"object_type", std::int32_t{objectTypeStaticBody});
    WriteAttribute(L"name", GetName());
    WriteAttribute(L"file_path", ToPortablePath(GetFilePath(), GetServices().paths));
    AddMissingAttribute(L"floatTupel3", L"0.0 0.0 0.0", L"center");
    WriteAttribute(L"position", TupelOf(translation));
    WriteAttribute(L"scale", TupelOf(factors));
    WriteAttribute(L"rotation", TupelOf(EulerAngles(turn)));
    WriteAttribute(L"scale_orient", TupelOf(EulerAngles(scaleTurn)));
    if (const auto* above = dynamic_cast<VtC3DStaticBody*>(GetParent()))
        WriteAttribute(L"parent_object_id", above->GetInternalId());
    WriteAttribute(L"internal_id", internalId);
    AddMissingDyeAttributes();
    if (const std::int32_t* grouped = attributeObject->Find<std::int32_t>(L"is_grouped"))
        isGrouped = *grouped != 0;
    if (isGrouped)
        ExpandGroup();
    AssignShaders();
}

void VtC3DStaticBody::UpdateBaseTransform()
{
    // A stored record sets fifteen values one after another; its loader asks for the result at the end.
    if (IsLoading())
        return;
    const osg::Matrixd turn = osg::Matrixd::rotate(RotationFromEuler(rotation.x(), rotation.y(), rotation.z()));
    const osg::Matrixd scaleTurn =
        osg::Matrixd::rotate(RotationFromEuler(scaleOrientation.x(), scaleOrientation.y(), scaleOrientation.z()));
    const osg::Matrixd toCenter = osg::Matrixd::translate(center);
    SetTransform(osg::Matrixd::inverse(toCenter) * osg::Matrixd::inverse(scaleTurn) *
                 osg::Matrixd::scale(scale.x() / 100.0, scale.y() / 100.0, scale.z() / 100.0) * scaleTurn * turn *
                 toCenter * osg::Matrixd::translate(position));
}

void VtC3DStaticBody::AssignShaders()
{
    for (std::size_t i = 0; i < neededParameters; ++i)
        if (!attributeObject || !attributeObject->GetAttribute(roadParameters[i]))
            return;

    VtTSceneServices& services = GetServices();
    AssignRoadSurface(*transformNode, services.models, services.paths.GetModuleDirectory());
    for (const wchar_t* parameter : roadParameters)
        ApplyShaderAttribute(roadShaderName, parameter);
}

void VtC3DStaticBody::ApplyShaderAttribute(const std::wstring& shaderName, const std::wstring& attributeName)
{
    const VtISceneAttribute* attribute = attributeObject ? attributeObject->GetAttribute(attributeName) : nullptr;
    if (!attribute)
        return;
    std::vector<std::wstring> fields = base::Split(attribute->GetValueText(), L',');
    std::erase(fields, L"");
    fields.resize(3);
    GetServices().models.setShaderParameter(transformNode, fields[0], attributeName, fields[1], fields[2], shaderName);
}

void VtC3DStaticBody::FinishLoad(const std::wstring& id)
{
    RebindAttributes(id);
    AddMissingDyeAttributes();
}
