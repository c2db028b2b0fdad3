#include "scene/MovableBody.h"

#include "base/Maths.h"
#include "base/Text.h"
#include "host/Messages.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/LibraryPath.h"
#include "scene/MovableBodies.h"
#include "scene/SceneObjects.h"
#include "scene/SceneServices.h"

#include <algorithm>
#include <optional>

#include <osg/Quat>

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace
{

constexpr std::uint32_t textUnconnected = 6239;

/// Opens the matrix of any transform to be written in place: a copy through `setMatrix` costs half as much again as
/// everything else that a frame does to a body.
class OpenTransform : public osg::MatrixTransform
{
public:
    static double* Open(osg::MatrixTransform& node) { return (node.*&OpenTransform::_matrix).ptr(); }

    static void Close(osg::MatrixTransform& node)
    {
        // Written only where it changes: both are so already in a steady run, and lie in lines of their own.
        if (bool& stale = node.*&OpenTransform::_inverseDirty; !stale)
            stale = true;
        if (node.*&OpenTransform::_boundingSphereComputed)
            node.dirtyBound();
    }
};

// Both forms add in the order of the scene graph library's product and leave out only products with the zeros of the
// placement's last column, so their results are equal to its own. They are for affine maps.

#if defined(__x86_64__)
__attribute__((target("avx"))) void MoveWide(VtTBodyMotion& motion, const float* values)
{
    __m128 row0 = _mm_loadu_ps(values);
    __m128 row1 = _mm_loadu_ps(values + 4);
    __m128 row2 = _mm_loadu_ps(values + 8);
    __m128 row3 = _mm_loadu_ps(values + 12);
    _MM_TRANSPOSE4_PS(row0, row1, row2, row3);
    const __m256d last0 = _mm256_cvtps_pd(row0);
    const __m256d last1 = _mm256_cvtps_pd(row1);
    const __m256d last2 = _mm256_cvtps_pd(row2);
    const __m256d last3 = _mm256_blend_pd(_mm256_cvtps_pd(row3), _mm256_set1_pd(1.0), 8);
    double* last = motion.lastTransformMatrix.ptr();
    _mm256_storeu_pd(last, last0);
    _mm256_storeu_pd(last + 4, last1);
    _mm256_storeu_pd(last + 8, last2);
    _mm256_storeu_pd(last + 12, last3);

    const double* base = motion.base.data();
    double* placed = OpenTransform::Open(*motion.node);
    for (int row = 0; row < 4; ++row, base += 3, placed += 4)
    {
        const __m256d first = _mm256_add_pd(_mm256_mul_pd(_mm256_broadcast_sd(base), last0),
                                            _mm256_mul_pd(_mm256_broadcast_sd(base + 1), last1));
        const __m256d sum = _mm256_add_pd(first, _mm256_mul_pd(_mm256_broadcast_sd(base + 2), last2));
        _mm256_storeu_pd(placed, row == 3 ? _mm256_add_pd(sum, last3) : sum);
    }
    OpenTransform::Close(*motion.node);
}

const auto moveAffine = __builtin_cpu_supports("avx") ? MoveWide : MoveByColumnsPortable;
#else
constexpr auto moveAffine = MoveByColumnsPortable;
#endif

std::vector<float> RowsOf(const osg::Matrixd& matrix)
{
    return std::vector<float>(matrix.ptr(), matrix.ptr() + 16);
}

const std::vector<float>& IdentityMatrix()
{
    static const std::vector<float> rows = RowsOf(osg::Matrixd());
    return rows;
}

const std::vector<std::wstring>* CurrentChannels(const VtTSceneServices& services)
{
    return services.channels ? services.channels->GetCurrentChannels() : nullptr;
}

} // namespace

