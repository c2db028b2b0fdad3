#include <gtest/gtest.h>

#include <iterator>
#include <string>

#include "base/Paths.h"
#include "base/Text.h"
#include "scene/LibraryPath.h"
#include "tests/support/FakeHost.h"

namespace
{

struct Path
{
    const wchar_t* from;
    const wchar_t* to;
};

TEST(LibraryPath, PortablePathsNameNoRoot)
{
    const fake::LibraryPaths paths;
    const Path cases[] = {
        {L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae", L"%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae"},
        {L"\\LIB\\vantor objects\\ADVANCED\\Cars\\$Sedan\\Sedan.dae", L"%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae"},
        {L"\\lib\\Vantor Objects\\old(prior gld 2.3)\\Cars\\Sedan.wrl", L"%Vantor_Objects%\\Cars\\Sedan.wrl"},
        {L"\\lib\\Customer_Objects\\$A\\A.dae", L"%Customer_Objects%\\$A\\A.dae"},
        // in neither library: the whole path
        {L"\\home\\u\\$A\\A.dae", L"%Vantor_Objects%\\home\\u\\$A\\A.dae"},
        {L"A.dae", L"%Vantor_Objects%\\A.dae"},
        {L"", L"%Vantor_Objects%\\"},
        {L"\\lib\\Customer_Objects2\\$A\\A.dae", L"%Vantor_Objects%\\lib\\Customer_Objects2\\$A\\A.dae"},
        {L"\\x\\lib\\Customer_Objects\\$A\\A.dae", L"%Vantor_Objects%\\x\\lib\\Customer_Objects\\$A\\A.dae"},
        // a token, in any case, is left alone
        {L"%vantor_objects%\\$A\\A.dae", L"%vantor_objects%\\$A\\A.dae"},
    };
    for (const Path& path : cases)
    {
        const std::wstring portable = ToPortablePath(path.from, paths);
        EXPECT_EQ(base::Utf8(portable), base::Utf8(path.to));
        EXPECT_EQ(ToPortablePath(portable, paths), portable);
    }
}

TEST(LibraryPath, StoredPathsLeadToTodaysFiles)
{
    const fake::LibraryPaths paths;
    const Path cases[] = {
        {L"%Customer_Objects%\\Cars\\$Sedan\\Sedan.dae", L"\\lib\\Customer_Objects\\Cars\\$Sedan\\Sedan.dae"},
        {L"%Vantor_Objects%\\$Sedan\\Sedan.dae", L"\\lib\\Vantor Objects\\advanced\\$Sedan\\Sedan.dae"},
        {L"%Vantor_Objects%\\Cars\\Sedan.wrl", L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae"},
        {L"C:\\Program Files\\Vantor Objects\\advanced\\Cars\\Sedan.wrl",
         L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae"},
        {L"C:\\Vantor Objects\\old(prior gld 2.3)\\Cars\\$Sedan\\Sedan.DAE",
         L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae"},
        {L"D:\\vantor_objects\\Cars\\$Sedan\\Sedan.dae", L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae"},
        {L"D:/customer_objects//Cars/Sedan.wrl", L"\\lib\\Customer_Objects\\Cars\\$Sedan\\Sedan.dae"},
        // folders from behind the customer's part, root by the product's
        {L"D:\\vantor_objects\\customer_objects\\Cars\\Sedan.wrl",
         L"\\lib\\Vantor Objects\\advanced\\Cars\\$Sedan\\Sedan.dae"},
        {L"\\lib\\Customer_Objects\\a.b\\$S.1\\S.1.dae", L"\\lib\\Customer_Objects\\a.b\\$S.1\\S.1.dae"},
        // no "$" folder, no extension, a longer path than the root, a shorter one, nothing at all
        {L"\\lib\\Customer_Objects\\Cars\\Sedan.dae", L"\\lib\\Customer_Objects\\Cars\\$Sedan\\Sedan.dae"},
        {L"\\lib\\Customer_Objects\\Cars\\Sedan", L"\\lib\\Customer_Objects\\Cars\\$Sedan\\Sedan.dae"},
        {L"\\old\\Their_Own_Parts\\Cars\\$Sedan\\Sedan.dae", L"\\lib\\Customer_Objects\\ars\\$Sedan\\Sedan.dae"},
        {L"\\a\\Sedan.dae", L"\\lib\\Customer_Objects\\$Sedan\\Sedan.dae"},
        {L"", L"\\lib\\Customer_Objects\\$\\.dae"},
        {L"vantor_objects", L"\\lib\\Vantor Objects\\advanced\\$vantor_objects\\vantor_objects.dae"},
        // a token in other case is a folder like any other
        {L"%customer_objects%\\Cars\\Sedan.wrl", L"\\lib\\Customer_Objects\\\\Cars\\$Sedan\\Sedan.dae"},
    };
    for (const Path& path : cases)
        EXPECT_EQ(base::Utf8(ResolveModelPath(path.from, paths)), base::Utf8(path.to)) << base::Utf8(path.from);
}

TEST(LibraryPath, ALibraryNeedsNoFolderOfThatName)
{
    fake::LibraryPaths paths;
    paths.objects = L"\\usr\\share\\panoramic\\objects\\advanced";
    paths.customer = L"models\\.\\x\\..";
    const std::wstring here = base::InnerPath(std::filesystem::current_path());

    const std::wstring stored = L"%Vantor_Objects%\\Cars\\$Sedan\\Sedan.dae";
    const std::wstring file = L"\\usr\\share\\panoramic\\objects\\advanced\\Cars\\$Sedan\\Sedan.dae";
    EXPECT_EQ(ResolveModelPath(stored, paths), file);
    EXPECT_EQ(ResolveModelPath(file, paths), file);
    EXPECT_EQ(ToPortablePath(file, paths), stored);
    EXPECT_EQ(ResolveModelPath(L"%Customer_Objects%\\$A\\A.dae", paths), here + L"\\models\\$A\\A.dae");

    paths.objects.clear();
    paths.customer.clear();
    EXPECT_EQ(ToPortablePath(L"\\advanced\\$A\\A.dae", paths), L"%Vantor_Objects%\\advanced\\$A\\A.dae");
    EXPECT_EQ(ResolveModelPath(L"%Vantor_Objects%\\$A\\A.dae", paths), L"\\$A\\A.dae");
}

TEST(LibraryPath, EntriesOfALibraryHaveAFolderOfTheirOwn)
{
    const fake::LibraryPaths paths;
    EXPECT_EQ(MakeLibraryPath(0, L"Sedan", paths), L"\\lib\\Vantor Objects\\advanced\\\\$Sedan\\Sedan.dae");
    EXPECT_EQ(MakeLibraryPath(1, L"Cars\\Sedan", paths), L"\\lib\\Customer_Objects\\Cars\\\\$Sedan\\Sedan.dae");
    EXPECT_EQ(MakeLibraryPath(2, L"Sedan", paths), L"\\\\$Sedan\\Sedan.dae");
}

} // namespace
