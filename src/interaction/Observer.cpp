#include "interaction/Observer.h"

#include <algorithm>
#include <cstdio>

#include <osgViewer/View>

#include "base/IniFile.h"
#include "base/Maths.h"
#include "base/Numbers.h"
#include "base/Text.h"
#include "interaction/InteractionServices.h"
#include "interaction/Observers.h"
#include "records/AttributeNames.h"
#include "records/RecordTables.h"
#include "records/SceneObjectStore.h"
#include "scene/MovableBody.h"
#include "scene/Placement.h"
#include "scene/Scene3D.h"
#include "scene/SceneServices.h"

namespace
{

constexpr double quarterTurn = 1.5707963267948966;
const std::wstring fixedToBodyName = L"Fixed_to_Body";
const std::wstring fixedToObjectName = L"Fixed_to_Object";

const osg::Vec3d xAxis(1, 0, 0);
const osg::Vec3d yAxis(0, 1, 0);
const osg::Vec3d zAxis(0, 0, 1);

// The turn about the vertical from the x axis into `direction`; none when that has no horizontal part.
osg::Quat HeadTurn(const osg::Vec3d& direction)
{
    osg::Vec3d heading(direction.x(), direction.y(), 0);
    osg::Quat turn;
    if (heading.normalize() > 0)
        turn.makeRotate(xAxis, heading);
    return turn;
}

// The record's angles turn about axes that turn with each step: y, then the turned z, then the turned x.
osg::Quat RotationFromRecord(const VtTFloatTupel3& angles)
{
    const osg::Quat first((angles[2] - 90.0) * osg::PI / 180.0, yAxis);
    const osg::Quat second(-base::RadiansFromDegrees(angles[0]), first * zAxis);
    const osg::Quat third(base::RadiansFromDegrees(90.0 - angles[1]), second * (first * xAxis));
    return first * second * third;
}

// The inverse of it, from the rotation of the camera.
VtTFloatTupel3 RecordFromCameraRotation(const osg::Quat& cameraRotation)
{
    const osg::Vec3f angles = EulerAngles(cameraRotation);
    return {angles.y() + 0.0f, 90.0f - angles.x(), angles.z() + 90.0f}; // no "-0" in the file
}

// The rotation of the free view that has a camera of this rotation.
osg::Quat OrientationFromCamera(const osg::Quat& cameraRotation)
{
    return osg::Quat(quarterTurn, xAxis) * cameraRotation * osg::Quat(-quarterTurn, xAxis);
}

// From the rotation of the free view, against which the camera is turned by a quarter.
VtTFloatTupel3 RecordFromOrientation(const osg::Quat& orientation)
{
    return RecordFromCameraRotation(osg::Quat(-quarterTurn, xAxis) * orientation * osg::Quat(quarterTurn, xAxis));
}

} // namespace

VtC3DObserver::VtC3DObserver(VtISceneDocument& owningDocument, VtC3DObservers& parentCollection,
                             const std::wstring& name, bool inTree, bool freeByBirth, const std::wstring& id,
                             VtEBirth birth)
    : VtC3DBody(owningDocument, &parentCollection, name, {}, inTree, freeByBirth ? name : id),
      collection(parentCollection),
      isFreeByBirth(freeByBirth),
      followModeName(parentCollection.GetFollowModeName(followFixed)),
      follower(parentCollection.GetClock())
{
    Place({offsetTranslation, osg::Quat()});
    MakeRecord();
    PublishAttributes();
    if (birth == VtEBirth::complete)
        EnterScene();
}

VtC3DObserver::~VtC3DObserver()
{
    if (connectedBody)
        connectedBody->Release();
}

void VtC3DObserver::MakeRecord()
{
    attributeObject = GetAttributeTable().MakeRecord();
    WriteAttribute(attribute::internalId, GetInternalId());
    for (const std::wstring_view name : {attribute::name, attribute::translation, attribute::rotation})
        WriteBack(name);
    if (!isFreeByBirth)
        return;
    for (const std::wstring_view name : {attribute::position, attribute::orientation})
        GetAttributeTable().Take(*this, name, attributeObject->GetAttribute(name)->GetValue());
}

