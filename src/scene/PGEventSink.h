#pragma once

#include <osg/ref_ptr>

#include "records/SceneObject.h"

class VtCGlidePanelAbstractNavigatorObject;

/// Carries the changes of a record to the object that it belongs to.
///
/// Changes that the object writes itself don't come back to it: it has acted on them already, and a setter that
/// writes its attribute would else call itself. Other listeners of the record are told of them all the same.
class VTIPGEventSink : public IPropertyChangedCOMEvents
{
public:
    explicit VTIPGEventSink(VtCGlidePanelAbstractNavigatorObject& sinkOwner) : owner(sinkOwner) {}
    ~VTIPGEventSink() override { Disconnect(); }
    VTIPGEventSink(const VTIPGEventSink&) = delete;
    VTIPGEventSink& operator=(const VTIPGEventSink&) = delete;

    /// Listens to `newObject` and to nothing else; null only disconnects.
    void Connect(VtISceneObject* newObject);
    void Disconnect();

    void OnPropertyChanged(VtISceneObject& changed, VtISceneAttribute& attribute) override;

private:
    VtCGlidePanelAbstractNavigatorObject& owner;
    osg::ref_ptr<VtISceneObject> object;
};
