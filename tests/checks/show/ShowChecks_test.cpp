// The show checks: existence, loading (and what loading a show queues), having a sequence,
// and musical sequences in sections that cannot play audio.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "checks/sequence/CheckSequenceIsNonmusical.h"
#include "checks/show/CheckLoadShowFile.h"
#include "checks/show/CheckShowFileExists.h"
#include "checks/show/CheckShowHasSequence.h"
#include "engine/LibVerify.h"
#include "show/Show.h"
#include "support/VerifierFixture.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::ResultTexts;

InteractiveGroupPtr Group(const std::string& name, bool independent,
                          std::vector<TriggeredSequencesPtr> sets) {
    auto group = std::make_shared<InteractiveGroup>();
    group->SetName(name);
    group->SetIndependent(independent);
    for (auto& set : sets)
        group->AddTriggeredSequences(set);
    return group;
}

TriggeredSequencesPtr Set(std::vector<std::string> names, int32_t unit = 1) {
    return TriggeredSequencesFunctions::CreateTriggeredSequences(
        TriggerFunctions::CreateTrigger(0, unit, 1, "button"), std::move(names));
}

// A description of each reference, for comparing walks.
std::vector<std::string> Describe(const std::vector<ShowReference>& references) {
    std::vector<std::string> lines;
    for (const ShowReference& r : references) {
        if (r.kind == ShowReference::Kind::Sequence) {
            lines.push_back(r.sequenceFile + " in " + r.label + (r.nonAudio ? " (no audio)" : ""));
        } else {
            lines.push_back("trigger: " + r.label);
        }
    }
    return lines;
}

class ShowChecksTest : public testsupport::SuiteTest {
  protected:
    std::string WriteShow(const std::string& name, const Show& show) {
        const std::string path = DataFile(name);
        testsupport::WriteFileBytes(path, ShowFunctions::ShowToText(show));
        return path;
    }
    template <typename CheckClass>
    std::vector<std::string> Run(const std::string& file) {
        CheckClass check;
        check.SetFilename(file);
        RunAlone(check);
        return client.Lines("Added ");
    }
};

TEST_F(ShowChecksTest, IdentifiersAndDescriptions) {
    CheckShowFileExists exists;
    exists.SetFilename("x.lss");
    EXPECT_EQ(exists.CheckIdentifier(), "17_x.lss");
    EXPECT_EQ(exists.Description(), "Show file existence: x.lss");
    CheckLoadShowFile load;
    load.SetFilename("x.lss");
    EXPECT_EQ(load.CheckIdentifier(), "18_x.lss");
    EXPECT_EQ(load.Description(), "Load show file: x.lss");
    CheckShowHasSequence has;
    has.SetFilename("x.lss");
    EXPECT_EQ(has.CheckIdentifier(), "21_x.lss");
    EXPECT_EQ(has.Description(), "Show has sequence: x.lss");

    CheckSequenceIsNonmusical nonmusical;
    nonmusical.SetFilename("Song.lms");
    nonmusical.SetInShowFile("x.lss");
    nonmusical.SetInShowSection("background");
    EXPECT_EQ(nonmusical.CheckIdentifier(), "29_Song.lms (referenced in background of show x.lss)");
    EXPECT_EQ(nonmusical.Description(),
              "Sequence nonmusical: Song.lms (referenced in background of show x.lss)");
    // Setting any property makes a new identifier.
    nonmusical.SetInShowSection("animation");
    EXPECT_EQ(nonmusical.CheckIdentifier(), "29_Song.lms (referenced in animation of show x.lss)");
    nonmusical.SetInShowFile("y.lss");
    nonmusical.SetFilename("Other.las");
    EXPECT_EQ(nonmusical.CheckIdentifier(), "29_Other.las (referenced in animation of show y.lss)");
    exists.SetFilename("z.lss");
    EXPECT_EQ(exists.CheckIdentifier(), "17_z.lss");
}

TEST_F(ShowChecksTest, AShowFileMustExistAndNotBeAFolder) {
    const std::string show = WriteShow("a.lss", Show());
    EXPECT_THAT(Run<CheckShowFileExists>(show), ElementsAre("Load show file: " + show));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    EXPECT_THAT(Run<CheckShowFileExists>(DataFile("missing.lss")), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("21: " + DataFile("missing.lss")));
    ASSERT_EQ(LibVerify::GetResults().size(), 1u);
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Show file does not exist");
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Error);

    fs::create_directories(DataFile("folder.lss"));
    EXPECT_THAT(Run<CheckShowFileExists>(DataFile("folder.lss")), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("21: " + DataFile("folder.lss")));
}