VtTAttributeRows VtC3DObserver::Rows(bool freeByBirth)
{
    using Self = VtC3DObserver;
    const VtTFloatTupel3 none{0, 0, 0};
    VtTAttributeRows rows = {
        // The mode first: whether the observer is free decides how the rest is taken.
        Attribute<Self>(
            attribute::behaviour, std::int32_t{freeByBirth ? followFree : followFixed},
            [](Self& self, std::int32_t mode) { self.ChangeFollowMode(mode, self.collection.GetFollowModeName(mode)); },
            &Self::followMode,
            "0 free, 1 fixed, 2 on a body, 3 its heading, 4 smooth, 5 looks at it, 6 its position, 7 its x, 8 its y"),
        Attribute<Self>(attribute::attachedTo, attribute::notConnected, &Self::TakeAttachedTo, &Self::GiveAttachedTo,
                        "name of a movable body"),
        Attribute<Self>(attribute::position, none, &Self::TakePosition, &Self::GivePosition,
                        "of a free observer: scene axes, metres"),
        Attribute<Self>(attribute::orientation, none, &Self::TakeOrientation, &Self::GiveOrientation,
                        "of a free observer: degrees about y, the turned z, the turned x"),
        Attribute<Self>(
            attribute::translation, none, &Self::TakeTranslation,
            [](const Self& self) { return TupelOf(self.offsetTranslation); }, "body axes or scene axes, metres"),
        Attribute<Self>(
            attribute::rotation, none, &Self::TakeRotation, [](const Self& self) { return TupelOf(self.offsetAngles); },
            "of the view, degrees about x, y, z"),
    };
    if (!freeByBirth)
        rows.push_back(KeptAttribute(attribute::cloned, false, "1: made by a track").Optional());
    return rows;
}

const VtCAttributeTable& VtC3DObserver::Attributes(bool freeByBirth)
{
    const auto name = []
    {
        return Attribute<VtC3DObserver>(attribute::name, L"", &VtC3DObserver::TakeName, &VtC3DObserver::GetName,
                                        "as the tree shows it");
    };
    static const VtCAttributeTable defaults(objectTypeDefaultObserver,
                                            {IdentityRows(objectTypeDefaultObserver, name()), Rows(true)},
                                            VtCAttributeTable::Names::anyCase);
    static const VtCAttributeTable others(objectTypeObserver, {IdentityRows(objectTypeObserver, name()), Rows(false)},
                                          VtCAttributeTable::Names::anyCase);
    return freeByBirth ? defaults : others;
}

void RegisterInteractionAttributes()
{
    RegisterAttributeTable(VtC3DObserver::Attributes(true));
    RegisterAttributeTable(VtC3DObserver::Attributes(false));
}

void VtC3DObserver::Update()
{
    if (cameras.empty() || !assigned)
        return;
    if (followMode == followFixed)
    {
        Place({offsetTranslation, osg::Quat()});
        // falls through to the rules that need a body: without one this is all
    }
    if (!connectedBody)
        return;

    const osg::Matrixd& body = connectedBody->GetLastTransformMatrix();
    const osg::Vec3d at = body.getTrans();
    switch (followMode)
    {
    case followRigid:
        Place(FollowRigid(body));
        break;
    case followHeading:
        Place(FollowHeading(body));
        break;
    case followSmooth:
    {
        Placement placement = FollowRigid(body);
        VtCFollowData current;
        current.position = placement.position;
        current.rotation = placement.rotation;
        VtCFollowData calmed;
        follower.Follow(current, calmed);
        placement.rotation = calmed.rotation;
        Place(placement);
        break;
    }
    case followLookAt:
        Place(LookAt(body));
        break;
    case followPosition:
        Place({osg::Vec3f(at + osg::Vec3d(offsetTranslation)), osg::Quat()});
        break;
    case followAlongX:
        Place({osg::Vec3f(at.x(), offsetTranslation.y(), at.z() + offsetTranslation.z()), osg::Quat()});
        break;
    case followAlongY:
        Place({osg::Vec3f(offsetTranslation.x(), at.y(), at.z() + offsetTranslation.z()), osg::Quat()});
        break;
    default:
        break;
    }
    if (collection.GetInteraction().GetActiveObserver() == this)
        collection.GetInteraction().SetHeadLightPosition(position);
}

VtC3DObserver::Placement VtC3DObserver::FollowRigid(const osg::Matrixd& body) const
{
    osg::Matrixd placed = body;
    placed.preMultTranslate(osg::Vec3d(offsetTranslation));
    return {osg::Vec3f(placed.getTrans()), placed.getRotate()};
}