const VtCAttributeTable& VtC3DMovableBody::Attributes()
{
    using Self = VtC3DMovableBody;
    const VtTFloatTupel3 none{0, 0, 0};
    static const VtCAttributeTable table(
        objectTypeMovableBody,
        {IdentityRows(objectTypeMovableBody, NameRow()),
         {
             FilePathRow(),
             PlacementRow(attribute::position, &Self::center, axesOfScene, none,
                          "scene axes, metres: of the model in the body")
                 .ForParts(),
             PlacementRow(attribute::rotation, &Self::rotation, anglesOfMovableBodies, none,
                          "scene axes, degrees: of the model in the body")
                 .ForParts(),
             PlacementRow(attribute::scale, &Self::scale, percentOfModels, {1, 1, 1}, "scene axes, factors").ForParts(),
             KeptAttribute(attribute::center, none, "metres"),
             // The index stands before the name, so that a name that the data point knows wins.
             Attribute<Self>(
                 attribute::channelIndex, -1, [](Self& body, std::int32_t index) { body.ConnectChannel(index, {}); },
                 [](const Self& body)
                 { return body.isGrouped ? std::nullopt : std::optional(body.GetSimulationDataIndex()); },
                 "the channel's index, -1 for none")
                 .ForParts(),
             Attribute<Self>(
                 attribute::channelName, L"", &Self::TakeChannelName,
                 [](const Self& body)
                 { return body.isGrouped ? std::nullopt : std::optional(body.simulationDataStream); },
                 "the channel's name")
                 .ForParts(),
             Attribute<Self>(
                 attribute::insertTransformMatrix, IdentityMatrix(),
                 [](Self& body, const std::vector<float>& rows) { body.insertMatrix.set(rows.data()); },
                 [](const Self& body) { return RowsOf(body.insertMatrix); },
                 "of groups: scene axes, metres; row by row")
                 .Optional(),
             Attribute<Self>(
                 attribute::lastTransformMatrix, IdentityMatrix(),
                 [](Self& body, const std::vector<float>& rows) { body.SetTransform(osg::Matrixd(rows.data())); },
                 [](const Self& body) { return RowsOf(body.GetTransform()); },
                 "of the node, scene axes, metres; row by row; as of the last save")
                 .AtSave(),
         },
         AppearanceRows(),
         GroupRows(),
         {
             KeptAttribute(attribute::parentGroupId, L"", "of parts: the group").Optional(),
             KeptAttribute(attribute::clonedFrom, L"", "of clones: the body that they replay").Optional(),
             KeptAttribute(attribute::trackId, -1, "of clones: number of the track").Optional(),
         }});
    return table;
}

std::wstring_view VtC3DMovableBody::AttributeOf(osg::Vec3f VtC3DBody::*field) const
{
    using Self = VtC3DMovableBody;
    return field == &Self::center     ? attribute::position
           : field == &Self::rotation ? attribute::rotation
           : field == &Self::scale    ? attribute::scale
                                      : std::wstring_view();
}

VtC3DMovableBody::VtC3DMovableBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                                   const std::wstring& name, const std::wstring& path,
                                   const osg::Matrixd& insertTransform, bool inTree, osg::Node* model,
                                   const std::wstring& id, VtEBirth birth)
    : VtC3DBody(owningDocument, &parentObject, name, path, inTree, id)
{
    const VtCMovableBodies* collection = JoinParent();
    pool = collection ? collection->pool : std::make_shared<VtCMotionPool>();
    motion = &pool->Take();

    VtTSceneServices& services = GetServices();
    modelNode = model ? model : services.models.loadModel(path, true);
    const std::string description = model ? std::string() : services.models.getXmlAttributes(path);

    osg::ref_ptr<osg::MatrixTransform> transform = new osg::MatrixTransform;
    transform->addChild(modelNode);
    transform->setName(base::Utf8(name));
    transform->setDataVariance(osg::Object::DYNAMIC);
    if (parentNode)
        parentNode->addChild(transform);
    SetTransformNode(transform);
    BuildMaterialMaps();

    if (dynamic_cast<VtC3DMovableBody*>(&parentObject))
        attributeObject = services.store.GetObject(internalId);
    if (!attributeObject)
        MakeAttributeObject(description, objectTypeMovableBody, birth == VtEBirth::recordFollows);
    if (attributeObject)
        FillAttributes(insertTransform);
    PublishAttributes();
    if (!isGrouped)
        UpdateBaseTransform();
    if (birth == VtEBirth::complete)
        EnterScene();
}

