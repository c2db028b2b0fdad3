#include "scene/PGEventSink.h"

#include "scene/AbstractNavigatorObject.h"

void VTIPGEventSink::Connect(VtISceneObject* newObject)
{
    Disconnect();
    object = newObject;
    if (object)
        object->Advise(*this);
}

void VTIPGEventSink::Disconnect()
{
    if (object)
        object->Unadvise(*this);
    object = nullptr;
}

void VTIPGEventSink::OnPropertyChanged(VtISceneObject&, VtISceneAttribute& attribute)
{
    if (!owner.IsWritingAttributes())
        owner.OnAttributeChanged(owner.GetInternalId(), attribute.GetName(), attribute.GetValue());
}