VtC3DObserver::Placement VtC3DObserver::FollowHeading(const osg::Matrixd& body) const
{
    const osg::Quat heading = HeadTurn(body.getRotate() * xAxis);
    const osg::Matrixd placed = osg::Matrixd::translate(offsetTranslation) * osg::Matrixd::rotate(heading) *
                                osg::Matrixd::translate(body.getTrans());
    return {osg::Vec3f(placed.getTrans()), placed.getRotate()};
}

VtC3DObserver::Placement VtC3DObserver::LookAt(const osg::Matrixd& body) const
{
    const osg::Vec3f distance(body.getTrans() - osg::Vec3d(offsetTranslation));
    return {offsetTranslation, HeadTurn(distance)};
}

void VtC3DObserver::Place(const Placement& placement)
{
    // The head turn of looking at a body takes the place of the offset about z.
    const osg::Vec3f angles(offsetAngles.x(), offsetAngles.y(), followMode == followLookAt ? 0.0f : offsetAngles.z());
    const osg::Quat camera = CameraAxes(angles) * placement.rotation;
    position = placement.position;
    placedByRule = true;
    osg::Matrixd view = osg::Matrixd::rotate(camera.conj());
    view.preMultTranslate(-osg::Vec3d(position));
    setMatrix(view, true);
}

// Two quarter turns and a half one change from the axes of a body to those of a camera. They stay the same for many
// frames, and their sines cost more than the rest of the placement.
const osg::Quat& VtC3DObserver::CameraAxes(const osg::Vec3f& angles)
{
    if (!cameraAxes || axesAngles != angles)
    {
        cameraAxes =
            osg::Quat(base::RadiansFromDegrees(angles.x() + 90.0), zAxis, base::RadiansFromDegrees(angles.y() + 90.0),
                      yAxis, base::RadiansFromDegrees(angles.z() + 180.0), zAxis);
        axesAngles = angles;
    }
    return *cameraAxes;
}

void VtC3DObserver::setPosition(const osg::Vec3f& eye, bool update)
{
    position = eye;
    RebuildFreeView(update);
    WriteAttribute(attribute::position, TupelOf(eye));
}

void VtC3DObserver::setRotation(const osg::Quat& newOrientation, bool update)
{
    orientation = newOrientation;
    RebuildFreeView(update);
    WriteAttribute(attribute::orientation, RecordFromOrientation(orientation));
}

void VtC3DObserver::TakePosition(const VtTFloatTupel3& eye)
{
    position = VectorOf(eye);
    RebuildFreeView(true);
    if (collection.GetInteraction().GetActiveObserver() == this)
        collection.GetInteraction().SetHeadLightPosition(position);
}

void VtC3DObserver::TakeOrientation(const VtTFloatTupel3& angles)
{
    orientation = RotationFromRecord(angles);
    RebuildFreeView(true);
}

// The rules of the other modes place the eye in every frame, and that isn't stored.
std::optional<VtTFloatTupel3> VtC3DObserver::GivePosition() const
{
    return IsFree() ? std::optional(TupelOf(position)) : std::nullopt;
}

std::optional<VtTFloatTupel3> VtC3DObserver::GiveOrientation() const
{
    return IsFree() ? std::optional(RecordFromOrientation(orientation)) : std::nullopt;
}

void VtC3DObserver::RebuildFreeView(bool update)
{
    const osg::Matrixd axes(1, 0, 0, 0, 0, 0, -1, 0, 0, 1, 0, 0, 0, 0, 0, 1);
    const osg::Matrixd camera = axes * osg::Matrixd::rotate(orientation) * osg::Matrixd::rotate(quarterTurn, xAxis) *
                                osg::Matrixd::translate(position);
    placedByRule = false;
    setMatrix(osg::Matrixd::inverse(camera), update);
}

void VtC3DObserver::setMatrix(const osg::Matrixd& matrix, bool update)
{
    viewMatrix = matrix;
    if (update)
        PushViewMatrix();
}

void VtC3DObserver::StoreFreeView(const osg::Vec3f& eye, const osg::Quat& cameraRotation)
{
    position = eye;
    orientation = OrientationFromCamera(cameraRotation);
    RebuildFreeView(false);
    WriteAttribute(attribute::position, TupelOf(eye));
    WriteAttribute(attribute::orientation, RecordFromCameraRotation(cameraRotation));
}

