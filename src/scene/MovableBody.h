#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include <osg/Matrixd>
#include <osg/MatrixTransform>

#include "scene/Body.h"
#include "scene/ObjectHandle.h"

class VtCMovableBodies;
class VtCTrack;

/// What every frame reads and writes of a movable body, kept apart from the rest of it.
///
/// With thousands of bodies the time of a frame goes into memory that lies far apart, so these lie behind one another.
struct VtTBodyMotion
{
    osg::MatrixTransform* node = nullptr; ///< the body's; not owned, null without one
    std::int32_t simulationDataIndex = -1;
    std::array<double, 12> base{};    ///< places the model at the simulated origin: four rows without the fourth column
    osg::Matrixd lastTransformMatrix; ///< of the last frame; (3,3) is always 1

    /// Takes the affine map `matrix` as the base.
    void SetBase(const osg::Matrixd& matrix);

    /// Takes the 16 floats of a frame's entry, column after column, as the last matrix and moves the node.
    void SetLastTransformColumns(const float* values);

    /// Sets the node to the base * `lastTransformMatrix`.
    void MoveNode();
};

/// What `SetLastTransformColumns` does for affine maps on processors without wide registers; with the same results.
void MoveByColumnsPortable(VtTBodyMotion& motion, const float* values);

/// Storage of motions in blocks that never move. Bodies that are made one after another get neighbours.
class VtCMotionPool
{
public:
    VtTBodyMotion& Take();
    void GiveBack(VtTBodyMotion& motion) { unused.push_back(&motion); }

private:
    static constexpr std::size_t blockSize = 256;

    std::vector<std::unique_ptr<VtTBodyMotion[]>> blocks;
    std::vector<VtTBodyMotion*> unused; ///< last first
};

/// A body that simulation data move.
///
/// `scale`, `rotation` and `center` only place the model at the simulated origin; the matrix of a frame moves it from
/// there. Models are y-up and the scene is z-up, so a quarter turn about x is always part of the placement.
class VtC3DMovableBody final : public VtC3DBody
{
public:
    enum VtEConnectionState : std::int32_t
    {
        notConnected = 0,
        channelMissing = 1, ///< a channel is set, but the current data point has none of that index
        connected = 2,
    };

    /// Belongs to `parent` (a collection, or the group that it becomes a part of). `path` is a complete path;
    /// `insertTransform` places a grouped body as a whole; `model` is used in place of the file if it isn't null. An
    /// empty `id` gives a fresh one. When a record follows, no default one is made. A file that can't be read leaves
    /// the body without geometry.
    VtC3DMovableBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                     const std::wstring& name, const std::wstring& path, const osg::Matrixd& insertTransform,
                     bool inTree, osg::Node* model, const std::wstring& id, VtEBirth birth = VtEBirth::complete);

    /// Binds the body to the channel `index`, -1 for none. An empty `stream` is named by the data point, or by the
    /// index. A group ignores it: its parts have channels of their own.
    void ConnectChannel(std::int32_t index, const std::wstring& stream);

    std::int32_t GetSimulationDataIndex() const { return motion->simulationDataIndex; }
    const std::wstring& GetSimulationDataStream() const { return simulationDataStream; }
    bool IsConnected() const { return motion->simulationDataIndex != -1; }

    /// Compares the channel with those of the current data point; a group asks its parts.
    void UpdateConnectionState();
    std::int32_t GetConnectionState() const { return connectionState; }

    /// Moves the body by a frame's matrix; (3,3) of it counts as 1.
    void SetLastTransformMatrix(const osg::Matrixd& matrix);

    const osg::Matrixd& GetLastTransformMatrix() const { return motion->lastTransformMatrix; }

    /// What a frame needs of this body. Not for a group, which its parts move.
    VtTBodyMotion& GetMotion() const { return *motion; }

    /// Sets the node to `baseMatrix` * the last matrix; a group hands it to its parts.
    void ApplyTransform() override;

    void SetTransform(const osg::Matrixd& matrix) override;
    void UpdateBaseTransform() override;

    /// Writes the matrix of the node to `last_transform_matrix`, for a scene about to be saved; a group does so for
    /// its parts too. A matrix that holds no finite numbers isn't written.
    void StoreLastTransform();

    const osg::Matrixd& GetInsertMatrix() const { return insertMatrix; }
    void SetInsertMatrix(const osg::Matrixd& matrix);

    const osg::Matrixd& GetGroupChildMatrix() const { return groupChildMatrix; }

    /// The parts of a group, in the order of `childIds`.
    const std::vector<VtC3DMovableBody*>& GetParts() const { return parts; }

    /// A body that replays this one in `clonesTrack` (not owned), member of `target`; null without a model to copy.
    VtC3DMovableBody* CloneIntoTrack(VtCMovableBodies& target, VtCTrack* clonesTrack, std::int32_t trackNumber);

    VtC3DMovableBody* GetCloneSource() const { return cloneSource.Get(); }
    VtCTrack* GetTrack() const { return track; }
    bool IsClone() const { return track != nullptr; }

    /// After `ApplyAttributes` of a loaded record: takes over the record stored under `id`. The body is complete then.
    void FinishLoad(const std::wstring& id);

    /// What its record holds. `position` is the field `center`: the stored place is that of the model in the body.
    static const VtCAttributeTable& Attributes();
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(); }

protected:
    ~VtC3DMovableBody() override;
    void ChildRemoved(VtCGlidePanelAbstractNavigatorObject& child) override;
    void ParentChanged() override;
    void SetTransformNode(osg::Group* node) override;
    std::wstring_view AttributeOf(osg::Vec3f VtC3DBody::*field) const override;

private:
    VtCMovableBodies* JoinParent();
    void FillAttributes(const osg::Matrixd& insertTransform);
    void ExpandGroup();
    void AddPart(const std::wstring& oldId, const std::wstring& newId, const std::wstring& path);
    void MoveAttribute(const std::wstring& oldName, const std::wstring& newName);
    void TakeChannelName(const std::wstring& name);

    std::shared_ptr<VtCMotionPool> pool; ///< where `motion` is from
    VtTBodyMotion* motion;               ///< with the channel's index and the last matrix
    std::int32_t connectionState = notConnected;
    std::wstring simulationDataStream;
    osg::Matrixd groupChildMatrix; ///< of a part: its place inside the group
    osg::Matrixd insertMatrix;     ///< of a group: the place of the whole
    std::vector<VtC3DMovableBody*> parts;
    VtCObjectHandle<VtC3DMovableBody> cloneSource;
    VtCTrack* track = nullptr; ///< not owned
};
