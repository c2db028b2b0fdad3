#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <osg/Camera>
#include <osg/Matrixd>
#include <osg/Quat>
#include <osg/Vec3f>

#include "interaction/FollowMode.h"
#include "interaction/SmoothFollower.h"
#include "scene/Body.h"

class VtC3DMovableBody;
class VtC3DObservers;
class VtISettingsReader;
class VtISettingsWriter;

/// A place to look from: a position and a rotation of its own, or a rule that derives them from a moving body.
///
/// It turns them into one view matrix (scene to camera; the camera looks along its -z, y up) and hands that to the
/// cameras of all views that look through it. With no offsets the camera looks along the followed body's x axis with
/// the body's z up. Of the base it uses neither model nor node; `position` is the eye, in the scene, metres.
class VtC3DObserver : public VtC3DBody
{
public:
    /// Belongs to `parent`. A free observer has a record of its own kind (type 9) and its name as its id; any other
    /// gets `id`, or a fresh one when that is empty.
    VtC3DObserver(VtISceneDocument& owningDocument, VtC3DObservers& parentCollection, const std::wstring& name,
                  bool inTree, bool freeByBirth, const std::wstring& id, VtEBirth birth = VtEBirth::complete);

    /// The frame cycle's step: the placement for where the body is now, pushed to the cameras. Nothing while no view
    /// looks through it.
    void Update();

    // Placement of a free observer.

    // Each of them writes the record, too.

    /// Sets the eye; the free view is rebuilt, and pushed to the cameras with `update`.
    void setPosition(const osg::Vec3f& eye, bool update);

    /// Sets the rotation. Identity looks along the scene's y axis with z up.
    void setRotation(const osg::Quat& newOrientation, bool update);
    const osg::Quat& GetOrientation() const { return orientation; }

    void setMatrix(const osg::Matrixd& matrix, bool update);
    const osg::Matrixd& GetViewMatrix() const { return viewMatrix; }

    /// Takes over where the mouse left the camera (`cameraRotation`: camera axes to scene), and writes it to the
    /// record, in the form that reads back as the same view.
    void StoreFreeView(const osg::Vec3f& eye, const osg::Quat& cameraRotation);

    // The cameras of the views that look through it; not owned.

    void PushViewMatrix();
    void AddCamera(osg::Camera* camera);
    void RemoveCamera(osg::Camera* camera);
    bool HasCamera(const osg::Camera* camera) const;
    const std::vector<osg::Camera*>& GetCameras() const { return cameras; }

    /// True while a view looks through it; the views tell it.
    void SetAssigned(bool flag) { assigned = flag; }
    bool IsAssigned() const { return assigned; }

    // What the user sets. Each writes the record.

    void SetName(const std::wstring& name);

    /// By name, of the parent's list; "Fixed_to_Body" is an older name of a mode. An unknown name gives mode 0.
    void SetFollowMode(const std::wstring& name);
    void SetFollowModeIndex(std::int32_t index);

    /// The followed body, null for none. It lives on as long as it is followed, even when the scene has let it go.
    void SetConnectedBody(VtC3DMovableBody* body);

    /// The body goes: no target from then on.
    void Disconnect() { SetConnectedBody(nullptr); }

    void SetTranslationOffset(const osg::Vec3f& offset);

    /// About x, y, z in degrees, against the followed rotation.
    void SetRotationOffset(const osg::Vec3f& angles);

    const osg::Vec3f& GetTranslationOffset() const { return offsetTranslation; }
    const osg::Vec3f& GetRotationOffset() const { return offsetAngles; }
    const osg::Quat& GetOffsetRotation() const { return offsetRotation; }
    std::int32_t GetFollowMode() const { return followMode; }
    const std::wstring& GetFollowModeName() const { return followModeName; }
    VtC3DMovableBody* GetConnectedBody() const { return connectedBody; }

    /// The name of the followed body, or of the one that is stored and that the scene doesn't hold.
    std::wstring GetConnectedBodyName() const;

