#include "scene/Body.h"

#include "base/Text.h"
#include "host/Messages.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/BoundingBox.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"
#include "scene/UserData.h"

using namespace std::string_view_literals;

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
    visible = flag;
    transformNode->setNodeMask(flag ? shownMask : 0);
    WriteAttribute(L"visible", flag ? 1 : 0);
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

void VtC3DBody::OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                                   const VtTAttributeValue& value)
{
    const std::int32_t* flag = std::get_if<std::int32_t>(&value);
    if (flag && attributeName == L"selectable"sv)
        selectable = *flag > 0;
    else if (flag && attributeName == L"fixed_to_world"sv)
        fixedToWorld = *flag > 0;
    else if (flag && attributeName == L"visible"sv)
        SetVisible(*flag > 0);
    else
        VtCGlidePanelAbstractNavigatorObject::OnAttributeChanged(objectId, attributeName, value);
}

void VtC3DBody::Destroy()
{
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
    AddMissingAttribute(L"int", L"0", L"dye_enabled");
    AddMissingAttribute(L"intTupel3", L"0 0 0", L"dye_color");
}

bool VtC3DBody::IsOwnOrAncestorFile(const std::wstring& path) const
{
    const VtCGlidePanelAbstractNavigatorObject* object = this;
    for (; object; object = object->GetParent())
        if (const auto* body = dynamic_cast<const VtC3DBody*>(object); body && body->filePath == path)
            return true;
    return false;
}
