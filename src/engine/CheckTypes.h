#pragma once

#include <cstdint>

// The kind of a check: the first part of every check identifier. The codes are fixed; the
// gaps (5, 15, 34) stay unused. CheckAppFileExists and CheckAppFileVersion share code 4 on
// purpose: for one file they are the same check, and the version check only runs because
// the existence check queues it from inside its own Check().
namespace vtr::CheckType {

inline constexpr int32_t PostInstall = 0;
inline constexpr int32_t AppPathRegEntry = 1;
inline constexpr int32_t AppPathExists = 2;
inline constexpr int32_t AppPathMatches = 3;
inline constexpr int32_t AppFileExists = 4;
inline constexpr int32_t AppFileVersion = 4;
inline constexpr int32_t WMP = 6;
inline constexpr int32_t UserDataPathRegEntry = 7;
inline constexpr int32_t UserDataPathExists = 8;
inline constexpr int32_t NonMediaPathRegEntry = 9;
inline constexpr int32_t NonMediaPathExists = 10;
inline constexpr int32_t MediaPathRegEntry = 11;
inline constexpr int32_t MediaPathExists = 12;
inline constexpr int32_t WeeklyScheduleExists = 13;
inline constexpr int32_t YearlyScheduleExists = 14;
inline constexpr int32_t ShowIsScheduled = 16;
inline constexpr int32_t ShowFileExists = 17;
inline constexpr int32_t LoadShowFile = 18;
inline constexpr int32_t SequenceFileExists = 19;
inline constexpr int32_t SequenceLoads = 20;
inline constexpr int32_t ShowHasSequence = 21;
inline constexpr int32_t MediaFileExists = 22;
inline constexpr int32_t SeqChannelConflicts = 23;
inline constexpr int32_t ChannelsHaveEvents = 24;
inline constexpr int32_t SequenceHasEvents = 25;
inline constexpr int32_t ChannelsHaveSettings = 26;
inline constexpr int32_t UsedNetworksDefined = 27;
inline constexpr int32_t ChannelLengthConflicts = 28;
inline constexpr int32_t SequenceIsNonmusical = 29;
inline constexpr int32_t ShellCommandMapExists = 30;
inline constexpr int32_t ShellCommandSet = 31;
inline constexpr int32_t IntersequenceConflicts = 32;
inline constexpr int32_t OldKRP = 33;
inline constexpr int32_t UseCompressedSequences = 35;
inline constexpr int32_t ShowPlayerMemRestarts = 36;
inline constexpr int32_t TriggerDefinedNetwork = 37;
inline constexpr int32_t TrigNetNotEnhanced = 38;

}  // namespace vtr::CheckType
