#pragma once

#include <cmath>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include <osg/Group>
#include <osg/Matrixd>
#include <osg/MatrixTransform>
#include <osg/ref_ptr>
#include <osg/Vec3f>

#include "scene/AbstractNavigatorObject.h"
#include "scene/Collectors.h"
#include "scene/Placement.h"
#include "scene/RenderMode.h"

/// The colour of a body's untextured surfaces, while it is enabled.
struct VtCBodyDye
{
    std::int32_t enabled = 0; ///< 0 or 1
    float red = 0;            ///< 0 to 1
    float green = 0;
    float blue = 0;
};

/// What all visible bodies share: a node in the graph with a model below it, placement values, and appearance.
///
/// The model is shared by all bodies of one file and kept by the model library. What changes a material first moves
/// the body on to a private copy; the shared model keeps the materials of its file.
class VtC3DBody : public VtCGlidePanelAbstractNavigatorObject
{
public:
    static constexpr osg::Node::NodeMask shownMask = 0xFFFFFFFF;

    // Placement. Lengths in metres, angles in degrees, scale in percent; the axes are those of the concrete class.

    const osg::Vec3f& GetScale() const { return scale; }
    const osg::Vec3f& GetScaleOrientation() const { return scaleOrientation; }
    const osg::Vec3f& GetCenter() const { return center; }
    const osg::Vec3f& GetRotation() const { return rotation; }
    const osg::Vec3f& GetPosition() const { return position; }

    /// Each of these stores, recomputes the transform and writes the record. What isn't a finite number is ignored.
    void SetScaleX(float value) { SetPlacement(&VtC3DBody::scale, 0, value); }
    void SetScaleY(float value) { SetPlacement(&VtC3DBody::scale, 1, value); }
    void SetScaleZ(float value) { SetPlacement(&VtC3DBody::scale, 2, value); }
    void SetCenterX(float value) { SetPlacement(&VtC3DBody::center, 0, value); }
    void SetCenterY(float value) { SetPlacement(&VtC3DBody::center, 1, value); }
    void SetCenterZ(float value) { SetPlacement(&VtC3DBody::center, 2, value); }
    void SetRotationX(float value) { SetPlacement(&VtC3DBody::rotation, 0, value); }
    void SetRotationY(float value) { SetPlacement(&VtC3DBody::rotation, 1, value); }
    void SetRotationZ(float value) { SetPlacement(&VtC3DBody::rotation, 2, value); }
    void SetPositionX(float value) { SetPlacement(&VtC3DBody::position, 0, value); }
    void SetPositionY(float value) { SetPlacement(&VtC3DBody::position, 1, value); }
    void SetPositionZ(float value) { SetPlacement(&VtC3DBody::position, 2, value); }

    /// Takes effect with the next change of another placement value.
    void SetScaleOrientation(const osg::Vec3f& value);

    const osg::Matrixd& GetBaseMatrix() const { return baseMatrix; }

    /// The matrix of the body's node; identity without one.
    virtual osg::Matrixd GetTransform() const;
    virtual void SetTransform(const osg::Matrixd& matrix);

    /// Recomputes the transform from the placement values; bodies without placement do nothing.
    virtual void UpdateBaseTransform() {}

    /// Sets the node to the final matrix: the scale, then `baseMatrix`.
    virtual void ApplyTransform();

    /// Gives the model the shaders that its description asks for; bodies without such descriptions do nothing.
    virtual void AssignShaders() {}

    // Appearance.

    VtERenderMode GetRenderMode() const { return renderMode; }

    /// Takes effect at once while the scene's mode is `Mixed`, else when it becomes that.
    void SetRenderMode(VtERenderMode mode);

    /// What the scene's global mode does to every body. A dye's colour comes back with the next refresh.
    void ApplyGlobalMode(VtERenderMode mode);

    float GetTransparency() const { return transparency; }

    /// 0 opaque, 1 invisible; `ApplyTransparency` makes it seen.
    void SetTransparency(float value);

    /// While the scene has a mode of its own, a `transparency` that is written to the record waits there. When bodies
    /// use their own modes again, it becomes the body's.
    void TakeWaitingTransparency();

    /// Blends the materials by the body's transparency when `mode` is `Transparent`, else as the file has them.
    void ApplyTransparency(VtERenderMode mode);

    const VtCBodyDye& GetDye() const { return *dye; }
    void SetDye(float red, float green, float blue);
    void SetDyeBytes(std::uint8_t red, std::uint8_t green, std::uint8_t blue);
    void ClearDye();

    /// Nothing without a node. Writes the attribute `visible`.
    void SetVisible(bool flag);

    /// Whether the node is shown; false without one.
    bool IsVisible() const { return transformNode && transformNode->getNodeMask() == shownMask; }

    /// Shows or hides the box around the body that marks a selection.
    void SetBoundingBoxVisible(bool flag);

    // The model.

    const std::wstring& GetFilePath() const { return filePath; }

    /// The body's node in the graph, null only after teardown.
    osg::Group* GetTransformNode() const { return transformNode.get(); }
    osg::Group* GetParentNode() const { return parentNode.get(); }
    osg::Node* GetModelNode() const { return modelNode.get(); }

