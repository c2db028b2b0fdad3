// Any text as a path, and any as the libraries' roots: every function gives a path of the form it promises.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

#include "base/Text.h"
#include "host/LibraryPaths.h"
#include "scene/LibraryPath.h"

namespace
{

/// The roots of a machine; an input may bring its own.
class Roots : public host::LibraryPaths
{
public:
    std::wstring GetObjectsPath() const override { return objects; }
    std::wstring GetObjectsSubfolder() const override { return subfolder; }
    std::wstring GetCustomerPath() const override { return customer; }
    std::wstring GetModuleDirectory() const override { return {}; }

    std::wstring objects = L"\\lib\\Vantor Objects\\advanced";
    std::wstring subfolder = L"\\advanced";
    std::wstring customer = L"\\lib\\Customer_Objects";
};

void Check(bool holds)
{
    if (!holds)
        std::abort();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    // The path, and in further lines the roots.
    const std::vector<std::wstring> lines =
        base::Split(base::Wide(std::string_view(reinterpret_cast<const char*>(data), size)), L'\n');
    const std::wstring path = lines.empty() ? std::wstring() : lines[0];
    Roots roots;
    if (lines.size() > 1)
        roots.objects = lines[1];
    if (lines.size() > 2)
        roots.subfolder = lines[2];
    if (lines.size() > 3)
        roots.customer = lines[3];

    const std::wstring normal = NormalizeSeparators(path);
    Check(normal.find(L'/') == std::wstring::npos && normal.find(L"\\\\") == std::wstring::npos);
    Check(NormalizeSeparators(normal) == normal);

    const std::wstring portable = ToPortablePath(path, roots);
    Check(HasLibraryToken(portable));
    Check(ToPortablePath(portable, roots) == portable);

    const std::wstring file = ResolveModelPath(path, roots);
    Check(file.ends_with(L".dae") && file.find(L"\\$") != std::wstring::npos);

    // What was resolved once is found again through a stored scene.
    const Roots usual;
    const std::wstring found = ResolveModelPath(path, usual);
    if (!HasLibraryToken(found))
    {
        const std::wstring again = ResolveModelPath(ToPortablePath(found, usual), usual);
        Check(again == NormalizeSeparators(found));
    }

    MakeLibraryPath(size > 0 ? data[0] % 3 : 0, path, roots);
    return 0;
}
