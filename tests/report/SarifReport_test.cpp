#include "report/SarifReport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <set>

#include "report/ReportFixture.h"
#include "report/ReportText.h"

namespace vtr::report {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using namespace testing;
using Json = nlohmann::json;
using SarifReport::Place;
using SarifReport::PlacesOf;

// The properties SARIF 2.1.0 requires of the objects this report writes, their value types,
// and the values its enumerations allow; a failure names the property.
void ExpectValidSarif(const Json& log) {
    ASSERT_TRUE(log.is_object());
    EXPECT_EQ(log.at("version"), "2.1.0");
    EXPECT_TRUE(log.at("$schema").get<std::string>().starts_with("https://"));
    ASSERT_TRUE(log.at("runs").is_array());
    const std::set<std::string> levels{"none", "note", "warning", "error"};
    for (const Json& run : log["runs"]) {
        const Json& driver = run.at("tool").at("driver");
        EXPECT_TRUE(driver.at("name").is_string());
        std::set<std::string> ids;
        for (const Json& rule : driver.value("rules", Json::array())) {
            EXPECT_TRUE(ids.insert(rule.at("id").get<std::string>()).second) << "rule ids unique";
            for (const char* text : {"shortDescription", "fullDescription", "help"}) {
                if (rule.contains(text)) {
                    EXPECT_TRUE(rule[text].at("text").is_string()) << text;
                }
            }
            EXPECT_TRUE(levels.count(rule.at("defaultConfiguration").at("level")));
        }
        for (const Json& invocation : run.value("invocations", Json::array())) {
            EXPECT_TRUE(invocation.at("executionSuccessful").is_boolean());
            for (const Json& notification :
                 invocation.value("toolExecutionNotifications", Json::array()))
                EXPECT_TRUE(notification.at("message").at("text").is_string());
        }
        ASSERT_TRUE(run.at("results").is_array());
        for (const Json& result : run["results"]) {
            EXPECT_TRUE(result.at("message").at("text").is_string());
            EXPECT_TRUE(levels.count(result.at("level")));
            const int64_t index = result.at("ruleIndex");
            ASSERT_GE(index, 0);
            ASSERT_LT(index, static_cast<int64_t>(driver.at("rules").size()));
            EXPECT_EQ(driver["rules"][index]["id"], result.at("ruleId"));
            for (const char* key : {"locations", "relatedLocations"}) {
                std::set<std::string> unique;
                for (const Json& location : result.value(key, Json::array())) {
                    EXPECT_TRUE(unique.insert(location.dump()).second) << key << " unique";
                    EXPECT_TRUE(location.at("physicalLocation")
                                    .at("artifactLocation")
                                    .at("uri")
                                    .is_string());
                }
            }
            for (const Json& suppression : result.value("suppressions", Json::array())) {
                EXPECT_TRUE(suppression.at("kind") == "inSource" ||
                            suppression.at("kind") == "external");
                EXPECT_EQ(suppression.at("status"), "accepted");
            }
            if (result.contains("baselineState")) {
                EXPECT_TRUE(std::set<std::string>({"new", "unchanged", "updated", "absent"})
                                .count(result["baselineState"]));
            }
            const Json fingerprints = result.value("partialFingerprints", Json::object());
            for (const auto& item : fingerprints.items())
                EXPECT_TRUE(item.value().is_string()) << item.key();
        }
        EXPECT_TRUE(run.at("properties").is_object());
    }
}

RunReport DemoLikeRun() {
    RunReport report = BaseReport();
    report.startedUtc = std::chrono::sys_days(std::chrono::year(2031) / 3 / 12) +
                        std::chrono::hours(18) + std::chrono::minutes(30);
    report.finishedUtc = report.startedUtc + std::chrono::milliseconds(1250);
    report.results = {
        {Make(Messages::NotRunningFromAppPath, {"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}),
         true},
        {Make(Messages::AppFileUnexpectedVersion,
              {"[FILE]: /app/SuiteTray.exe", "[EXPECTED]: 1.0.0.0", "[FOUND]: 0.9.4.2"})},
        {Make(Messages::SequenceFileMissing,
              {"[SEQUENCE]: /q/Fireworks.las", "[SHOW]: show /s/Weekend.lss"})},
        {Conflict("/s/Evening.lss", "Musical", "/q/Carol.lms", "Background", "/q/Twinkle.las",
                  "Tree")},
        {Make(Messages::ChannelMissingSettings,
              {"[SEQUENCE]: /q/Intro.las", "[TRACK]: Track 1: Porch", "[CHANNEL]: Sparkle"}),
         true},
        {Make(Messages::MediaFileMissing, {"[FILE]: /m/Jingle.mp3", "[SEQUENCE]: /q/Jingle.lms"})},
        {Make(Messages::CompressedSequencesDisabled, {})},
    };
    return report;
}

TEST(SarifReport, OneRuleperMessageOneResultPerFindingIgnoredOnesSuppressed) {
    const Json log = Json::parse(SarifReport::Write(DemoLikeRun()));
    ExpectValidSarif(log);
    ASSERT_EQ(log["runs"].size(), 1u);
    const Json& run = log["runs"][0];

    const Json& driver = run["tool"]["driver"];
    EXPECT_EQ(driver["name"], "vantori-verify");
    EXPECT_EQ(driver["version"], "1.2.3");
    std::vector<std::string> ids;
    for (const Json& rule : driver["rules"])
        ids.push_back(rule["id"]);
    EXPECT_THAT(ids,
                ElementsAre("VTR006", "VTR016", "VTR023", "VTR026", "VTR030", "VTR043", "VTR051"));
    const Json& versionRule = driver["rules"][1];
    EXPECT_EQ(versionRule["shortDescription"]["text"],
              "Application file has unexpected version number");
    EXPECT_EQ(versionRule["defaultConfiguration"]["level"], "error");
    EXPECT_THAT(versionRule["help"]["text"].get<std::string>(),
                HasSubstr("Install the update completely"));
    EXPECT_EQ(versionRule["properties"]["messageNumber"], 16);

    // Every finding, in the order of the run, ignored ones included and suppressed.
    const Json& results = run["results"];
    ASSERT_EQ(results.size(), 7u);
    std::vector<std::string> found;
    for (const Json& result : results) {
        found.push_back(result["ruleId"].get<std::string>() + " " +
                        result["level"].get<std::string>() +
                        (result.contains("suppressions") ? " suppressed" : ""));
        EXPECT_FALSE(result.contains("baselineState"));
    }
    EXPECT_THAT(found, ElementsAre("VTR006 warning suppressed", "VTR016 error", "VTR023 error",
                                   "VTR043 warning", "VTR030 warning suppressed", "VTR026 error",
                                   "VTR051 warning"));
    EXPECT_EQ(results[0]["suppressions"][0]["kind"], "external");

    // The message is the summary and every detail; the key that "ignore --key" takes is the
    // finding's fingerprint.
    EXPECT_EQ(results[2]["message"]["text"],
              "Sequence file does not exist\n[SEQUENCE]: /q/Fireworks.las\n[SHOW]: show "
              "/s/Weekend.lss");
    EXPECT_EQ(results[2]["partialFingerprints"]["ignoreKey/v1"],
              "23-[SEQUENCE]: /q/Fireworks.las / [SHOW]: show /s/Weekend.lss / ");

    // Each at its file: the show that names the missing sequence, the sequence that plays the
    // missing media file, the conflict's show with both sequences beside it, the settings
    // store for a setting.
    auto uri = [](const Json& location) {
        return location["physicalLocation"]["artifactLocation"]["uri"].get<std::string>();
    };
    EXPECT_EQ(uri(results[1]["locations"][0]), "file:///app/SuiteTray.exe");
    EXPECT_EQ(uri(results[2]["locations"][0]), "file:///s/Weekend.lss");
    EXPECT_EQ(uri(results[2]["relatedLocations"][0]), "file:///q/Fireworks.las");
    EXPECT_EQ(results[2]["relatedLocations"][0]["message"]["text"], "the sequence");
    EXPECT_EQ(uri(results[3]["locations"][0]), "file:///s/Evening.lss");
    ASSERT_EQ(results[3]["relatedLocations"].size(), 2u);
    EXPECT_EQ(uri(results[3]["relatedLocations"][1]), "file:///q/Twinkle.las");
    EXPECT_EQ(uri(results[5]["locations"][0]), "file:///q/Jingle.lms");
    EXPECT_EQ(uri(results[6]["locations"][0]), "file:///home/ann/registry.reg");

    const Json& properties = run["properties"];
    EXPECT_EQ(properties["target"], Json({{"kind", "schedule"}}));
    EXPECT_EQ(properties["programVersion"], "1.2.3");
    EXPECT_EQ(properties["settingsStore"], "the settings store /home/ann/registry.reg");
    EXPECT_EQ(properties["checksPerformed"], 141);
    EXPECT_EQ(run["invocations"][0]["executionSuccessful"], true);
    EXPECT_EQ(run["invocations"][0]["startTimeUtc"], "2031-03-12T18:30:00.000Z");
    EXPECT_EQ(run["invocations"][0]["endTimeUtc"], "2031-03-12T18:30:01.250Z");
}

TEST(SarifReport, TheSameRunGivesTheSameDocumentButForItsTimes) {
    RunReport first = DemoLikeRun();
    RunReport second = DemoLikeRun();
    second.startedUtc += std::chrono::hours(30);
    second.finishedUtc += std::chrono::hours(31);
    Json a = Json::parse(SarifReport::Write(first));
    Json b = Json::parse(SarifReport::Write(second));
    EXPECT_NE(a, b);
    for (Json* log : {&a, &b}) {
        (*log)["runs"][0]["invocations"][0].erase("startTimeUtc");
        (*log)["runs"][0]["invocations"][0].erase("endTimeUtc");
    }
    EXPECT_EQ(a, b);
    EXPECT_EQ(SarifReport::Write(first), SarifReport::Write(DemoLikeRun()));
}

TEST(SarifReport, ABaselineACancelledRunAndOneShow) {
    RunReport report = DemoLikeRun();
    report.target = Target::Show;
    report.targetFile = "/s/Evening.lss";
    report.cancelled = true;
    report.baselineFile = "known.json";
    report.results[3].inBaseline = true;
    const Json log = Json::parse(SarifReport::Write(report));
    ExpectValidSarif(log);
    const Json& run = log["runs"][0];
    EXPECT_EQ(run["results"][3]["baselineState"], "unchanged");
    EXPECT_EQ(run["results"][2]["baselineState"], "new");
    EXPECT_EQ(run["properties"]["target"], Json({{"kind", "show"}, {"file", "/s/Evening.lss"}}));
    EXPECT_EQ(run["properties"]["baseline"], "known.json");
    EXPECT_EQ(run["invocations"][0]["executionSuccessful"], false);
    EXPECT_THAT(run["invocations"][0]["toolExecutionNotifications"][0]["message"]["text"]
                    .get<std::string>(),
                HasSubstr("cancelled"));
}

TEST(SarifReport, NamesThatAreNotUtf8StayValidJson) {
    RunReport report = BaseReport();
    report.results = {{Make(Messages::ShowFileMissing, {"/s/Caf\xE9 & co.lss"})}};
    const std::string text = SarifReport::Write(report);
    const Json log = Json::parse(text);  // throws on a byte that is not UTF-8
    const Json& result = log["runs"][0]["results"][0];
    const std::string uri = result["locations"][0]["physicalLocation"]["artifactLocation"]["uri"];
#ifdef _WIN32
    // On Windows the name is read in the ANSI code page, and the URI is UTF-8.
    EXPECT_TRUE(uri.starts_with("file:///s/Caf%")) << uri;
    EXPECT_TRUE(uri.ends_with("%20%26%20co.lss")) << uri;
#else
    EXPECT_EQ(result["message"]["text"], "Show file does not exist\n/s/Caf\xEF\xBF\xBD & co.lss");
    // The location keeps the file system's byte.
    EXPECT_EQ(uri, "file:///s/Caf%E9%20%26%20co.lss");
#endif
    // The fingerprint keeps it too, escaped as "ignore --key" takes it back.
    EXPECT_EQ(result["partialFingerprints"]["ignoreKey/v1"], "escaped:21-/s/Caf\\xE9 & co.lss / ");
}

TEST(SarifReportPlaces, TheFileAResultIsAboutComesFirst) {
    const std::optional<std::string> store = "/home/ann/registry.reg";
    EXPECT_THAT(PlacesOf(*Make(Messages::SequenceFileMissing,
                               {"[SEQUENCE]: /q/Sub.las", "[SHOW]: sequence /q/Parent.las"}),
                         store),
                ElementsAre(Place{"/q/Parent.las", "sequence"}, Place{"/q/Sub.las", "sequence"}));
    EXPECT_THAT(
        PlacesOf(*Make(Messages::MusicalInNonAudioSection,
                       {"[SEQUENCE]: /q/Carol.lms", "[SHOW]: /s/W.lss", "[SECTION]: background"}),
                 store),
        ElementsAre(Place{"/s/W.lss", "show"}, Place{"/q/Carol.lms", "sequence"}));
    EXPECT_THAT(PlacesOf(*Make(Messages::TriggerUndefinedNetwork,
                               {"[SHOW] /s/W.lss", "[NETWORK] Aux B", "[TRIGGER] Startup trigger"}),
                         store),
                ElementsAre(Place{"/s/W.lss", "show"}));
    // The same sequence on both sides of a conflict is one place.
    EXPECT_THAT(
        PlacesOf(*Conflict("/s/W.lss", "Background", "/q/A.las", "Animation", "/q/A.las", "Tree"),
                 store),
        ElementsAre(Place{"/s/W.lss", "show"}, Place{"/q/A.las", "sequence"}));
    EXPECT_THAT(PlacesOf(*Make(Messages::UserDataDirectoryMissing, {"/home/ann/Vantori"}), store),
                ElementsAre(Place{"/home/ann/Vantori", "folder"}));
    EXPECT_THAT(PlacesOf(*Make(Messages::NoUserDataPathRegEntry, {}), store),
                ElementsAre(Place{"/home/ann/registry.reg", "settings store"}));
    // In the Windows registry a setting has no file; a network name is not a file.
    EXPECT_TRUE(PlacesOf(*Make(Messages::NoUserDataPathRegEntry, {}), std::nullopt).empty());
    EXPECT_TRUE(PlacesOf(*Make(Messages::OldKRPEnabled, {"Regular"}), std::nullopt).empty());
    EXPECT_TRUE(PlacesOf(*Make(Messages::NoShowsScheduled, {}), store).empty());
}

TEST(ReportText, FileUrisForEveryKindOfPath) {
    EXPECT_EQ(FileUri("/home/ann/Shows/Evening.lss"), "file:///home/ann/Shows/Evening.lss");
    EXPECT_EQ(FileUri("/home/ann/My Shows/#1 100%.lss"),
              "file:///home/ann/My%20Shows/%231%20100%25.lss");
    EXPECT_EQ(FileUri("C:\\Vantori\\Shows\\Evening.lss"), "file:///C:/Vantori/Shows/Evening.lss");
    EXPECT_EQ(FileUri("c:/Vantori/Evening.lss"), "file:///c:/Vantori/Evening.lss");
    EXPECT_EQ(FileUri("\\\\server\\share\\Evening.lss"), "file://server/share/Evening.lss");
    EXPECT_EQ(FileUri("/home/ann/a\\b.lss"), "file:///home/ann/a%5Cb.lss");
#ifndef _WIN32
    EXPECT_EQ(FileUri("/home/ann/Caf\xC3\xA9.lss"), "file:///home/ann/Caf%C3%A9.lss");
#endif
    EXPECT_EQ(FileUri("Shows/Evening.lss"), "Shows/Evening.lss");
    EXPECT_EQ(FileUri("/app/"), "file:///app/");
}

TEST(ReportText, TextIsMadeValidUtf8AndEscapedForHtml) {
    EXPECT_EQ(ValidUtf8("Caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\x84"),
              "Caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\x84");
    const std::string fffd = "\xEF\xBF\xBD";
    EXPECT_EQ(ValidUtf8("Caf\xE9"), "Caf" + fffd);
    EXPECT_EQ(ValidUtf8("\xC0\xAF"), fffd + fffd);                        // overlong "/"
    EXPECT_EQ(ValidUtf8("\xED\xA0\x80"), fffd + fffd + fffd);             // a surrogate
    EXPECT_EQ(ValidUtf8("\xF4\x90\x80\x80"), fffd + fffd + fffd + fffd);  // above U+10FFFF
    EXPECT_EQ(ValidUtf8("ab\xE2\x82"), "ab" + fffd + fffd);               // cut short
    EXPECT_EQ(ValidUtf8(std::string("a\0b", 3)), std::string("a\0b", 3));
    EXPECT_EQ(Html("<a href=\"x\">Tom & Jerry's</a>"),
              "&lt;a href=&quot;x&quot;&gt;Tom &amp; Jerry&#39;s&lt;/a&gt;");
}

}  // namespace
}  // namespace vtr::report
