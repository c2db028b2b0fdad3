#include "scene/Body.h"

#include "base/Text.h"
#include "host/Messages.h"
#include "records/AttributeNames.h"
#include "records/SceneObjectStore.h"
#include "scene/BoundingBox.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"
#include "scene/UserData.h"

namespace
{

constexpr std::uint32_t messageBadDescription = 551; // %1 the model's path, %2 the reason

} // namespace

VtC3DBody::VtC3DBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject* parentObject,
                     const std::wstring& name, const std::wstring& path, bool inTree, const std::wstring& id)
    : VtCGlidePanelAbstractNavigatorObject(owningDocument, parentObject, name, inTree, id),
      dye(std::make_unique<VtCBodyDye>()),
      parentNode(NodeOf(parentObject)),
      filePath(path)
{
}

VtC3DBody::~VtC3DBody()
{
    // The node may outlive the body in somebody's hands; a pick must not find the body through it then.
    if (transformNode)
        transformNode->setUserData(nullptr);
}

osg::Group* VtC3DBody::NodeOf(VtCGlidePanelAbstractNavigatorObject* object)
{
    const auto* body = dynamic_cast<VtC3DBody*>(object);
    return body ? body->transformNode.get() : nullptr;
}

void VtC3DBody::SetTransformNode(osg::Group* node)
{
    transformNode = node;
    osg::Transform* transform = node ? node->asTransform() : nullptr;
    matrixNode = transform ? transform->asMatrixTransform() : nullptr;
    if (node)
        node->setUserData(new VtCOsgUserData(*this));
}

osg::Matrixd VtC3DBody::GetTransform() const
{
    return matrixNode ? matrixNode->getMatrix() : osg::Matrixd();
}

void VtC3DBody::SetTransform(const osg::Matrixd& matrix)
{
    if (matrixNode)
        matrixNode->setMatrix(matrix);
}

void VtC3DBody::ApplyTransform()
{
    SetTransform(osg::Matrixd::scale(scale.x() / 100.0, scale.y() / 100.0, scale.z() / 100.0) * baseMatrix);
}

void VtC3DBody::SetVisible(bool flag)
{
    if (!transformNode)
        return;
    ShowNode(flag);
    WriteBack(attribute::visible);
}

void VtC3DBody::ShowNode(bool flag)
{
    if (!transformNode)
        return;
    visible = flag;
    transformNode->setNodeMask(flag ? shownMask : 0);
}

void VtC3DBody::SetPlacement(osg::Vec3f VtC3DBody::*field, int axis, float value)
{
    if (!std::isfinite(value))
        return;
    (this->*field)[axis] = value;
    UpdateBaseTransform();
    WriteBack(AttributeOf(field));
}

void VtC3DBody::SetScaleOrientation(const osg::Vec3f& value)
{
    scaleOrientation = value;
    WriteBack(AttributeOf(&VtC3DBody::scaleOrientation));
}

void VtC3DBody::SetBoundingBoxVisible(bool flag)
{
    if (!transformNode)
        return;
    if (!boundingBoxNode)
        boundingBoxNode = MakeBoundingBox(*transformNode);
    if (!boundingBoxNode)
        return;
    const bool shown = transformNode->containsNode(boundingBoxNode);
    if (flag && !shown)
        transformNode->addChild(boundingBoxNode);
    else if (!flag && shown)
        transformNode->removeChild(boundingBoxNode);
}

void VtC3DBody::ReplaceModel(osg::Group* node)
{
    if (!node || !parentNode || !transformNode)
        return;
    parentNode->removeChild(transformNode);
    transformNode->setUserData(nullptr);
    SetTransformNode(node);
    parentNode->addChild(node);
    modelNode = node->getNumChildren() > 0 ? node->getChild(0) : nullptr;
    modelClone = nullptr;
    boundingBoxNode = nullptr; // it surrounded the old model
    cloneMaterials.clear();
    BuildMaterialMaps();
}

VtTAttributeRow VtC3DBody::FilePathRow()
{
    return KeptAttribute(attribute::filePath, L"", "the model, with the token of its library in front");
}