    /// The mouse drives it.
    bool IsFree() const { return followMode == followFree; }

    bool NeedsBody() const { return FollowModeNeedsBody(followMode); }

    /// A body is there just if the mode needs one.
    bool IsValidConfiguration() const;

    /// Forgets the followed rotations of an earlier run.
    void ClearFollower() { follower.Clear(); }

    /// After `ApplyAttributes` of a loaded record: takes over the record stored under `id`. It is complete then.
    void FinishLoad(const std::wstring& id)
    {
        RebindAttributes(id);
        EnterScene();
    }

    void ApplyAttributes(VtISceneObject& source) override;

    /// What the record of a free observer (type 9), or of any other, holds. Names in any case.
    static const VtCAttributeTable& Attributes(bool freeByBirth);
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(isFreeByBirth); }

    /// Reads the keys of a section; the status of the last of them. Nothing changes when there is no "Name".
    int LoadSettings(const std::wstring& section, const VtISettingsReader& reader);
    int SaveSettings(const std::wstring& section, VtISettingsWriter* writer) const;

protected:
    ~VtC3DObserver() override;

private:
    struct Placement
    {
        osg::Vec3f position;
        osg::Quat rotation;
    };

    /// Hears when the body gets another name, which the record of the observer holds.
    class BodyName : public IPropertyChangedCOMEvents
    {
    public:
        explicit BodyName(VtC3DObserver& rider) : observer(rider) {}
        ~BodyName() override { Follow(nullptr); }

        /// Listens to `newRecord` and to nothing else.
        void Follow(VtISceneObject* newRecord);
        void OnPropertyChanged(VtISceneObject& object, VtISceneAttribute& attribute) override;

    private:
        VtC3DObserver& observer;
        osg::ref_ptr<VtISceneObject> record;
    };

    static VtTAttributeRows Rows(bool freeByBirth);
    void MakeRecord();
    Placement FollowRigid(const osg::Matrixd& body) const;
    Placement FollowHeading(const osg::Matrixd& body) const;
    Placement LookAt(const osg::Matrixd& body) const;
    void Place(const Placement& placement);
    const osg::Quat& CameraAxes(const osg::Vec3f& angles);
    void RebuildFreeView(bool update);
    void HoldBody(VtC3DMovableBody* body);
    void ChangeFollowMode(std::int32_t index, const std::wstring& name);
    void TakeName(const std::wstring& name);
    void TakeAttachedTo(const std::wstring& name);
    void TakeTranslation(const VtTFloatTupel3& offset);
    void TakeRotation(const VtTFloatTupel3& angles);
    void TakePosition(const VtTFloatTupel3& eye);
    void TakeOrientation(const VtTFloatTupel3& angles);
    std::wstring GiveAttachedTo() const;
    std::optional<VtTFloatTupel3> GivePosition() const;
    std::optional<VtTFloatTupel3> GiveOrientation() const;
    void ReadNumber(const VtISettingsReader& reader, const std::wstring& section, const wchar_t* key, float& number);

    VtC3DObservers& collection;
    const bool isFreeByBirth;
    bool assigned = false;
    osg::Vec3f offsetAngles; ///< degrees about x, y, z
    osg::Vec3f offsetTranslation{0, 0, 1.5f};
    std::optional<osg::Quat> cameraAxes; ///< those of the camera, for `axesAngles`
    osg::Vec3f axesAngles;
    osg::Quat offsetRotation;
    osg::Quat orientation;
    osg::Matrixd viewMatrix;
    bool placedByRule = false; ///< else by `position` and `orientation`
    std::vector<osg::Camera*> cameras;
    std::int32_t followMode = followFixed;
    std::wstring followModeName;
    VtC3DMovableBody* connectedBody = nullptr; ///< one reference
    BodyName connectedName{*this};
    std::wstring connectedBodyName; ///< of a body that the scene doesn't hold
    VtCSmoothFollower follower;
};
