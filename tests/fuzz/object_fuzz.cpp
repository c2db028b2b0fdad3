// Any bytes as a record: it is refused with a reason, or it comes back the same when it is written and read again.
#include <cstdint>
#include <cstdlib>
#include <string_view>

#include "base/Text.h"
#include "records/ObjectText.h"
#include "scene/Scene3D.h"

namespace
{

void Check(bool holds)
{
    if (!holds)
        std::abort();
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    RegisterSceneAttributes();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const VtTParsedObject parsed =
        ParseObjectText(base::Wide(std::string_view(reinterpret_cast<const char*>(data), size)));
    Check(parsed.error.empty() == (parsed.object != nullptr));
    if (!parsed.object)
        return 0;

    const VtTParsedObject again = ParseObjectText(WriteObjectText(*parsed.object));
    Check(again.object != nullptr);
    Check(again.object->GetObjectType() == parsed.object->GetObjectType());
    const VtISceneObject::Attributes& before = parsed.object->GetAttributes();
    const VtISceneObject::Attributes& after = again.object->GetAttributes();
    Check(before.size() == after.size());
    for (std::size_t i = 0; i < before.size(); ++i)
    {
        Check(before[i]->GetName() == after[i]->GetName() && before[i]->GetValue() == after[i]->GetValue());
        if (before[i]->GetType() != VtEAttributeType::textList)
            Check(AttributeValueFromText(before[i]->GetType(), before[i]->GetValueText()) == before[i]->GetValue());
    }
    return 0;
}