void VtC3DObserver::PushViewMatrix()
{
    for (osg::Camera* camera : cameras)
        if (auto* view = dynamic_cast<osgViewer::View*>(camera->getView()))
            if (osgGA::CameraManipulator* manipulator = view->getCameraManipulator())
                manipulator->setByInverseMatrix(viewMatrix);
}

void VtC3DObserver::AddCamera(osg::Camera* camera)
{
    if (camera && !HasCamera(camera))
        cameras.push_back(camera);
}

void VtC3DObserver::RemoveCamera(osg::Camera* camera)
{
    std::erase(cameras, camera);
}

bool VtC3DObserver::HasCamera(const osg::Camera* camera) const
{
    return camera && std::find(cameras.begin(), cameras.end(), camera) != cameras.end();
}

void VtC3DObserver::SetName(const std::wstring& name)
{
    TakeName(name);
    WriteBack(attribute::name);
}

void VtC3DObserver::TakeName(const std::wstring& name)
{
    SetDisplayName(name);
    SetObjectName(name);
    if (assigned) // the records of views hold the name
        collection.GetInteraction().ReplaceObserverInViews(*this, *this);
}

void VtC3DObserver::SetFollowMode(const std::wstring& name)
{
    const std::wstring& known = base::EqualsNoCase(name, fixedToBodyName) ? fixedToObjectName : name;
    ChangeFollowMode(collection.GetFollowModeIndex(known), known);
    WriteBack(attribute::behaviour);
}

void VtC3DObserver::SetFollowModeIndex(std::int32_t index)
{
    ChangeFollowMode(index, collection.GetFollowModeName(index));
    WriteBack(attribute::behaviour);
}

void VtC3DObserver::ChangeFollowMode(std::int32_t index, const std::wstring& name)
{
    followMode = index;
    followModeName = name;
    if (!IsFree() || !placedByRule)
        return;
    // It stays where the rule has left it, and that is its placement from now on.
    orientation = OrientationFromCamera(viewMatrix.getRotate().conj());
    placedByRule = false;
    WriteBack(attribute::position);
    WriteBack(attribute::orientation);
}

void VtC3DObserver::SetConnectedBody(VtC3DMovableBody* body)
{
    HoldBody(body);
    WriteBack(attribute::attachedTo);
}

void VtC3DObserver::HoldBody(VtC3DMovableBody* body)
{
    if (body)
        body->AddRef();
    if (connectedBody)
        connectedBody->Release();
    connectedBody = body;
    connectedBodyName.clear();
    connectedName.Follow(body ? body->GetAttributeObject().get() : nullptr);
}

void VtC3DObserver::BodyName::Follow(VtISceneObject* newRecord)
{
    if (record)
        record->Unadvise(*this);
    record = newRecord;
    if (record)
        record->Advise(*this);
}

void VtC3DObserver::BodyName::OnPropertyChanged(VtISceneObject&, VtISceneAttribute& attribute)
{
    // The body hears it first, for it listened first.
    if (attribute.GetName() == attribute::name)
        observer.WriteBack(attribute::attachedTo);
}

void VtC3DObserver::SetTranslationOffset(const osg::Vec3f& offset)
{
    TakeTranslation(TupelOf(offset));
    WriteBack(attribute::translation);
}

void VtC3DObserver::TakeTranslation(const VtTFloatTupel3& offset)
{
    offsetTranslation = VectorOf(offset);
    PushViewMatrix();
}

void VtC3DObserver::SetRotationOffset(const osg::Vec3f& angles)
{
    TakeRotation(TupelOf(angles));
    WriteBack(attribute::rotation);
}

void VtC3DObserver::TakeRotation(const VtTFloatTupel3& angles)
{
    offsetAngles = VectorOf(angles);
    offsetRotation = osg::Quat(base::RadiansFromDegrees(angles[2]), zAxis) *
                     osg::Quat(base::RadiansFromDegrees(angles[1]), yAxis) *
                     osg::Quat(base::RadiansFromDegrees(angles[0]), xAxis);
    PushViewMatrix();
}

std::wstring VtC3DObserver::GetConnectedBodyName() const
{
    return connectedBody ? connectedBody->GetName() : connectedBodyName;
}

