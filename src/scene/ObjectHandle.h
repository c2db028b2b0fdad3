#pragma once

#include "scene/AbstractNavigatorObject.h"

/// A pointer to an object of a scene that knows when the object has gone.
///
/// It owns nothing: what a dialog, the tree or an automation object holds keeps no body alive. It is null once the
/// removal of the object has been told, however long somebody else may keep the object itself, and stays so when that
/// is put into a scene again. A move within the tree and a change of id or name leave it as it is.
///
///     VtCObjectHandle<VtC3DMovableBody> edited = body;
///     ...
///     if (VtC3DMovableBody* present = edited.Get())
///         present->SetVisible(false);
template <class Object = VtCGlidePanelAbstractNavigatorObject>
class VtCObjectHandle
{
public:
    VtCObjectHandle() = default;
    VtCObjectHandle(Object* object) : life(object ? object->GetLife() : nullptr) {}
    VtCObjectHandle(Object& object) : life(object.GetLife()) {}

    /// Null when there is none, or no more.
    Object* Get() const { return life ? static_cast<Object*>(life->object) : nullptr; }

    explicit operator bool() const { return Get() != nullptr; }

private:
    std::shared_ptr<const VtTObjectLife> life;
};
