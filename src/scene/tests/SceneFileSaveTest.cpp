#include <gtest/gtest.h>

#include <csignal>
#include <cstdint>
#include <set>
#include <string>
#include <vector>

#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "base/AtomicFile.h"
#include "records/SceneFileText.h"
#include "records/tests/SceneFileFixture.h"
#include "scene/tests/SceneFixture.h"

using namespace scenefile;

namespace
{

VtCSceneObjectStore StoreOf(const char* name, int records)
{
    VtCSceneObjectStore store;
    for (int i = 0; i < records; ++i)
    {
        const osg::ref_ptr<VtISceneObject> object = new VtISceneObject(7);
        const std::wstring id = std::to_wstring(i);
        object->AddAttribute(L"object_type", 7);
        object->AddAttribute(L"internal_id", id);
        object->AddAttribute(L"name", base::Wide(name));
        store.AddObject(id, object);
    }
    return store;
}

TEST(SceneFileSave, AKilledSaveLeavesTheOldFileOrTheNewOne)
{
    const Folder folder;
    const std::wstring path = folder.Inner("scene.xml");
    VtCSceneObjectStore first = StoreOf("old", 200);
    VtCSceneObjectStore second = StoreOf("new", 300);
    const std::string texts[] = {WriteSceneText(first.GetObjects()), WriteSceneText(second.GetObjects())};
    ASSERT_TRUE(first.SaveFile(path));

    std::uint32_t random = 12345;
    int found[2] = {0, 0};
    for (int kill = 0; kill < 100; ++kill)
    {
        int ready[2];
        ASSERT_EQ(pipe(ready), 0);
        const pid_t child = fork();
        if (child == 0)
            for (;;)
            {
                second.SaveFile(path);
                if (write(ready[1], "", 1) < 0)
                    _exit(1);
                first.SaveFile(path);
            }
        ASSERT_GT(child, 0);
        char byte = 0;
        ASSERT_EQ(read(ready[0], &byte, 1), 1);
        random = random * 1664525U + 1013904223U;
        usleep((random >> 16) % 12000);
        ::kill(child, SIGKILL);
        waitpid(child, nullptr, 0);
        close(ready[0]);
        close(ready[1]);

        const std::string left = folder.Read("scene.xml");
        ASSERT_TRUE(left == texts[0] || left == texts[1]) << left.size() << " bytes after kill " << kill;
        ++found[left == texts[1]];
    }
    EXPECT_GT(found[0], 0);
    EXPECT_GT(found[1], 0);
}

TEST(SceneFileSave, TheNextSaveRemovesWhatAKilledOneLeftAndNothingElse)
{
    const Folder folder;
    const std::wstring path = folder.Inner("scene.xml");
    const std::set<std::string> mine = {"scene.xml.backup", "scene.xml.writing-notes.txt", "other.xml.writing-a1B2c3"};
    for (const std::string& name : mine)
        folder.Write(name, "mine");
    const pid_t child = fork();
    if (child == 0)
    {
        base::AtomicFile half(base::NativePath(path));
        half.Write("<?xml");
        ::kill(getpid(), SIGKILL);
    }
    ASSERT_GT(child, 0);
    waitpid(child, nullptr, 0);
    ASSERT_EQ(folder.Names().size(), mine.size() + 1) << "the killed one has left something";

    std::set<std::string> expected = mine;
    expected.insert("scene.xml");
    VtCSceneObjectStore store = StoreOf("body", 3);
    {
        base::AtomicFile other(base::NativePath(path));
        ASSERT_TRUE(store.SaveFile(path));
        EXPECT_EQ(folder.Names().size(), expected.size() + 1) << "a file that is being written stays";
    }
    EXPECT_EQ(folder.Names(), expected);
}

TEST(SceneFileSave, RecordsThatWereGivenOneIdCanBeReadAgain)
{
    const Folder folder;
    VtCSceneObjectStore store = StoreOf("body", 6);
    const auto edit = [&](const wchar_t* key, const wchar_t* id)
    { store.GetObject(key)->Write(L"internal_id", std::wstring(id)); };
    edit(L"1", L"3"); // an object lives under it
    edit(L"2", L"Mine");
    edit(L"4", L"MINE"); // the same without regard to case
    edit(L"5", L"4");    // free until 4 gets it back
    ASSERT_TRUE(store.SaveFile(folder.Inner("scene.xml")));

    const VtTSceneRecords read = ParseSceneText(folder.Read("scene.xml"));
    ASSERT_EQ(read.error, "");
    std::vector<std::wstring> ids;
    for (const auto& object : read.objects)
        ids.push_back(*object->Find<std::wstring>(L"internal_id"));
    ASSERT_EQ(ids.size(), 6U);
    EXPECT_EQ(ids, (std::vector<std::wstring>{L"0", L"1", L"Mine", L"3", L"4", L"5"}));
}

class SceneSave : public SceneFixture
{
};

TEST_F(SceneSave, AFailedSaveSaysSoAndTheSceneStaysModified)
{
    const Folder folder;
    const std::wstring good = folder.Write("scene.xml", "old");
    document.modified = true;

    for (const std::wstring& path : {folder.Inner("missing/scene.xml"), folder.Inner("scene.xml/below.xml"),
                                     std::wstring(L"\\proc\\scene.xml"), base::InnerPath(folder.path)})
    {
        EXPECT_FALSE(scene.SaveScene(path));
        EXPECT_TRUE(document.modified);
        EXPECT_NE(scene.GetFileError().find(base::InnerPath(base::NativePath(path).filename())), std::wstring::npos)
            << base::Utf8(scene.GetFileError());
    }
    EXPECT_EQ(folder.Read("scene.xml"), "old");

    EXPECT_TRUE(scene.SaveScene(good));
    EXPECT_FALSE(document.modified);
    EXPECT_TRUE(scene.GetFileError().empty());
    EXPECT_EQ(ParseSceneText(folder.Read("scene.xml")).objects.size(), 1U) << "the render settings";
}

TEST_F(SceneSave, ASavedBodyStandsWhereItStood)
{
    const Folder folder;
    VtC3DMovableBody& body = AddMovable(L"Car");
    body.SetLastTransformMatrix(osg::Matrixd::translate(5, 6, 7));
    ASSERT_TRUE(scene.SaveScene(folder.Inner("scene.xml")));
    const auto* matrix = body.GetAttributeObject()->Find<std::vector<float>>(L"last_transform_matrix");
    ASSERT_TRUE(matrix && matrix->size() == 16);
    EXPECT_FLOAT_EQ((*matrix)[12], 5);
    EXPECT_FLOAT_EQ((*matrix)[14], 7);
    EXPECT_NE(folder.Read("scene.xml").find(" 5 6 7 1<"), std::string::npos);
}

} // namespace
