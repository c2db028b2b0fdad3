#pragma once

#include <string>
#include <utility>

#include "base/RefCounted.h"

/// Everything that a scene holds: a name, and a life that its references decide.
class VtCGlidePanelAbstractObject : public base::RefCounted
{
public:
    const std::wstring& GetObjectName() const { return objectName; }
    void SetObjectName(std::wstring name) { objectName = std::move(name); }

    /// True when the object shows an item in the object tree.
    bool HasNavigatorItem() const { return hasNavigatorItem; }

protected:
    VtCGlidePanelAbstractObject(std::wstring name, bool inTree) : objectName(std::move(name)), hasNavigatorItem(inTree)
    {
    }

private:
    std::wstring objectName;
    bool hasNavigatorItem;
};
