// Any bytes as a scene file: they are refused with a line and nothing else, or what was read writes a text that reads
// back as the same bytes.
#include "FuzzFile.h"
#include "records/SceneFileText.h"
#include "scene/Scene3D.h"

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    RegisterSceneAttributes();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const VtTSceneRecords read = ParseSceneText({reinterpret_cast<const char*>(data), size});
    if (!read.error.empty())
    {
        fuzz::File::Check(read.error.starts_with("line ") && read.objects.empty());
        return 0;
    }
    const std::string first = WriteSceneText(read.objects);
    const VtTSceneRecords again = ParseSceneText(first);
    fuzz::File::Check(again.error.empty() && again.objects.size() == read.objects.size());
    fuzz::File::Check(WriteSceneText(again.objects) == first);
    return 0;
}
