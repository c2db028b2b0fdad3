#include <gtest/gtest.h>

#include <cstdlib>

#include "base/IniFile.h"
#include "base/Paths.h"
#include "hosts/common/DocumentList.h"
#include "hosts/common/HostTexts.h"
#include "hosts/common/IdleLoop.h"
#include "hosts/common/System.h"
#include "tests/support/FakeHost.h"
#include "tests/support/TemporaryFolder.h"

namespace
{

/// A variable of the environment for the time of a test.
class Variable
{
public:
    Variable(const char* variable, const std::string& value) : name(variable)
    {
        if (const char* before = std::getenv(name))
            earlier = before;
        setenv(name, value.c_str(), 1);
    }
    ~Variable() { earlier ? setenv(name, earlier->c_str(), 1) : unsetenv(name); }
    Variable(const Variable&) = delete;
    Variable& operator=(const Variable&) = delete;

private:
    const char* name;
    std::optional<std::string> earlier;
};

TEST(SystemPaths, LibrariesComeFromTheEnvironmentTheConfigurationOrTheExample)
{
    const TemporaryFolder folder;
    const Variable objects("PANORAMIC_OBJECTS", "");
    const Variable customer("PANORAMIC_CUSTOMER_OBJECTS", "");
    {
        const base::IniFile none{std::filesystem::path()};
        const hosts::SystemPaths paths(none, "/data", "/app/bin");
        EXPECT_EQ(paths.GetObjectsPath(), L"\\data\\example\\Vantor Objects\\advanced");
        EXPECT_EQ(paths.GetObjectsSubfolder(), L"\\advanced");
        EXPECT_EQ(paths.GetCustomerPath(), L"\\data\\example\\Customer_Objects");
        EXPECT_EQ(paths.GetModuleDirectory(), L"\\app\\bin\\");
        EXPECT_EQ(hosts::SystemPaths(none, "/data", "").GetModuleDirectory(), L"");
    }
    const base::IniFile ini(
        folder.Write("c.ini", "[Libraries]\nObjects = /lib/objects/\nCustomerObjects = /lib/own/\n"));
    EXPECT_EQ(hosts::SystemPaths(ini, "/data", "").GetObjectsPath(), L"\\lib\\objects\\advanced");
    EXPECT_EQ(hosts::SystemPaths(ini, "/data", "").GetCustomerPath(), L"\\lib\\own");
    const Variable given("PANORAMIC_OBJECTS", "/other/Advanced");
    EXPECT_EQ(hosts::SystemPaths(ini, "/data", "").GetObjectsPath(), L"\\other\\Advanced");
}

TEST(SystemPaths, TheDataFolderBelongsToTheProgramUnlessItIsGiven)
{
    const TemporaryFolder folder;
    const Variable given("PANORAMIC_DATA", "");
    const std::filesystem::path build = folder.path / "build" / "bin";
    const std::filesystem::path installed = folder.path / "usr" / "lib" / "panoramic" / "bin";
    EXPECT_EQ(hosts::FindDataFolder(build), "");
    std::filesystem::create_directories(folder.path / "build" / "share" / "panoramic" / "texts");
    std::filesystem::create_directories(folder.path / "usr" / "share" / "panoramic" / "texts");
    EXPECT_EQ(hosts::FindDataFolder(build), folder.path / "build" / "share" / "panoramic");
    EXPECT_EQ(hosts::FindDataFolder(installed), folder.path / "usr" / "share" / "panoramic");
    const Variable own("PANORAMIC_DATA", "/own");
    EXPECT_EQ(hosts::FindDataFolder(build), "/own");
    EXPECT_TRUE(std::filesystem::exists(hosts::ModuleFolder() / "console_tests"));
}

TEST(SystemPaths, SettingsLieInTheFolderOfTheUser)
{
    const Variable home("HOME", "/home/me");
    const Variable xdg("XDG_CONFIG_HOME", "/xdg");
    EXPECT_EQ(hosts::ConfigurationFolder(), "/xdg/panoramic");
    const Variable relative("XDG_CONFIG_HOME", "not/absolute");
    EXPECT_EQ(hosts::ConfigurationFolder(), "/home/me/.config/panoramic");
    const Variable homeless("HOME", "");
    EXPECT_EQ(hosts::ConfigurationFolder(), "");
}

TEST(SystemClock, ItsTicksAndCountsAreOfOneClock)
{
    hosts::SystemClock clock;
    const std::int64_t counter = clock.Counter();
    const std::uint32_t tick = clock.TickCount();
    EXPECT_GT(counter, 0);
    clock.Sleep(20);
    const double slept = static_cast<double>(clock.Counter() - counter) / static_cast<double>(clock.CounterFrequency());
    EXPECT_GE(slept, 0.019);
    EXPECT_NEAR(clock.TickCount() - tick, slept * 1000, 20);
}

struct Sink : host::IIdleProcessingEvents
{
    void OnIdle(std::int32_t& handled) override
    {
        ++events;
        handled = answer;
        if (action)
            action();
    }

