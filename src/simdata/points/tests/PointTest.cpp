#include <algorithm>

#include <gtest/gtest.h>

#include "simdata/points/MessageStack.h"
#include "simdata/points/SimulationDataPoint.h"
#include "simdata/points/SimulationDataTracker.h"
#include "simdata/points/StringConverter.h"
#include "simdata/points/tests/TestRun.h"

using namespace SimulationDataPoints;

namespace
{

/// The least that a point can be, with the base's protected side open to the test.
class TestPoint : public VtCSimulationDataPoint
{
public:
    explicit TestPoint(const std::wstring& called = L"Test") : VtCSimulationDataPoint(called) {}

    void Disconnect() override {}
    int Connect() override { return StartBuffer(); }
    void GetSourceType(std::wstring& text) const override { text = type; }
    void GetSourcePath(std::wstring& text) const override { text = path; }
    int Configure(const std::wstring&, const std::wstring&, int, int) override { return 0; }
    VtCSimulationDataFrame* GetCurrentFrame(unsigned long& frame) override { return NewestFrame(frame); }

    using VtCSimulationDataPoint::AppendFrame;
    using VtCSimulationDataPoint::SetDescription;
    using VtCSimulationDataPoint::TakeBuffer;

    std::wstring type;
    std::wstring path;
};

int IdOf(VtCSimulationDataFrame* frame)
{
    return frame != nullptr ? frame->GetFrameId() : 0;
}

} // namespace

TEST(Point, ALiveRingHasTheCursorOnItsNewestFrame)
{
    TestPoint point;
    unsigned long number = 0;
    unsigned long count = 99;
    double t = -1.0;
    EXPECT_EQ(point.Connect(), 0) << "without channels";
    ASSERT_NE(point.GetMessageStack(), nullptr);
    point.ResetMessageStack();
    EXPECT_EQ(point.GetMessageStack(), nullptr);
    EXPECT_EQ(point.GetRecent(number), nullptr);
    EXPECT_EQ(point.GetBufferedFrames(count), 0);
    EXPECT_EQ(count, 0u);
    EXPECT_EQ(point.GetTimeStampOfCurrentElement(t) + point.GetFrameBufferEarliestTime(t), 0);
    int message = 0;
    EXPECT_EQ(point.GetFrameBufferTrackSafety(), TRACK_UNSAFE);
    EXPECT_EQ(point.GetTrackSafety(message), TRACK_UNSAFE);
    EXPECT_EQ(message, 434);

    point.SetFrameBufferSize(3);
    point.SetDescription(CarChannels());
    ASSERT_NE(point.Connect(), 0);
    EXPECT_EQ(point.GetFrameBufferSizeEx(), 3);
    for (int i = 1; i <= 5; ++i)
        point.AppendFrame(i);
    EXPECT_NE(point.GetBufferedFrames(count), 0);
    EXPECT_EQ(count, 3u);
    EXPECT_EQ(point.GetRecent(number)->GetTimestamp(), 5.0);
    EXPECT_EQ(number, 3u);
    EXPECT_NE(point.GetFrameBufferEarliestTime(t), 0);
    EXPECT_EQ(t, 3.0);
    EXPECT_NE(point.GetFrameBufferLatestTime(t), 0);
    EXPECT_EQ(t, 5.0);

    point.SetFrameBufferSize(2);
    EXPECT_EQ(point.GetRecent(number)->GetTimestamp(), 5.0);
    EXPECT_EQ(number, 2u);
    point.SetFrameBufferSize(10);
    point.AppendFrame(6.0);
    EXPECT_EQ(point.GetBufferedFrames(count) * count, 3u);
}