VtTAttributeRow VtC3DBody::PlacementRow(std::wstring_view name, osg::Vec3f VtC3DBody::*field, const VtTAxes& axes,
                                        const VtTFloatTupel3& defaultValue, std::string_view meaning)
{
    const auto take = [field, axes](VtC3DBody& body, const VtTFloatTupel3& stored)
    {
        body.*field = FieldFromRecord(axes, stored);
        // The scaling axes wait for the next change of another value.
        if (field != &VtC3DBody::scaleOrientation)
            body.UpdateBaseTransform();
    };
    const auto give = [field, axes](const VtC3DBody& body) { return RecordFromField(axes, body.*field); };
    return Attribute<VtC3DBody>(name, defaultValue, take, give, meaning);
}

VtTAttributeRows VtC3DBody::AppearanceRows()
{
    using Self = VtC3DBody;
    return {
        Attribute<Self>(attribute::visible, true, &Self::ShowNode, &Self::visible, "0 or 1"),
        Attribute<Self>(attribute::selectable, true, &Self::selectable, &Self::selectable, "0 or 1"),
        Attribute<Self>(attribute::fixedToWorld, false, &Self::fixedToWorld, &Self::fixedToWorld, "0 or 1"),
        Attribute<Self>(attribute::renderMode, VtERenderMode::Textured, &Self::TakeRenderMode, &Self::renderMode,
                        "0 Gouraud, 1 textured, 2 flat, 3 wire frame, 4 transparent"),
        Attribute<Self>(attribute::dyeColor, VtTIntTupel3{0, 0, 0}, &Self::TakeDyeColour, &Self::GiveDyeColour,
                        "red, green, blue, 0 to 255"),
        Attribute<Self>(
            attribute::dyeEnabled, false, &Self::TakeDyeEnabled,
            [](const Self& body) { return body.dye->enabled != 0; }, "0 or 1"),
        Attribute<Self>(attribute::transparency, 0.0F, &Self::TakeTransparency, &Self::transparency,
                        "0 opaque to 1 invisible; waits while the scene has a mode of its own"),
    };
}

VtTAttributeRows VtC3DBody::GroupRows()
{
    return {
        KeptAttribute(attribute::isGrouped, false, "0 or 1: the model consists of parts"),
        KeptAttribute(attribute::childCount, 0, "of groups: number of parts").Optional(),
        KeptAttribute(attribute::childIds, std::vector<std::wstring>(), "of groups: ids of the parts").Optional(),
    };
}

void VtC3DBody::ParentChanged()
{
    const osg::ref_ptr<osg::Group> above = NodeOf(GetParent());
    if (transformNode && parentNode)
        parentNode->removeChild(transformNode);
    if (transformNode && above)
        above->addChild(transformNode);
    parentNode = above;
}

void VtC3DBody::Destroy()
{
    LeaveScene();
    if (osg::Group* above = NodeOf(GetParent()); above && transformNode)
        above->removeChild(transformNode);
    DetachFromParent();
}

void VtC3DBody::MakeAttributeObject(const std::string& description, std::int32_t objectType, bool recordFollows)
{
    VtTSceneServices& services = GetServices();
    if (!description.empty())
    {
        VtTParsedObject parsed = services.store.ParseObject(base::Wide(description));
        attributeObject = parsed.object;
        if (!attributeObject)
            services.messages.ShowWarning(messageBadDescription, filePath, parsed.error);
    }
    if (!attributeObject && !recordFollows)
        attributeObject = services.store.MakeDefaultObject(objectType);
}

void VtC3DBody::AddMissingDyeAttributes()
{
    AddMissingAttribute(attribute::dyeEnabled);
    AddMissingAttribute(attribute::dyeColor);
}

bool VtC3DBody::IsOwnOrAncestorFile(const std::wstring& path) const
{
    const VtCGlidePanelAbstractNavigatorObject* object = this;
    for (; object; object = object->GetParent())
        if (const auto* body = dynamic_cast<const VtC3DBody*>(object); body && body->filePath == path)
            return true;
    return false;
}