VtC3DMovableBody::~VtC3DMovableBody()
{
    transformNode->setUserData(nullptr);
    while (transformNode->getNumParents() > 0)
        transformNode->getParent(0)->removeChild(transformNode);
    while (!parts.empty())
    {
        parts.front()->RemoveAttributeObject();
        parts.front()->Destroy();
    }
    pool->GiveBack(*motion);
}

VtCMovableBodies* VtC3DMovableBody::JoinParent()
{
    auto* group = dynamic_cast<VtC3DMovableBody*>(GetParent());
    auto* collection = dynamic_cast<VtCMovableBodies*>(group ? group->GetParent() : GetParent());
    if (group)
        group->parts.push_back(this);
    else if (collection)
        collection->bodies.push_back(this);
    if (collection)
        collection->motionsStale = true;
    return collection;
}

void VtC3DMovableBody::ParentChanged()
{
    VtC3DBody::ParentChanged();
    JoinParent();
}

void VtC3DMovableBody::SetTransformNode(osg::Group* node)
{
    VtC3DBody::SetTransformNode(node);
    motion->node = matrixNode;
}

void VtC3DMovableBody::ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child)
{
    std::erase_if(parts, [&](VtC3DMovableBody* part) { return part == &child; });
    if (auto* collection = dynamic_cast<VtCMovableBodies*>(GetParent()))
        collection->motionsStale = true;
}

void VtC3DMovableBody::FillAttributes(const osg::Matrixd& insertTransform)
{
    const std::int32_t* grouped = attributeObject->Find<std::int32_t>(attribute::isGrouped);
    if (grouped)
        isGrouped = *grouped != 0;

    // The description of a model calls it static unless somebody has made it for movable bodies.
    if (attributeObject->GetObjectType() != objectTypeMovableBody)
    {
        attributeObject->SetObjectType(objectTypeMovableBody);
        WriteAttribute(attribute::objectType, std::int32_t{objectTypeMovableBody});
        if (isGrouped)
        {
            matrixNode->setMatrix(osg::Matrixd());
            AddMissingAttribute(attribute::insertTransformMatrix);
            SetInsertMatrix(insertTransform);
        }
        else
        {
            AddMissingAttribute(attribute::channelName);
            AddMissingAttribute(attribute::channelIndex);
        }
        AddMissingAttribute(attribute::lastTransformMatrix);
        attributeObject->RemoveAttribute(attribute::parentObjectId);
    }

    AddMissingAttribute(attribute::center);
    WriteBack(attribute::name);
    WriteAttribute(attribute::internalId, internalId);
    WriteAttribute(attribute::filePath, ToPortablePath(GetFilePath(), GetServices().paths));
    for (const std::wstring_view placement : {attribute::position, attribute::scale, attribute::rotation})
        WriteBack(placement);
    AddMissingDyeAttributes();
    if (isGrouped)
        ExpandGroup();
}

void VtC3DMovableBody::UpdateBaseTransform()
{
    if (isGrouped)
        baseMatrix.makeIdentity();
    else
    {
        constexpr float quarterTurn = base::floatPi / 2;
        const osg::Quat aboutX(base::RadiansFromDegrees(rotation.x()) + quarterTurn, osg::Vec3d(1, 0, 0));
        const osg::Quat aboutY(base::RadiansFromDegrees(rotation.z()), osg::Vec3d(0, 1, 0));
        const osg::Quat aboutZ(base::RadiansFromDegrees(rotation.y()), osg::Vec3d(0, 0, 1));
        osg::Matrixd turn;
        turn.makeRotate(aboutZ * aboutY * aboutX);
        baseMatrix = osg::Matrixd::scale(scale.x() / 100.0, scale.y() / 100.0, scale.z() / 100.0) * turn;
        baseMatrix.setTrans(center);
    }
    ApplyTransform();
}