TEST_F(ShowChecksTest, AShowThatCannotBeReadGivesMessage22AndQueuesNothing) {
    const std::string garbage = DataFile("garbage.lss");
    testsupport::WriteFileBytes(garbage, "(((not,a)show");
    EXPECT_THAT(Run<CheckLoadShowFile>(garbage), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("22: " + garbage));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Error reading show file");

    EXPECT_THAT(Run<CheckLoadShowFile>(DataFile("gone.lss")), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("22: " + DataFile("gone.lss")));
}

TEST_F(ShowChecksTest, LoadingAShowQueuesTheNonAudioChecksAndThenTheShowsOwn) {
    Show show;
    show.Background()->List() = {"Snow.las", "Song.lms"};
    show.Background()->SetCleanUp("Dark.las");
    show.Startup()->List() = {"Intro.lms"};
    show.Main()->List() = {"Song.lms", "Song.lms"};  // twice in one section: checked once
    show.Musical()->List() = {"Carol.lms"};
    show.InteractiveGroups().push_back(Group("Porch", true, {Set({"Bell.lms"})}));
    show.InteractiveGroups().push_back(Group("Yard", false, {Set({"Jingle.lms"})}));
    const std::string path = WriteShow("a.lss", show);

    const auto exists = [&](const std::string& name) {
        return "Sequence file existence: " + name + " (referenced in show " + path + ")";
    };
    const auto nonmusical = [&](const std::string& name, const std::string& section) {
        return "Sequence nonmusical: " + name + " (referenced in " + section + " of show " + path +
               ")";
    };
    // The same sequence referenced by one show is one existence check, whatever the section.
    EXPECT_THAT(
        Run<CheckLoadShowFile>(path),
        ElementsAre(exists("Snow.las"), nonmusical("Snow.las", "background"), exists("Song.lms"),
                    nonmusical("Song.lms", "background"), exists("Dark.las"),
                    nonmusical("Dark.las", "background"), exists("Intro.lms"),
                    nonmusical("Song.lms", "animation"), exists("Carol.lms"),
                    "Trigger on defined network: Interactive group (Porch)", exists("Bell.lms"),
                    nonmusical("Bell.lms", "Interactive group (Porch)"),
                    "Trigger on defined network: Interactive group (Yard)", exists("Jingle.lms"),
                    "Show has sequence: " + path, "Intersequence channel conflicts: " + path));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(ShowChecksTest, TheWalkOfAShowGivesEverySequenceAndTriggerInQueueOrder) {
    Show show;
    show.Background()->List() = {"b1.las"};
    show.Startup()->List() = {"s1.lms"};
    show.Startup()->SetCleanUp("s2.las");
    show.Main()->List() = {"m1.las"};
    show.Musical()->List() = {"u1.lms", "u2.lms"};
    show.Shutdown()->SetCleanUp("d1.las");
    show.SetStartupType(1);
    show.SetStartupTrigger(TriggerFunctions::CreateTrigger(2, 7, 3, "Door"));
    auto porch = Set({"p1.lms", "p2.las"}, 5);
    auto porchToo = Set({"p3.las"}, 6);
    show.InteractiveGroups().push_back(Group("Porch", true, {porch, porchToo}));
    show.InteractiveGroups().push_back(Group("Yard", false, {Set({"y1.lms"})}));

    const auto references = CheckLoadShowFile::WalkShow(show);
    EXPECT_THAT(
        Describe(references),
        ElementsAre(
            "b1.las in background (no audio)", "s1.lms in startup", "s2.las in startup",
            "m1.las in animation (no audio)", "u1.lms in musical", "u2.lms in musical",
            "d1.las in shutdown", "trigger: Startup trigger", "trigger: Interactive group (Porch)",
            "p1.lms in Interactive group (Porch) (no audio)",
            "p2.las in Interactive group (Porch) (no audio)", "trigger: Interactive group (Porch)",
            "p3.las in Interactive group (Porch) (no audio)", "trigger: Interactive group (Yard)",
            "y1.lms in Interactive group (Yard)"));
    // The trigger objects themselves, not copies: their checks tell triggers apart by identity.
    EXPECT_EQ(references[7].trigger, show.StartupTrigger());
    EXPECT_EQ(references[8].trigger, porch->Trig());
    EXPECT_EQ(references[11].trigger, porchToo->Trig());
}

TEST_F(ShowChecksTest, AStoredStartupTriggerIsWalkedOnlyWhenTheShowWaitsForIt) {
    Show show;
    show.SetStartupTrigger(TriggerFunctions::CreateTrigger(0, 1, 1, "Door"));
    EXPECT_THAT(Describe(CheckLoadShowFile::WalkShow(show)), IsEmpty());
    show.SetStartupType(2);
    EXPECT_THAT(Describe(CheckLoadShowFile::WalkShow(show)),
                ElementsAre("trigger: Startup trigger"));
    // Sections a show built by hand lacks are passed over.
    show.SetBackground(nullptr);
    show.SetMusical(nullptr);
    EXPECT_THAT(Describe(CheckLoadShowFile::WalkShow(show)),
                ElementsAre("trigger: Startup trigger"));
}

TEST_F(ShowChecksTest, AShowNeedsASequenceSomewhere) {
    EXPECT_FALSE(CheckShowHasSequence::HasSequence(Show()));

    Show cleanUpOnly;
    cleanUpOnly.Shutdown()->SetCleanUp("Dark.las");
    EXPECT_TRUE(CheckShowHasSequence::HasSequence(cleanUpOnly));

    Show groupsOnly;
    groupsOnly.InteractiveGroups().push_back(Group("Porch", false, {Set({"Bell.las"})}));
    EXPECT_TRUE(CheckShowHasSequence::HasSequence(groupsOnly));

    Show emptySets;
    emptySets.InteractiveGroups().push_back(Group("Porch", false, {Set({}), Set({})}));
    EXPECT_FALSE(CheckShowHasSequence::HasSequence(emptySets));

    Show sectionsMissing;
    sectionsMissing.SetMain(nullptr);
    sectionsMissing.Musical()->List() = {"Carol.lms"};
    EXPECT_TRUE(CheckShowHasSequence::HasSequence(sectionsMissing));

    // Through the files.
    const std::string empty = WriteShow("empty.lss", Show());
    Run<CheckShowHasSequence>(empty);
    EXPECT_THAT(ResultTexts(), ElementsAre("25: " + empty));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Show has no sequences");
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Warning);

    const std::string full = WriteShow("full.lss", cleanUpOnly);
    Run<CheckShowHasSequence>(full);
    EXPECT_THAT(ResultTexts(), IsEmpty());
    const std::string grouped = WriteShow("grouped.lss", groupsOnly);
    Run<CheckShowHasSequence>(grouped);
    EXPECT_THAT(ResultTexts(), IsEmpty());

    // A show that cannot be loaded has no sequence either.
    Run<CheckShowHasSequence>(DataFile("gone.lss"));
    EXPECT_THAT(ResultTexts(), ElementsAre("25: " + DataFile("gone.lss")));
}

