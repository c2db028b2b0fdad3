#pragma once

#include <cstdint>

/// Messages of the command itself, by their number in the texts.
namespace console
{

inline constexpr std::uint32_t messageSceneNotReadable = 496;   ///< the component's own; %1 the file, %2 the reason
inline constexpr std::uint32_t messageNoChannel = 9112;         ///< %1 the body, %2 the channel
inline constexpr std::uint32_t messageChannelsAre = 9113;       ///< %1 their names
inline constexpr std::uint32_t messageTimeOutside = 9114;       ///< %1 the time, %2 the span
inline constexpr std::uint32_t messageNoSuchFrame = 9115;       ///< %1 the frame, %2 the range
inline constexpr std::uint32_t messageNoTimeStamps = 9116;      ///< %1 the file
inline constexpr std::uint32_t messageNoObserver = 9117;        ///< %1 the observer, %2 those there are
inline constexpr std::uint32_t messagePictureNotWritten = 9120; ///< %1 file and reason
inline constexpr std::uint32_t messagePictureNotRead = 9121;
inline constexpr std::uint32_t messageFolderNotMade = 9122; ///< %1 folder and reason
inline constexpr std::uint32_t messageConversion = 9123;    ///< %1 file, place and reason
inline constexpr std::uint32_t messageAlwaysHeadless = 9124;
inline constexpr std::uint32_t messageInterrupted = 9125;
inline constexpr std::uint32_t messageIsInput = 9126;          ///< %1 the file
inline constexpr std::uint32_t messageNoSource = 9127;         ///< %1 the data point, %2 those there are
inline constexpr std::uint32_t messageSourceRefuses = 9128;    ///< %1 the data point, %2 its options
inline constexpr std::uint32_t messageSourceHasOwnTime = 9129; ///< %1 the data point
inline constexpr std::uint32_t textPlaying = 9130;

} // namespace console