TEST(Point, TheCursorMovesByNumberAndByTime)
{
    TestPoint point;
    point.TakeBuffer(FramesAt({0, 1, 2, 3}));
    unsigned long number = 0;
    double t = 0.0;
    EXPECT_EQ(IdOf(point.GetRecent(number)), 1);
    EXPECT_EQ(point.SetRecent(0) + point.SetRecent(5), 0);
    EXPECT_NE(point.SetRecent(3), 0);
    EXPECT_EQ(IdOf(point.GetNextFrame(number)), 4);
    EXPECT_EQ(point.GetNextFrame(number), nullptr);
    EXPECT_EQ(IdOf(point.GetPreviousFrame(number)), 3);
    EXPECT_EQ(IdOf(point.GetAtTime(1.4)), 2);
    EXPECT_NE(point.GetTimeStampOfCurrentElement(t), 0);
    EXPECT_EQ(t, 1.0);
    EXPECT_EQ(point.GetAtTime(3.5), nullptr);
    EXPECT_EQ(IdOf(point.GetRecent(number)), 2) << "a time without a frame leaves the cursor";
    point.SetFrameBufferRepeat(1);
    EXPECT_EQ(IdOf(point.GetAtTime(4.5)), 2);
    point.SetRecent(1);
    EXPECT_EQ(point.GetPreviousFrame(number), nullptr);

    point.SetTimestampSupport(0);
    EXPECT_EQ(point.GetAtTime(1.0), nullptr);
    EXPECT_EQ(point.GetTimeStampOfCurrentElement(t), 0);
}

TEST(Point, TheSpoolShowsTheEndAndStops)
{
    struct Step
    {
        bool back;
        double start, elapsed, speed;
        int id; ///< 0: null
        int wrapped;
    };
    struct Case
    {
        const char* name;
        int repeat;
        unsigned long cursor;
        std::vector<Step> steps;
    };
    const Case cases[] = {
        {"elapsed times speed, as it is told", 0, 9, {{true, 8, 1, 2, 7, 0}, {true, 8, 2.4, 2, 4, 0}}},
        {"back over the start", 0, 4, {{true, 3, 2, 1, 2, 0}, {true, 3, 5, 1, 1, 0}, {true, 3, 6, 1, 0, 0}}},
        {"back from the first frame", 0, 1, {{true, 0, 0.5, 1, 0, 0}}},
        {"back from beyond the end", 0, 9, {{true, 12, 2, 1, 11, 0}, {true, 12, 5, 1, 8, 0}}},
        {"forward over the end", 0, 8, {{false, 7, 2.5, 1, 10, 0}, {false, 7, 9, 1, 11, 0}, {false, 7, 9, 1, 0, 0}}},
        {"back round", 1, 2, {{true, 1, 2, 1, 10, 1}, {true, 1, 1, 1, 1, 0}, {true, 1, 22, 1, 10, 1}}},
        {"forward round", 1, 9, {{false, 8, 2, 1, 11, 0}, {false, 8, 3, 1, 2, 1}}},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.name);
        TestPoint point;
        point.TakeBuffer(FramesAt({0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10}));
        point.SetFrameBufferRepeat(c.repeat);
        point.SetRecent(c.cursor);
        for (const Step& step : c.steps)
        {
            unsigned long number = 0;
            int wrapped = 9;
            VtCSimulationDataFrame* frame =
                step.back ? point.Rewind(step.start, step.elapsed, step.speed, number, wrapped)
                          : point.FastForward(step.start, step.elapsed, step.speed, number, wrapped);
            EXPECT_EQ(IdOf(frame), step.id) << step.elapsed;
            EXPECT_EQ(wrapped, step.wrapped) << step.elapsed;
            EXPECT_EQ(number, static_cast<unsigned long>(step.id));
        }
    }
}

TEST(Point, ConfigurationTextsSurviveTheirSeparator)
{
    const std::wstring sources[] = {L"", L"C:\\runs\\a.mdf", L"|a|b||", L"100%7C%", L"\u00e4|\u20ac"};
    for (const std::wstring& source : sources)
        for (const std::wstring& name : {std::wstring(L"File"), std::wstring(L"a|b%7C%25")})
        {
            TestPoint point(name);
            point.type = L"M|DF%";
            point.path = source;
            std::wstring kind, type, path;
            ASSERT_NE(VtCSimulationDataPoint::ExtractConfigurationInfoText(point.GetConfigurationInfoText(0), &kind,
                                                                           &type, &path),
                      0);
            EXPECT_EQ(kind, name);
            EXPECT_EQ(type, L"M|DF%");
            EXPECT_EQ(path, source);
            EXPECT_NE(VtCSimulationDataPoint::ExtractConfigurationInfoText(L"File||x", nullptr, nullptr, nullptr), 0);
        }
    std::wstring kind = L"kept";
    for (const wchar_t* text : {L"", L"<None>", L"File|x", L"|x|y"})
        EXPECT_EQ(VtCSimulationDataPoint::ExtractConfigurationInfoText(text, &kind, nullptr, nullptr), 0) << text;
    EXPECT_EQ(kind, L"kept");
}