bool VtC3DObserver::IsValidConfiguration() const
{
    if (followMode < followFree || followMode >= followModeCount)
        return false;
    return NeedsBody() == (connectedBody != nullptr);
}

void VtC3DObserver::ApplyAttributes(VtISceneObject& source)
{
    if (!collection.IsFreeObserver(*this))
        for (const std::wstring_view name : {attribute::position, attribute::orientation})
            if (!source.GetAttribute(name))
                source.AddAttribute(name, VtTFloatTupel3{0, 0, 0});
    VtC3DBody::ApplyAttributes(source);
}

void VtC3DObserver::TakeAttachedTo(const std::wstring& name)
{
    const VtCScene3D* scene = GetDocument().GetScene();
    if (name.empty() || base::EqualsNoCase(name, attribute::notConnected))
        HoldBody(nullptr);
    else if (VtC3DMovableBody* body = scene ? scene->FindMovableByName(name) : nullptr)
        HoldBody(body);
    else if (connectedBody)
        WriteBack(attribute::attachedTo); // an unknown name changes nothing
    else
        connectedBodyName = name; // kept so that the user can be asked which body takes the place of the missing one
}

std::wstring VtC3DObserver::GiveAttachedTo() const
{
    const std::wstring body = GetConnectedBodyName();
    return body.empty() ? std::wstring(attribute::notConnected) : body;
}

void VtC3DObserver::ReadNumber(const VtISettingsReader& reader, const std::wstring& section, const wchar_t* key,
                               float& number)
{
    std::wstring text;
    if (reader.ReadText(section, key, text) == VtISettingsReader::found)
        number = base::ParseFloat(base::Utf8(text)).value_or(number);
}

int VtC3DObserver::LoadSettings(const std::wstring& section, const VtISettingsReader& reader)
{
    std::wstring text;
    if (const int status = reader.ReadText(section, L"Name", text); status != VtISettingsReader::found)
        return status;
    SetName(text);

    ReadNumber(reader, section, L"OffsetRotationX", offsetAngles.x());
    ReadNumber(reader, section, L"OffsetRotationY", offsetAngles.y());
    ReadNumber(reader, section, L"OffsetRotationZ", offsetAngles.z());
    ReadNumber(reader, section, L"OffsetTranslationX", offsetTranslation.x());
    ReadNumber(reader, section, L"OffsetTranslationY", offsetTranslation.y());
    ReadNumber(reader, section, L"OffsetTranslationZ", offsetTranslation.z());
    if (reader.ReadText(section, L"FollowMode", text) == VtISettingsReader::found)
        SetFollowMode(text);

    text.clear();
    const int status = reader.ReadText(section, L"ConnectedBody", text);
    const VtCScene3D* scene = GetDocument().GetScene();
    const bool bodiesKnown = status == VtISettingsReader::found && scene && scene->GetMovableBodies(0);
    HoldBody(bodiesKnown ? scene->FindMovableByName(text) : nullptr);
    if (bodiesKnown && !connectedBody)
        connectedBodyName = text;
    WriteBack(attribute::attachedTo);
    SetRotationOffset(osg::Vec3f(offsetAngles));
    SetTranslationOffset(osg::Vec3f(offsetTranslation));
    return status;
}

int VtC3DObserver::SaveSettings(const std::wstring& section, VtISettingsWriter* writer) const
{
    if (!writer)
        return -1;
    const auto number = [](float value)
    {
        char text[64];
        std::snprintf(text, sizeof(text), "%f", static_cast<double>(value));
        return base::Wide(text);
    };
    const std::pair<const wchar_t*, std::wstring> keys[] = {
        {L"Name", GetName()},
        {L"OffsetRotationX", number(offsetAngles.x())},
        {L"OffsetRotationY", number(offsetAngles.y())},
        {L"OffsetRotationZ", number(offsetAngles.z())},
        {L"OffsetTranslationX", number(offsetTranslation.x())},
        {L"OffsetTranslationY", number(offsetTranslation.y())},
        {L"OffsetTranslationZ", number(offsetTranslation.z())},
        {L"FollowMode", followModeName},
        {L"ConnectedBody", connectedBody ? connectedBody->GetName() : std::wstring()},
    };
    for (const auto& [key, value] : keys)
        if (const int status = writer->WriteText(section, key, value); status != 0)
            return status;
    return 0;
}