void VtC3DMovableBody::SetLastTransformMatrix(const osg::Matrixd& matrix)
{
    motion->lastTransformMatrix = matrix;
    motion->lastTransformMatrix(3, 3) = 1.0;
    ApplyTransform();
}

void VtC3DMovableBody::ApplyTransform()
{
    motion->SetBase(baseMatrix);
    if (isGrouped)
        SetTransform(baseMatrix * motion->lastTransformMatrix);
    else
        motion->MoveNode();
}

void VtC3DMovableBody::SetTransform(const osg::Matrixd& matrix)
{
    if (!isGrouped)
    {
        VtC3DBody::SetTransform(matrix);
        return;
    }
    for (VtC3DMovableBody* part : parts)
        part->SetTransform(part->groupChildMatrix * matrix);
}

void VtC3DMovableBody::StoreLastTransform()
{
    WriteBack(attribute::lastTransformMatrix);
    for (VtC3DMovableBody* part : parts)
        part->StoreLastTransform();
}

void VtC3DMovableBody::SetInsertMatrix(const osg::Matrixd& matrix)
{
    insertMatrix = matrix;
    WriteBack(attribute::insertTransformMatrix);
}

VtC3DMovableBody* VtC3DMovableBody::CloneIntoTrack(VtCMovableBodies& target, VtCTrack* clonesTrack,
                                                   std::int32_t trackNumber)
{
    if (!modelNode)
        return nullptr;

    const osg::ref_ptr<osg::Node> copy = GetServices().models.clone(modelNode);
    auto* clone = new VtC3DMovableBody(GetDocument(), target, GetName(), GetFilePath(), osg::Matrixd(),
                                       HasNavigatorItem(), copy, {}, VtEBirth::stepsFollow);
    clone->cloneSource = this;
    clone->track = clonesTrack;
    clone->SetScaleX(scale.x());
    clone->SetScaleY(scale.y());
    clone->SetScaleZ(scale.z());
    clone->SetRotationX(rotation.x());
    clone->SetRotationY(rotation.y());
    clone->SetRotationZ(rotation.z());
    clone->SetCenterX(center.x());
    clone->SetCenterY(center.y());
    clone->SetCenterZ(center.z());
    clone->ConnectChannel(motion->simulationDataIndex, {});

    if (clone->attributeObject && attributeObject)
    {
        for (const std::wstring_view name :
             {attribute::position, attribute::scale, attribute::rotation, attribute::channelName})
            if (const VtISceneAttribute* attribute = attributeObject->GetAttribute(name))
                clone->WriteAttribute(name, attribute->GetValue());
        clone->WriteAttribute(attribute::channelIndex, motion->simulationDataIndex);
        clone->WriteAttribute(attribute::clonedFrom, internalId);
        clone->WriteAttribute(attribute::trackId, trackNumber);
    }
    clone->EnterScene();
    return clone;
}

void VtC3DMovableBody::ConnectChannel(std::int32_t index, const std::wstring& stream)
{
    if (isGrouped)
        return;

    const VtTSceneServices& services = GetServices();
    motion->simulationDataIndex = index;
    if (!stream.empty())
        simulationDataStream = stream;
    else if (index == -1)
        simulationDataStream = services.texts.GetText(textUnconnected);
    else
        simulationDataStream = L"Body_" + std::to_wstring(index);
    UpdateConnectionState();

    if (!attributeObject && !IsLoading())
        return;
    const std::vector<std::wstring>* channels = CurrentChannels(services);
    if (channels && index >= 0 && static_cast<std::size_t>(index) < channels->size() &&
        !(*channels)[static_cast<std::size_t>(index)].empty())
        simulationDataStream = (*channels)[static_cast<std::size_t>(index)];
    WriteBack(attribute::channelIndex);
    WriteBack(attribute::channelName);
}