TEST(StringConverter, TakesWholeNumbersOnly)
{
    const VtCStringConverter& convert = VtCStringConverter::getStringConverter();
    struct Case
    {
        const wchar_t* text;
        int base;
        bool good;
        int value;
    };
    const Case cases[] = {
        {L" 42 ", 10, true, 42}, {L"0xFF", 16, true, 255},      {L"101", 2, true, 5}, {L"12a", 10, false, 0},
        {L"", 10, false, 0},     {L"2147483648", 10, false, 0}, {L"7", 1, false, 0},
    };
    for (const Case& c : cases)
    {
        int value = 0;
        EXPECT_EQ(convert.convertCStringToNumber(c.text, value, c.base) != 0, c.good) << c.text;
        EXPECT_EQ(value, c.value) << c.text;
    }
    float single = 1.0F;
    double number = 1.0;
    EXPECT_NE(convert.convertCStringToNumber(L"0.1", single), 0);
    EXPECT_EQ(single, 0.1F);
    EXPECT_NE(convert.convertCStringToNumber(L"-2.5e3", number), 0);
    EXPECT_EQ(number, -2500.0);
    EXPECT_EQ(convert.convertCStringToNumber(L"0,1", number), 0);
    EXPECT_EQ(number, -2500.0);

    std::vector<std::wstring*> tokens;
    EXPECT_EQ(VtCStringConverter::tokenizeAll(L"|a||b;c|", tokens, L"|;"), 3);
    EXPECT_EQ(VtCStringConverter::tokenizeAll(L"", tokens, L"|"), 0);
    ASSERT_EQ(tokens.size(), 3u);
    EXPECT_EQ(*tokens[0] + *tokens[1] + *tokens[2], L"abc");
    VtCStringConverter::freeStrings(tokens);
    EXPECT_TRUE(tokens.empty());
}

TEST(Tracker, WalksItsFramesInOrder)
{
    const auto frames = FramesAt({0, 1, 2});
    VtCSimulationDataTracker tracker;
    EXPECT_EQ(tracker.GetHead(), nullptr);
    EXPECT_EQ(tracker.RemoveHead(), nullptr);
    tracker.AddTail(frames->GetFrame(1));
    tracker.AddTail(frames->GetFrame(2));
    tracker.AddHead(frames->GetFrame(0));
    tracker.SetAt(9, nullptr);
    std::vector<int> ids;
    for (auto position = tracker.GetHeadPosition(); position != 0;)
        ids.push_back(IdOf(tracker.GetNext(position)));
    EXPECT_EQ(ids, (std::vector<int>{1, 2, 3}));
    tracker.SetAt(tracker.GetHeadPosition(), frames->GetFrame(2));
    EXPECT_EQ(IdOf(tracker.RemoveHead()), 3);
    EXPECT_EQ(IdOf(tracker.GetHead()), 2);
}

TEST(MessageStack, AFloodIsCountedNotKept)
{
    VtCMessageStack stack;
    stack.AddNumbered(VtEMessageSeverity::warning, 453, L"Track 1");
    for (int i = 0; i < 1000; ++i)
        stack.Add(VtEMessageSeverity::error, L"again");
    EXPECT_EQ(stack.GetMessages().size(), VtCMessageStack::maxMessages);
    EXPECT_EQ(stack.GetDropped(), 1001 - VtCMessageStack::maxMessages);
    EXPECT_EQ(stack.GetMessages()[0].number, 453u);
    stack.Reset();
    EXPECT_TRUE(stack.IsEmpty());
}