    int events = 0;
    std::int32_t answer = 1;
    std::function<void()> action;
};

struct Loop : testing::Test
{
    fake::Clock clock;
    fake::MessageService messages;
    hosts::IdleLoop loop{clock, messages};
    Sink first, second;
};

TEST_F(Loop, ConnectionsMayEndFromWithinAnEvent)
{
    const std::uint32_t one = loop.Advise(first);
    const std::uint32_t two = loop.Advise(second);
    EXPECT_NE(one, 0U);
    EXPECT_NE(one, two);
    first.action = [&]
    {
        loop.Unadvise(one);
        loop.Unadvise(two);
        loop.Advise(first);
    };
    EXPECT_TRUE(loop.Raise());
    EXPECT_EQ(second.events, 0) << "ended before its turn";
    EXPECT_EQ(first.events, 1) << "the new connection waits for the next event";
    first.action = nullptr;
    EXPECT_TRUE(loop.Raise());
    EXPECT_EQ(first.events, 2);
    loop.Unadvise(999);
}

TEST_F(Loop, ItSleepsOnlyWhenNobodyWantsTheNextEvent)
{
    loop.Advise(first);
    int left = 3;
    EXPECT_TRUE(loop.Run([&] { return left-- > 0; }));
    EXPECT_EQ(first.events, 3);
    EXPECT_TRUE(clock.sleeps.empty());
    first.answer = 0;
    left = 2;
    EXPECT_TRUE(loop.Run([&] { return left-- > 0; }));
    EXPECT_EQ(clock.sleeps.size(), 2U);
}

TEST_F(Loop, AFailureIsShownOnceAndCostsOneEventOnly)
{
    loop.Advise(first);
    loop.Advise(second);
    first.action = [] { throw host::InterfaceError(-5, "MainWindow"); };
    EXPECT_FALSE(loop.Run([] { return true; })) << "a loop without a user ends";
    ASSERT_EQ(messages.shown.size(), 1U);
    EXPECT_EQ(messages.shown[0].number, hosts::messageInterfaceFailed);
    EXPECT_EQ(messages.shown[0].first, L"MainWindow");
    EXPECT_EQ(messages.shown[0].second, L"-5");

    EXPECT_TRUE(loop.Raise()) << "the other sink has its events";
    EXPECT_EQ(second.events, 2);
    EXPECT_EQ(messages.shown.size(), 1U) << "no flood";
    first.action = [] { throw std::runtime_error("another"); };
    loop.Raise();
    loop.Raise();
    ASSERT_EQ(messages.shown.size(), 2U);
    EXPECT_EQ(messages.shown[1].text, L"another");
    first.action = nullptr;
    loop.Raise();
    clock.Advance(61.0);
    first.action = [] { throw std::runtime_error("another"); };
    loop.Raise();
    EXPECT_EQ(messages.shown.size(), 3U) << "it is new again";
}

struct Document : host::ManagedDocument
{
    explicit Document(std::string& shared) : log(shared) {}
    ~Document() override { log += "gone "; }
    bool OnNewDocument() override { return accepts; }
    bool OnOpenDocument(const std::wstring&) override { return accepts; }
    bool OnSaveDocument(const std::wstring&) override { return accepts; }
    void OnCloseDocument() override { log += "closed "; }

    static inline bool accepts = true;
    std::string& log;
};

TEST(DocumentList, ARefusedDocumentLeavesTheActiveOne)
{
    std::string log;
    hosts::DocumentList list;
    EXPECT_EQ(list.NewDocument(), nullptr) << "nothing is registered";
    list.RegisterTemplate({1, L"", L".xml", [&] { return std::make_unique<Document>(log); }});
    host::ManagedDocument* first = list.NewDocument();
    ASSERT_NE(first, nullptr);
    Document::accepts = false;
    EXPECT_EQ(list.OpenDocument(L"\\a.xml"), nullptr);
    EXPECT_EQ(list.NewDocument(), nullptr);
    Document::accepts = true;
    EXPECT_EQ(log, "gone gone ");
    EXPECT_EQ(list.GetActiveDocument(), first);
    host::ManagedDocument* second = list.OpenDocument(L"\\b.xml");
    EXPECT_EQ(list.GetActiveDocument(), second);
    list.CloseActiveDocument();
    EXPECT_EQ(list.GetActiveDocument(), first);
    list.ReleaseTemplate();
    EXPECT_EQ(list.NewDocument(), nullptr);
    list.CloseActiveDocument();
    list.CloseActiveDocument();
    EXPECT_EQ(list.GetActiveDocument(), nullptr);
    EXPECT_EQ(log, "gone gone closed gone closed gone ");
}

} // namespace
