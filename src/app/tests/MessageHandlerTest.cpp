#include <gtest/gtest.h>

#include "app/PanoramicMessageHandler.h"
#include "simdata/points/MessageStack.h"
#include "tests/support/FakeHost.h"

namespace
{

TEST(MessageHandler, EveryMessageHasItsSeverityCategoryAndTitle)
{
    fake::MessageService service;
    const std::wstring name = L"Panoramic";
    VtCPanoramicMessageHandler handler(name);
    EXPECT_EQ(handler.ShowError(496, L"a"), nullptr) << "not connected yet";

    handler.SetMessageService(&service);
    const auto shown = handler.ShowError(496, L"scene.xml", L"reason");
    handler.ShowWarning(417);
    handler.ShowInformation(529, L"run.mdf");
    handler.Log(1);
    ASSERT_NE(shown, nullptr);
    EXPECT_EQ(shown->number, 496U);

    struct Expected
    {
        std::uint32_t number;
        host::Severity severity;
        bool interrupts;
    };
    const Expected expected[] = {{496, host::Severity::error, true},
                                 {417, host::Severity::warning, true},
                                 {529, host::Severity::information, true},
                                 {1, host::Severity::information, false}};
    ASSERT_EQ(service.shown.size(), std::size(expected));
    for (std::size_t i = 0; i < std::size(expected); ++i)
    {
        EXPECT_EQ(service.shown[i].number, expected[i].number);
        EXPECT_EQ(service.shown[i].severity, expected[i].severity);
        EXPECT_EQ(service.shown[i].interrupts, expected[i].interrupts);
        EXPECT_EQ(service.shown[i].category, L"Panoramic");
        EXPECT_EQ(service.shown[i].title, L"Panoramic");
    }
    EXPECT_EQ(service.shown[0].first, L"scene.xml");
    EXPECT_EQ(service.shown[0].second, L"reason");

    handler.SetMessageService(nullptr);
    EXPECT_EQ(handler.ShowError(496), nullptr);
    EXPECT_EQ(service.shown.size(), std::size(expected));
}

TEST(MessageHandler, AStackIsShownInOrderWithWhatDidNotFitCounted)
{
    using namespace SimulationDataPoints;
    fake::MessageService service;
    const std::wstring name = L"Panoramic";
    VtCPanoramicMessageHandler handler(name);
    handler.SetMessageService(&service);

    VtCMessageStack stack;
    stack.Add(VtEMessageSeverity::warning, L"3 bytes too many");
    stack.AddNumbered(VtEMessageSeverity::error, 530, L"run.mdf");
    handler.ReportStack(stack);
    ASSERT_EQ(service.shown.size(), 2U);
    EXPECT_EQ(service.shown[0].number, 0U);
    EXPECT_EQ(service.shown[0].text, L"3 bytes too many");
    EXPECT_EQ(service.shown[0].severity, host::Severity::warning);
    EXPECT_EQ(service.shown[0].title, L"Panoramic");
    EXPECT_EQ(service.shown[1].number, 530U);
    EXPECT_EQ(service.shown[1].first, L"run.mdf");
    EXPECT_EQ(service.shown[1].severity, host::Severity::error);

    service.shown.clear();
    for (std::size_t i = 0; i < VtCMessageStack::maxMessages + 3; ++i)
        stack.Add(VtEMessageSeverity::information, L"again");
    handler.ReportStack(stack, L"File");
    EXPECT_EQ(service.shown.size(), VtCMessageStack::maxMessages + 1);
    EXPECT_EQ(service.shown.back().first, L"5");
    EXPECT_EQ(service.shown.back().title, L"File");
}

} // namespace
