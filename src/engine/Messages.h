#pragma once

#include <cstdint>

#include "engine/Result.h"

namespace vtr {

// One entry of the message catalog: what a result of that kind carries. The help-context id
// equals the message number up to message 44 and differs from message 45 on.
struct Message {
    int32_t number;
    int32_t helpContextId;
    vtr::Severity severity;
    const char* summary;
};

// The catalog. Every result the verifier produces is one of these; checks raise them with
// LibVerify::AddResult(Messages::X, details).
namespace Messages {

inline constexpr Message NoPlaybackFileName{0, 0, Severity::Error, "No Playback File Name"};
inline constexpr Message NoErrorsOrWarnings{1, 1, Severity::Info, "No errors or warnings found"};
inline constexpr Message VerificationCancelled{2, 2, Severity::Warning, "Verification cancelled"};
inline constexpr Message NotFullyInstalled{3, 3, Severity::Error, "Vantori is not fully installed"};
inline constexpr Message NoAppPathRegEntry{4, 4, Severity::Error,
                                           "No registry entry for application path"};
inline constexpr Message AppDirectoryMissing{5, 5, Severity::Error,
                                             "Application directory does not exist"};
inline constexpr Message NotRunningFromAppPath{6, 6, Severity::Warning,
                                               "Verifier not running from VTR application path"};
inline constexpr Message AppFileMissing{7, 7, Severity::Error, "Application file does not exist"};
inline constexpr Message UnsupportedMediaPlayer{9, 9, Severity::Warning,
                                                "Unsupported version of Windows Media Player"};
inline constexpr Message NoUserDataPathRegEntry{10, 10, Severity::Error,
                                                "No registry entry for user data path"};
inline constexpr Message UserDataDirectoryMissing{11, 11, Severity::Error,
                                                  "User data directory does not exist"};
inline constexpr Message NoNonMediaPathRegEntry{12, 12, Severity::Warning,
                                                "No registry entry for non-media data path"};
inline constexpr Message NonMediaDirectoryMissing{13, 13, Severity::Warning,
                                                  "Non-media data directory does not exist"};
inline constexpr Message NoMediaPathRegEntry{14, 14, Severity::Warning,
                                             "No registry entry for media data path"};
inline constexpr Message MediaDirectoryMissing{15, 15, Severity::Warning,
                                               "Media data directory does not exist"};
inline constexpr Message AppFileUnexpectedVersion{16, 16, Severity::Error,
                                                  "Application file has unexpected version number"};
inline constexpr Message WeeklyScheduleMissing{17, 17, Severity::Warning,
                                               "Weekly schedule file does not exist"};
inline constexpr Message YearlyScheduleMissing{18, 18, Severity::Warning,
                                               "Yearly schedule file does not exist"};
inline constexpr Message NoShowsScheduled{20, 20, Severity::Warning, "No shows are scheduled"};
inline constexpr Message ShowFileMissing{21, 21, Severity::Error, "Show file does not exist"};
inline constexpr Message ShowFileUnreadable{22, 22, Severity::Error, "Error reading show file"};
inline constexpr Message SequenceFileMissing{23, 23, Severity::Error,
                                             "Sequence file does not exist"};
inline constexpr Message SequenceCannotLoad{24, 24, Severity::Error,
                                            "Sequence file cannot be loaded"};
inline constexpr Message ShowHasNoSequences{25, 25, Severity::Warning, "Show has no sequences"};
inline constexpr Message MediaFileMissing{26, 26, Severity::Error, "Media file does not exist"};
inline constexpr Message SequenceChannelSettingsConflict{
    27, 27, Severity::Warning, "Conflicting channel settings in sequence"};
inline constexpr Message ChannelCompletelyOff{28, 28, Severity::Warning,
                                              "Channel is completely off"};
inline constexpr Message SequenceCompletelyOff{29, 29, Severity::Warning,
                                               "Sequence is completely off"};
inline constexpr Message ChannelMissingSettings{30, 30, Severity::Warning,
                                                "Channel is missing settings"};
inline constexpr Message ChannelUndefinedNetwork{31, 31, Severity::Warning,
                                                 "Channel uses undefined comm network"};
inline constexpr Message ChannelLengthConflict{32, 32, Severity::Warning,
                                               "Channel in tracks of conflicting length"};
inline constexpr Message MusicalInNonAudioSection{33, 33, Severity::Warning,
                                                  "Musical file used in non-audio section of show"};
inline constexpr Message ShellCommandMapMissing{41, 41, Severity::Warning,
                                                "Shell command map file does not exist"};
inline constexpr Message ShellCommandNotSet{42, 42, Severity::Warning, "Shell command not set"};
inline constexpr Message ChannelConflict{43, 43, Severity::Warning, "Channel conflict"};
inline constexpr Message OldKRPEnabled{44, 44, Severity::Warning, "Old KR-P compatibility enabled"};
inline constexpr Message SequenceIntensityFileSettingsConflict{
    45, 47, Severity::Warning, "Channel settings conflict in sequence/intensity file"};
inline constexpr Message IntensityFileSettingsConflict{
    46, 48, Severity::Warning, "Channel settings conflict in intensity file"};
inline constexpr Message IntensityFileConflict{47, 49, Severity::Warning,
                                               "Intensity file conflict"};
inline constexpr Message ChannelIntensityFileConflict{48, 50, Severity::Warning,
                                                      "Channel/intensity file conflict"};
inline constexpr Message IntensityFileUndefinedNetwork{
    49, 51, Severity::Warning, "Intensity file uses undefined comm network"};
inline constexpr Message CompressedSequencesDisabled{51, 54, Severity::Warning,
                                                     "Use Compressed Sequences disabled"};
inline constexpr Message MemoryRestartsDisabled{52, 55, Severity::Warning,
                                                "Show Player Memory Restarts disabled"};
inline constexpr Message TriggerUndefinedNetwork{53, 56, Severity::Warning,
                                                 "Trigger uses undefined network"};
inline constexpr Message TriggerUsesEnhancedNetwork{54, 57, Severity::Warning,
                                                    "Trigger uses VTR Enhanced network"};

// Every entry, in message-number order (for tests and the help viewer's index).
inline constexpr Message kAll[] = {
    NoPlaybackFileName,
    NoErrorsOrWarnings,
    VerificationCancelled,
    NotFullyInstalled,
    NoAppPathRegEntry,
    AppDirectoryMissing,
    NotRunningFromAppPath,
    AppFileMissing,
    UnsupportedMediaPlayer,
    NoUserDataPathRegEntry,
    UserDataDirectoryMissing,
    NoNonMediaPathRegEntry,
    NonMediaDirectoryMissing,
    NoMediaPathRegEntry,
    MediaDirectoryMissing,
    AppFileUnexpectedVersion,
    WeeklyScheduleMissing,
    YearlyScheduleMissing,
    NoShowsScheduled,
    ShowFileMissing,
    ShowFileUnreadable,
    SequenceFileMissing,
    SequenceCannotLoad,
    ShowHasNoSequences,
    MediaFileMissing,
    SequenceChannelSettingsConflict,
    ChannelCompletelyOff,
    SequenceCompletelyOff,
    ChannelMissingSettings,
    ChannelUndefinedNetwork,
    ChannelLengthConflict,
    MusicalInNonAudioSection,
    ShellCommandMapMissing,
    ShellCommandNotSet,
    ChannelConflict,
    OldKRPEnabled,
    SequenceIntensityFileSettingsConflict,
    IntensityFileSettingsConflict,
    IntensityFileConflict,
    ChannelIntensityFileConflict,
    IntensityFileUndefinedNetwork,
    CompressedSequencesDisabled,
    MemoryRestartsDisabled,
    TriggerUndefinedNetwork,
    TriggerUsesEnhancedNetwork,
};

}  // namespace Messages
}  // namespace vtr
