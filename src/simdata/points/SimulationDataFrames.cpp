#include "simdata/points/SimulationDataFrames.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace SimulationDataPoints
{

VtCSimulationDataFrames::VtCSimulationDataFrames(std::shared_ptr<const VtTChannelDescription> channels,
                                                 std::size_t capacityInFrames)
    : description(std::move(channels)),
      capacity(std::max<std::size_t>(capacityInFrames, 1)),
      stride(description->Stride()),
      records(VtCFrameBlock::Product(capacity, stride)),
      timeBlock(VtCFrameBlock::Product(capacity, sizeof(double))),
      times(reinterpret_cast<double*>(timeBlock.Data()))
{
    for (auto& view : views)
        view.reset(new VtCSimulationDataFrame(description));
}

VtCSimulationDataFrames::~VtCSimulationDataFrames() = default;

VtCSimulationDataFrame* VtCSimulationDataFrames::GetNext(unsigned long& position, int* wrapped)
{
    if (wrapped != nullptr)
        *wrapped = 0;
    if (position < count)
        return HandOut(position++);
    if (repeating && count > 0)
    {
        position = 0;
        if (wrapped != nullptr)
            *wrapped = 1;
    }
    return nullptr;
}

VtCSimulationDataFrame* VtCSimulationDataFrames::GetAtTime(double t, int)
{
    const std::optional<std::size_t> index = FindAtTime(t);
    return index ? HandOut(*index) : nullptr;
}

double VtCSimulationDataFrames::ComputeLatestTime() const
{
    return count > 0 && description->timeStamps ? GetTimeAt(count - 1) : 0.0;
}

int VtCSimulationDataFrames::PrepareForTimeSyncReplay(int repeat, unsigned long)
{
    repeating = repeat != 0;
    return count > 0;
}

VtCSimulationDataFrame* VtCSimulationDataFrames::GetFrame(std::size_t index)
{
    return index < count ? HandOut(index) : nullptr;
}

std::optional<std::size_t> VtCSimulationDataFrames::FindAtTime(double t) const
{
    if (count == 0 || !description->timeStamps)
        return {};
    const double first = GetTimeAt(0);
    const double last = GetTimeAt(count - 1);
    t = VtCSimulationDataFrame::RoundTimeStamp(t);
    if (!(t >= first))
        return {};
    if (t > last)
    {
        if (!repeating || !std::isfinite(t))
            return {};
        bool wrapped = false;
        t = WrapIntoSpan(t, wrapped);
    }
    if (t >= last)
        return count - 1;
    return grid.IsEven() ? grid.Find(t) - (grid.GetCount() - count) : Search(t);
}

std::size_t VtCSimulationDataFrames::Search(double t) const
{
    const double first = GetTimeAt(0);
    const double last = GetTimeAt(count - 1);

    // From here on times[low] <= t < times[high]. Stamps are mostly even, so the guess is right or next to it; where
    // they aren't, doubling steps from the guess bracket the frame and halving ends the search: 2 log2(n) looks.
    std::size_t low = 0;
    std::size_t high = count - 1;
    const double share = (t - first) / (last - first);
    const std::size_t guess = std::min(static_cast<std::size_t>(share * static_cast<double>(high)), high - 1);
    std::size_t step = 1;
    if (GetTimeAt(guess) <= t)
    {
        low = guess;
        while (low + step < high && GetTimeAt(low + step) <= t)
        {
            low += step;
            step *= 2;
        }
        high = std::min(high, low + step);
    }
    else
    {
        high = guess;
        while (high > step && GetTimeAt(high - step) > t)
        {
            high -= step;
            step *= 2;
        }
        low = high > step ? high - step : 0;
    }
    while (high - low > 1)
    {
        const std::size_t middle = low + (high - low) / 2;
        (GetTimeAt(middle) <= t ? low : high) = middle;
    }
    return low;
}

double VtCSimulationDataFrames::WrapIntoSpan(double t, bool& wrapped) const
{
    const double first = GetTimeAt(0);
    const double last = GetTimeAt(count - 1);
    wrapped = t < first || t > last;
    if (!wrapped)
        return t;
    const double span = last - first;
    if (!(span > 0.0) || !std::isfinite(t))
        return last;
    const double inside = t > last ? first + std::fmod(t - last, span) : last - std::fmod(first - t, span);
    return std::clamp(VtCSimulationDataFrame::RoundTimeStamp(inside), first, last);
}

VtCFrameRecord VtCSimulationDataFrames::Append(double time)
{
    time = std::isfinite(time) ? VtCSimulationDataFrame::RoundTimeStamp(time) : 0.0;
    if (count > 0)
        time = std::max(time, GetTimeAt(count - 1));
    if (count < capacity)
        ++count;
    else
        oldest = Physical(1);

    const std::size_t at = Physical(count - 1);
    std::byte* record = records.Data() + at * stride;
    std::memset(record, 0, stride);
    std::memcpy(record, &time, sizeof time);
    times[at] = time;
    grid.Add(time);
    return {record, *description};
}

std::unique_ptr<VtCSimulationDataFrames> VtCSimulationDataFrames::Copy(std::size_t newCapacity) const
{
    auto copy = std::make_unique<VtCSimulationDataFrames>(description, newCapacity);
    copy->repeating = repeating;
    for (std::size_t index = count - std::min(count, copy->capacity); index < count;)
    {
        const std::size_t from = Physical(index);
        const std::size_t run = std::min(count - index, capacity - from);
        std::memcpy(copy->FreeRecords(), records.Data() + from * stride, run * stride);
        std::memcpy(copy->times + copy->count, times + from, run * sizeof(double));
        copy->count += run;
        index += run;
    }
    copy->grid = grid;
    return copy;
}

VtCSimulationDataFrame* VtCSimulationDataFrames::HandOut(std::size_t index)
{
    const std::size_t at = Physical(index);
    const std::byte* record = records.Data() + at * stride;
    const double time = grid.IsEven()
                            ? VtCSimulationDataFrame::RoundTimeStamp(grid.StampAt(grid.GetCount() - count + index))
                            : times[at];
    VtCSimulationDataFrame& last = *views[lastView];
    if (last.record == record && last.number == index + 1 && last.time == time)
        return &last;
    lastView = (lastView + 1) % viewCount;
    views[lastView]->Bind(record, time, index + 1);
    return views[lastView].get();
}

} // namespace SimulationDataPoints
