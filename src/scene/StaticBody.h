#pragma once

#include <string>
#include <string_view>

#include "scene/Body.h"

/// A body that stays where the scene puts it, with the placement of a VRML transform.
///
/// Its fields are in the y-up axes of the models; its record is in the z-up axes of the scene.
class VtC3DStaticBody final : public VtC3DBody
{
public:
    /// Belongs to `parentObject` (the collection, or a static body). `path` is a complete path; an empty `id` gives a
    /// fresh one. The node has the matrix `insertTransform` until a placement value changes or `UpdateBaseTransform`
    /// is called. When a record follows, no default one is made.
    /// Throws `VtCAttributeError` when `insertTransform` holds no finite numbers.
    VtC3DStaticBody(VtISceneDocument& owningDocument, VtCGlidePanelAbstractNavigatorObject& parentObject,
                    const std::wstring& name, const std::wstring& path, const osg::Matrixd& insertTransform,
                    bool inTree, const std::wstring& id, VtEBirth birth = VtEBirth::complete);

    void UpdateBaseTransform() override;

    /// Sets up a road model whose description has the road's textures; leaves any other as it is.
    void AssignShaders() override;

    /// Hands the attribute, "kind,type,value", to the model as a parameter of the shader; nothing when it is missing.
    virtual void ApplyShaderAttribute(const std::wstring& shaderName, const std::wstring& attributeName);

    virtual osg::Matrixd GetPlacementMatrix() const { return GetTransform(); }
    virtual void SetPlacementMatrix(const osg::Matrixd& matrix) { SetTransform(matrix); }

    /// The body's own transform: the same node as `GetTransformNode`.
    osg::MatrixTransform* GetPlacementNode() const { return matrixNode; }

    /// After `ApplyAttributes` of a loaded record: takes over the record stored under `id`. The body is complete then.
    virtual void FinishLoad(const std::wstring& id);

    /// What the table knows, and of a group the values of its parts.
    void OnAttributeChanged(const std::wstring& objectId, const std::wstring& attributeName,
                            const VtTAttributeValue& value) override;

    /// What its record holds: in the axes of the scene, where the fields stand in those of the models.
    static const VtCAttributeTable& Attributes();
    const VtCAttributeTable& GetAttributeTable() const override { return Attributes(); }

protected:
    ~VtC3DStaticBody() override = default;
    std::wstring_view AttributeOf(osg::Vec3f VtC3DBody::*field) const override;

    /// The record says who the parent is.
    void ParentChanged() override;

private:
    void FillAttributes(const osg::Matrixd& insertTransform);
    void ExpandGroup();
    void AddPart(const std::wstring& id, const std::wstring& path);
    void SetStored(std::wstring_view name, const VtTAttributeValue& value); ///< into field and record
    void OnChildAttributeChanged(std::wstring_view attributeName, const VtTAttributeValue& value);
};