TEST_F(ShowChecksTest, OnlyMusicalSequencesAreReportedInNonAudioSections) {
    auto run = [&](const std::string& file) {
        CheckSequenceIsNonmusical check;
        check.SetFilename(file);
        check.SetInShowFile("/shows/a.lss");
        check.SetInShowSection("background");
        RunAlone(check);
        return ResultTexts();
    };
    EXPECT_THAT(run("/seq/Song.LMS"),
                ElementsAre("33: [SEQUENCE]: /seq/Song.LMS | [SHOW]: /shows/a.lss | "
                            "[SECTION]: background"));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(),
              "Musical file used in non-audio section of show");
    EXPECT_THAT(run("/seq/Song.lms"), ElementsAre(::testing::StartsWith("33: ")));
    EXPECT_THAT(run("/seq/Song.las"), IsEmpty());
    EXPECT_THAT(run("/seq/Song"), IsEmpty());
    EXPECT_THAT(run("/seq/Song.lms.bak"), IsEmpty());
    EXPECT_THAT(run("/seq/Song."), IsEmpty());
}

TEST_F(ShowChecksTest, AMusicalSequenceOnlyInAudioSectionsAndDependentGroupsGivesNoWarning) {
    Show show;
    show.Musical()->List() = {"Song.lms"};
    show.Startup()->List() = {"Song.lms"};
    show.Shutdown()->List() = {"Song.lms"};
    show.InteractiveGroups().push_back(Group("Yard", false, {Set({"Song.lms"})}));
    show.InteractiveGroups().back()->SetMusicalAllowed(false);  // not what decides
    const std::string path = WriteShow("a.lss", show);
    LibVerify::VerifyShowFile(path);
    LibVerify::RunVerification();
    for (const std::string& result : ResultTexts())
        EXPECT_EQ(result.rfind("33:", 0), std::string::npos) << result;
    EXPECT_THAT(client.Lines("Checking Sequence nonmusical"), IsEmpty());
}

}  // namespace
}  // namespace vtr
