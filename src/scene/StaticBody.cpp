#include "scene/StaticBody.h"

#include "base/Text.h"
#include "host/LibraryPaths.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "scene/LibraryPath.h"
#include "scene/RoadSurface.h"
#include "scene/SceneServices.h"

namespace
{

// A model with the first three is a road.
constexpr std::wstring_view roadParameters[] = {
    L"basetexture",     L"decalMap",        L"batterTexture", L"roadSurfaceTexture", L"roadFrictionMapTexture",
    L"roadSurfaceTexX", L"roadSurfaceTexY",
};
constexpr std::size_t neededParameters = 3;

VtTAttributeRows RoadRows()
{
    VtTAttributeRows rows;
    for (const std::wstring_view parameter : roadParameters)
        rows.push_back(
            KeptAttribute(parameter, L"", "of road models: parameter of the shader, \"kind,type,value\"").Optional());
    return rows;
}

} // namespace

const VtCAttributeTable& VtC3DStaticBody::Attributes()
{
    using Self = VtC3DStaticBody;
    const VtTFloatTupel3 none{0, 0, 0};
    static const VtCAttributeTable table(
        objectTypeStaticBody,
        {IdentityRows(objectTypeStaticBody, NameRow()),
         {
             FilePathRow(),
             PlacementRow(attribute::scaleOrient, &Self::scaleOrientation, axesOfModels, none,
                          "scene axes, degrees: the axes of scaling; seen with the next change of the placement")
                 .ForParts(),
             PlacementRow(attribute::scale, &Self::scale, percentOfModels, {1, 1, 1}, "scene axes, factors").ForParts(),
             PlacementRow(attribute::center, &Self::center, axesOfModels, none,
                          "scene axes, metres: of turning and scaling"),
             PlacementRow(attribute::rotation, &Self::rotation, axesOfModels, none, "scene axes, degrees").ForParts(),
             PlacementRow(attribute::position, &Self::position, axesOfModels, none, "scene axes, metres").ForParts(),
         },
         AppearanceRows(),
         GroupRows(),
         {KeptAttribute(attribute::parentObjectId, L"", "the static body above it").Optional()},
         RoadRows()});
    return table;
}

std::wstring_view VtC3DStaticBody::AttributeOf(osg::Vec3f VtC3DBody::*field) const
{
    using Self = VtC3DStaticBody;
    return field == &Self::position   ? attribute::position
           : field == &Self::rotation ? attribute::rotation
           : field == &Self::center   ? attribute::center
           : field == &Self::scale    ? attribute::scale
                                      : attribute::scaleOrient;
}

void VtC3DStaticBody::OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                                         const VtTAttributeValue& value)
{
    VtC3DBody::OnAttributeChanged(objectId, attributeName, value);
    if (isGrouped && !Attributes().Find(attributeName))
        OnChildAttributeChanged(attributeName, value);
}

VtC3DStaticBody::VtC3DStaticBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                                 const std::wstring& name, const std::wstring& path,
                                 const osg::Matrixd& insertTransform, bool inTree, const std::wstring& id,
                                 VtEBirth birth)
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

    MakeAttributeObject(models.getXmlAttributes(path), objectTypeStaticBody, birth == VtEBirth::recordFollows);
    if (attributeObject)
        FillAttributes(insertTransform);
    PublishAttributes();
    if (birth == VtEBirth::complete)
        EnterScene();
}

void VtC3DStaticBody::ParentChanged()
{
    VtC3DBody::ParentChanged();
    const auto* above = dynamic_cast<VtC3DStaticBody*>(GetParent());
    if (above || (attributeObject && attributeObject->GetAttribute(attribute::parentObjectId)))
        WriteAttribute(attribute::parentObjectId, above ? above->GetInternalId() : std::wstring());
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
    WriteAttribute(attribute::objectType, std::int32_t{objectTypeStaticBody});
    WriteBack(attribute::name);
    WriteAttribute(attribute::filePath, ToPortablePath(GetFilePath(), GetServices().paths));
    AddMissingAttribute(attribute::center);
    WriteAttribute(attribute::position, TupelOf(translation));
    WriteAttribute(attribute::scale, TupelOf(factors));
    WriteAttribute(attribute::rotation, TupelOf(EulerAngles(turn)));
    WriteAttribute(attribute::scaleOrient, TupelOf(EulerAngles(scaleTurn)));
    if (const auto* above = dynamic_cast<VtC3DStaticBody*>(GetParent()))
        WriteAttribute(attribute::parentObjectId, above->GetInternalId());
    WriteAttribute(attribute::internalId, internalId);
    AddMissingDyeAttributes();
    if (const std::int32_t* grouped = attributeObject->Find<std::int32_t>(attribute::isGrouped))
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
    for (const std::wstring_view parameter : roadParameters)
        ApplyShaderAttribute(roadShaderName, std::wstring(parameter));
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
    UpdateBaseTransform();
    EnterScene();
}
