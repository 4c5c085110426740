#include "engine/MessageAdvice.h"

#include "engine/Messages.h"

namespace vtr::MessageAdvice {
namespace {

struct Entry {
    const Message& message;
    const char* advice;
};

// One entry per message of the catalog (a test holds the two lists equal).
const Entry kAdvice[] = {
    {Messages::NoPlaybackFileName,
     "The sequence file of the newer kind does not name a file the show player can play, so "
     "nothing plays for it. Open the sequence in the suite, save it again so that it names its "
     "playback file, and verify again."},
    {Messages::NoErrorsOrWarnings, "Nothing to do: every check passed."},
    {Messages::VerificationCancelled,
     "The verification was stopped before every check ran, so this report is incomplete: what "
     "was not checked may still go wrong. Verify again and let it finish."},
    {Messages::NotFullyInstalled,
     "The suite's setup has not finished for this user, so the Verifier checks nothing else. "
     "Start the suite once (or run its setup again) and verify again."},
    {Messages::NoAppPathRegEntry,
     "The settings do not say where the suite's programs are. Repair or reinstall the suite; on "
     "a machine with an exported copy of the settings, export them again from a complete "
     "installation."},
    {Messages::AppDirectoryMissing,
     "The application folder named in the settings (the detail) does not exist. Reinstall the "
     "suite there, or correct the folder in the settings."},
    {Messages::NotRunningFromAppPath,
     "The Verifier runs from another folder than the suite's programs. Usually harmless; to be "
     "sure the files checked are the ones the show player uses, run the Verifier installed with "
     "the suite."},
    {Messages::AppFileMissing,
     "A program file of the suite (the detail) is missing from the application folder. Repair "
     "or reinstall the suite."},
    {Messages::UnsupportedMediaPlayer,
     "Musical sequences need version 9 or later of the system's media player, and this machine "
     "has an older one or none. Install a current media player on the machine that runs the "
     "show."},
    {Messages::NoUserDataPathRegEntry,
     "The settings do not say where the shows and schedules are kept, so no schedule is "
     "checked. Start the suite once to set its data folder, or export the settings again."},
    {Messages::UserDataDirectoryMissing,
     "The user data folder named in the settings (the detail) does not exist, so no schedule "
     "is checked. Create it or correct the setting."},
    {Messages::NoNonMediaPathRegEntry,
     "No folder for sequences and other non-media data is set. Set it in the suite's "
     "preferences."},
    {Messages::NonMediaDirectoryMissing,
     "The non-media data folder named in the settings (the detail) does not exist. Create it or "
     "correct the folder in the suite's preferences."},
    {Messages::NoMediaPathRegEntry,
     "No folder for audio files is set, so musical sequences cannot find their music. Set it in "
     "the suite's preferences."},
    {Messages::MediaDirectoryMissing,
     "The media folder named in the settings (the detail) does not exist, so musical sequences "
     "cannot find their music. Create it or correct the folder in the suite's preferences."},
    {Messages::AppFileUnexpectedVersion,
     "A program file of the suite has another version than this Verifier expects: the "
     "installation is mixed or only partly updated. Install the update completely, or "
     "reinstall the suite, so that every file has the expected version."},
    {Messages::WeeklyScheduleMissing,
     "There is no weekly schedule file, so no show plays from the weekly schedule. Save a "
     "weekly schedule in the suite's scheduler, or ignore this result if you schedule shows on "
     "calendar dates only."},
    {Messages::YearlyScheduleMissing,
     "There is no calendar schedule file. Harmless when no show is scheduled on particular "
     "dates; saving the calendar once in the suite's scheduler silences it."},
    {Messages::NoShowsScheduled,
     "Neither the weekly schedule nor a calendar date from today on plays a show: nothing will "
     "run. Schedule the shows."},
    {Messages::ShowFileMissing,
     "A scheduled show file (the detail) does not exist, so nothing plays at its times. Restore "
     "the file, or take it off the schedule."},
    {Messages::ShowFileUnreadable,
     "The show file (the detail) cannot be read as a show: it may be damaged or not a show at "
     "all. Open it in the suite's show editor and save it again, or restore a good copy."},
    {Messages::SequenceFileMissing,
     "A show, or a sequence that plays it as a subsequence, names a sequence file that does not "
     "exist. Restore the file, or remove it from the show or sequence named in the details."},
    {Messages::SequenceCannotLoad,
     "The sequence file exists but cannot be loaded: it may be damaged or written by a newer "
     "version of the suite. Open it in the suite and save it again, or restore a good copy; the "
     "output log says why loading failed."},
    {Messages::ShowHasNoSequences,
     "The show has no sequence in any section, so it plays nothing. Add sequences in the show "
     "editor, or take the show off the schedule."},
    {Messages::MediaFileMissing,
     "The sequence plays an audio file that does not exist, so its music will not play. Copy "
     "the audio file to the place named in the details, or point the sequence at the right "
     "file."},
    {Messages::SequenceChannelSettingsConflict,
     "Two channels of the same sequence (the tracks and channels in the details) drive the same "
     "controller output with different settings. Make their settings agree, or move one of them "
     "to another output."},
    {Messages::ChannelCompletelyOff,
     "The channel never comes on in this sequence. If that is meant, ignore the result; "
     "otherwise give it its effects, or check that the right channel is used."},
    {Messages::SequenceCompletelyOff,
     "The sequence never turns anything on. Check that it is the right file and that its "
     "effects were saved."},
    {Messages::ChannelMissingSettings,
     "The channel has no controller settings, so the show player does not know where to send "
     "it. Give it its controller, network and address in the sequence editor."},
    {Messages::ChannelUndefinedNetwork,
     "The channel is on a communication network that is not set up in the network "
     "preferences, so its lights will not respond. Set up that network, or move the channel to "
     "one that is."},
    {Messages::ChannelLengthConflict,
     "The same channel is in tracks of different lengths within one sequence, so its effects "
     "end early in the shorter track. Make the tracks the same length, or use the channel in "
     "one track only."},
    {Messages::MusicalInNonAudioSection,
     "A musical sequence is in a section that plays alongside the music (the section in the "
     "details), so its audio would play over the musical section. Move it to the musical "
     "section, or use an animation sequence there."},
    {Messages::ShellCommandMapMissing,
     "Sequences run shell commands, but the shell command map file (the detail) does not "
     "exist, so the commands cannot run. Set up the shell commands in the suite so that the map "
     "is saved."},
    {Messages::ShellCommandNotSet,
     "The sequence runs a shell command that the shell command map does not define. Define the "
     "command in the suite's shell command setup."},
    {Messages::ChannelConflict,
     "Two sequences that can play at the same time (the two sides in the details) drive the "
     "same channel, so the lights jump between them. Move one of them to another channel, or "
     "put the two in sections that do not play together; ignore the result if the overlap is "
     "meant."},
    {Messages::OldKRPEnabled,
     "A suite network on a port (the detail) has the compatibility for old KR-P controllers "
     "switched on. Switch it off in the network preferences unless old controllers on that "
     "network need it."},
    {Messages::SequenceIntensityFileSettingsConflict,
     "A channel of the sequence and one of its intensity files drive the same outputs (the "
     "range in the details) with different settings. Make them agree, or move one of them."},
    {Messages::IntensityFileSettingsConflict,
     "Two intensity files of the sequence drive overlapping outputs (the ranges in the details) "
     "with different settings. Make them agree, or move one of them."},
    {Messages::IntensityFileConflict,
     "Intensity files of two sequences that can play at the same time drive overlapping "
     "outputs, so the lights jump between them. Move one of them, or put the two sequences in "
     "sections that do not play together."},
    {Messages::ChannelIntensityFileConflict,
     "A channel of one sequence and an intensity file of another that can play at the same "
     "time drive the same outputs. Move one of them, or put the two sequences in sections that "
     "do not play together."},
    {Messages::IntensityFileUndefinedNetwork,
     "The intensity file sends to a network that is not set up in the network preferences, so "
     "its lights will not respond. Set up that network, or change the intensity file."},
    {Messages::CompressedSequencesDisabled,
     "The suite is set not to use compressed sequences. Switch Use Compressed Sequences on in "
     "the suite's settings unless you have turned it off on purpose."},
    {Messages::MemoryRestartsDisabled,
     "The show player is set not to restart itself when its memory grows, so a long show may "
     "stop. Switch Show Player Memory Restarts on in the suite's settings."},
    {Messages::TriggerUndefinedNetwork,
     "A trigger of the show listens on a network that is not set up in the network "
     "preferences, so it never fires. Set up that network, or move the trigger to one that "
     "is."},
    {Messages::TriggerUsesEnhancedNetwork,
     "A trigger of the show listens on a network run in the enhanced mode, where triggers are "
     "not received. Switch the enhanced mode off for that network, or move the trigger to "
     "another network."},
};

}  // namespace

const char* For(int32_t messageNumber) {
    for (const Entry& entry : kAdvice) {
        if (entry.message.number == messageNumber)
            return entry.advice;
    }
    return nullptr;
}

}  // namespace vtr::MessageAdvice