    /// The private copy of the model, made now if there is none; null without a model.
    osg::Node* GetModelClone();

    const VtTMaterialMap& GetMaterials() const { return materials; }
    const VtTMaterialMap& GetFileMaterials() const { return fileMaterials; }

    /// Puts `node`, a transform with the new model as its first child, in the place of the body's node. Nothing
    /// unless both nodes and the parent's are there. Shaders aren't assigned anew.
    void ReplaceModel(osg::Group* node);

    // What an editor may do with the body, and groups of bodies.

    bool IsSelectable() const { return selectable; }
    bool IsFixedToWorld() const { return fixedToWorld; }

    /// The body's model is a group of parts, which are its children.
    bool IsGrouped() const { return isGrouped; }
    bool IsGroupChild() const { return isGroupChild; }
    const std::vector<std::wstring>& GetChildIds() const { return childIds; }

    /// Takes the body out of the graph and out of its parent, which is its end.
    void Destroy();

protected:
    VtC3DBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject* parentObject,
              const std::wstring& name, const std::wstring& path, bool inTree, const std::wstring& id);
    ~VtC3DBody() override;

    /// The node that bodies below `object` hang from; null when it isn't a body.
    static osg::Group* NodeOf(VtCGlidePanelAbstractNavigatorObject* object);

    /// The node goes along.
    void ParentChanged() override;

    /// Makes `node` the body's node, with user data that leads back to the body.
    virtual void SetTransformNode(osg::Group* node);

    /// Once the model is in place: remembers the materials as the file gave them.
    void BuildMaterialMaps();

    /// The scene's mode; `Mixed` without a scene.
    VtERenderMode GetGlobalMode() const;

    /// After a change of dye: moves to the right model, colours it, blends it.
    void RefreshAppearance();

    // Rows for the tables of the classes.

    static VtTAttributeRow FilePathRow();
    static VtTAttributeRow PlacementRow(std::wstring_view name, osg::Vec3f VtC3DBody::*field, const VtTAxes& axes,
                                        const VtTFloatTupel3& defaultValue, std::string_view meaning);

    /// What the body looks like and what an editor may do with it. The mode stands before what is seen in that mode.
    static VtTAttributeRows AppearanceRows();
    static VtTAttributeRows GroupRows();

    /// The attribute that stores a field of the placement; empty when the class doesn't store it.
    virtual std::wstring_view AttributeOf(osg::Vec3f VtC3DBody::*) const { return {}; }

    /// Makes the record from `description` (UTF-8, may be empty), or from the default text of `objectType` when there
    /// is none or it isn't a record. That is reported as a warning.
    void MakeAttributeObject(const std::string& description, std::int32_t objectType, bool recordFollows);

    /// Records of older scenes lack them.
    void AddMissingDyeAttributes();

    /// True when the model at `path` is this body's or that of a body above it, so that a part of it would never end.
    bool IsOwnOrAncestorFile(const std::wstring& path) const;

    osg::Vec3f scale{100, 100, 100};
    osg::Vec3f scaleOrientation;
    osg::Vec3f center;
    osg::Vec3f rotation;
    osg::Vec3f position;

    bool selectable = true;
    bool fixedToWorld = false;
    bool isGrouped = false;
    bool isGroupChild = false;
    std::vector<std::wstring> childIds; ///< of the parts of a group

    std::unique_ptr<VtCBodyDye> dye;
    float transparency = 0;
    bool visible = true;

    osg::Matrixd baseMatrix; ///< the fixed part of the transform

    osg::ref_ptr<osg::Group> parentNode;
    osg::ref_ptr<osg::Group> transformNode;
    osg::MatrixTransform* matrixNode = nullptr; ///< `transformNode`, when that is a matrix transform
    osg::ref_ptr<osg::Node> modelNode;          ///< shared with other bodies, except in a clone

private:
    void SetPlacement(osg::Vec3f VtC3DBody::*field, int axis, float value);
    void ShowNode(bool flag);
    void PaintDye();
    void UnpaintDye();
    void ApplyStoredDye();
    void TakeRenderMode(VtERenderMode mode);
    void TakeTransparency(float value);
    void TakeDyeColour(const VtTIntTupel3& colour);
    void TakeDyeEnabled(bool flag);
    VtTIntTupel3 GiveDyeColour() const;

    /// How the body is drawn now: in the scene's mode, or in its own.
    VtERenderMode GetShownMode() const;

    void ApplyRenderState(VtERenderMode mode);
    void ApplyModelFor(VtERenderMode mode);
    void ApplyModeState(VtERenderMode mode);
    void AdjustMaterials(VtERenderMode mode);
    bool IsOnPrivateCopy() const;
    void MoveToPrivateCopy();
    void MoveToSharedModel();

    std::wstring filePath;
    VtERenderMode renderMode = VtERenderMode::Textured;
    osg::ref_ptr<osg::Node> modelClone;
    osg::ref_ptr<osg::Node> boundingBoxNode;
    VtTMaterialMap fileMaterials;  ///< as the file gave them, never changed
    VtTMaterialMap materials;      ///< of the model that hangs in the graph now
    VtTMaterialMap cloneMaterials; ///< of `modelClone`
};