void VtC3DMovableBody::UpdateConnectionState()
{
    const std::vector<std::wstring>* channels = CurrentChannels(GetServices());
    const std::int32_t index = motion->simulationDataIndex;
    const bool offered = channels && index >= 0 && static_cast<std::size_t>(index) < channels->size();
    const std::int32_t former = connectionState;
    connectionState = index == -1 ? notConnected : offered ? connected : channelMissing;
    if (connectionState != former && IsInScene())
        GetSceneObjects()->Tell([this](VtISceneListener& listener) { listener.ConnectionStateChanged(*this); });
    for (VtC3DMovableBody* part : parts)
        part->UpdateConnectionState();
}

void VtC3DMovableBody::TakeChannelName(const std::wstring& name)
{
    if (name == attribute::notConnected)
    {
        ConnectChannel(-1, name);
        return;
    }
    if (const std::vector<std::wstring>* channels = CurrentChannels(GetServices()))
        if (const auto at = std::find(channels->begin(), channels->end(), name); at != channels->end())
        {
            ConnectChannel(static_cast<std::int32_t>(at - channels->begin()), name);
            return;
        }
    // The data don't know it: the body stays bound as it is, and keeps the name for data that do.
    if (!isGrouped)
        simulationDataStream = name;
}

void VtC3DMovableBody::FinishLoad(const std::wstring& id)
{
    RebindAttributes(id);
    AddMissingDyeAttributes();
    // The data may have the stored channel at another index.
    for (const std::wstring_view channel : {attribute::channelIndex, attribute::channelName})
        if (attributeObject && attributeObject->GetAttribute(channel))
            WriteBack(channel);
    EnterScene();
}

void MoveByColumnsPortable(VtTBodyMotion& motion, const float* values)
{
    double* last = motion.lastTransformMatrix.ptr();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            last[row * 4 + column] = values[column * 4 + row];
    last[15] = 1.0;

    const double* base = motion.base.data();
    double* placed = OpenTransform::Open(*motion.node);
    for (int row = 0; row < 4; ++row, base += 3, placed += 4)
        for (int column = 0; column < 4; ++column)
        {
            const double sum = base[0] * last[column] + base[1] * last[4 + column] + base[2] * last[8 + column];
            placed[column] = row == 3 ? sum + last[12 + column] : sum;
        }
    OpenTransform::Close(*motion.node);
}

void VtTBodyMotion::SetBase(const osg::Matrixd& matrix)
{
    double* to = base.data();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 3; ++column)
            *to++ = matrix(row, column);
}

void VtTBodyMotion::SetLastTransformColumns(const float* values)
{
    if (node && values[12] == 0.0F && values[13] == 0.0F && values[14] == 0.0F) [[likely]]
    {
        moveAffine(*this, values);
        return;
    }
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 4; ++column)
            lastTransformMatrix(row, column) = values[column * 4 + row];
    lastTransformMatrix(3, 3) = 1.0;
    MoveNode();
}

void VtTBodyMotion::MoveNode()
{
    if (!node)
        return;
    osg::Matrixd placement;
    const double* from = base.data();
    for (int row = 0; row < 4; ++row)
        for (int column = 0; column < 3; ++column)
            placement(row, column) = *from++;
    node->setMatrix(placement * lastTransformMatrix);
}

VtTBodyMotion& VtCMotionPool::Take()
{
    if (unused.empty())
    {
        blocks.push_back(std::make_unique<VtTBodyMotion[]>(blockSize));
        for (std::size_t i = blockSize; i > 0; --i)
            unused.push_back(&blocks.back()[i - 1]);
    }
    VtTBodyMotion& motion = *unused.back();
    unused.pop_back();
    motion = {};
    return motion;
}
