#include "SequenceSummary.h"

#include <set>
#include <vector>

#include "FuzzSupport.h"
#include "engine/VtrError.h"

namespace vtr::fuzz {

namespace {

std::string Summary(const seqlib::Sequence& s, const std::string& context) {
    std::string text = std::to_string(s.FormatVersion()) + "|" + std::to_string(s.Length()) + "|" +
                       s.Media() + "|" + s.ShellCommand() + "\n";
    std::set<const seqlib::Channel*> own;
    for (const auto& c : s.Channels()) {
        own.insert(c.get());
        text += c->Id() + "," + c->Name() + "," + c->SettingsKey() + "," +
                std::to_string(c->Circuits()) + "," + std::to_string(c->ChannelType()) + "," +
                c->SubsequenceFile() + (c->IsEverOn() ? ",on\n" : ",off\n");
    }
    for (const auto& t : s.Tracks()) {
        text += "track " + t->Name() + " " + std::to_string(t->Length()) + ":";
        for (const auto& c : t->Channels()) {
            VTR_FUZZ_CHECK(own.count(c.get()) == 1, context + "\ntrack channel " + c->Id());
            text += " " + c->Id();
        }
        text += "\n";
    }
    for (const auto& file : {s.GridcraftFile(), s.NovaluxFile()}) {
        if (!file)
            continue;
        text += std::string(seqlib::IntensityFileKindName(file->Kind())) + " " + file->Name() +
                " on " + std::to_string(file->TrackIndex()) + ":";
        for (const auto& d : file->Devices()) {
            text += " " + std::to_string(d.DeviceType()) + "/" + std::to_string(d.Network()) + "/" +
                    std::to_string(d.Unit()) + "/" + std::to_string(d.StartAddress()) + "+" +
                    std::to_string(d.NumAddresses());
        }
        text += "\n";
    }
    return text;
}

}  // namespace

std::string LoadSummary(const std::string& path, const seqlib::LoadOptions& options,
                        const std::string& context) {
    std::vector<int32_t> told;
    seqlib::Sequence sequence;
    try {
        sequence.Load(
            path, [&](int32_t percent) { told.push_back(percent); }, options);
    } catch (const VtrError& e) {
        VTR_FUZZ_CHECK(e.Number() == ErrorNumbers::UserMessage && e.Source() == "Sequence.Load",
                       context + "\n" + std::to_string(e.Number()) + " " + e.Source() + ": " +
                           e.Description());
        VTR_FUZZ_CHECK(
            e.Description().rfind("Cannot load sequence file \"" + path + "\": ", 0) == 0,
            context + "\n" + e.Description());
        return "error";
    }
    for (std::size_t i = 0; i < told.size(); ++i) {
        VTR_FUZZ_CHECK(told[i] >= 0 && told[i] <= 100 && (i == 0 || told[i] > told[i - 1]),
                       context + "\nprogress " + std::to_string(told[i]));
    }
    VTR_FUZZ_CHECK(!told.empty() && told.back() == 100, context + "\nprogress never reached 100");
    return Summary(sequence, context);
}

}  // namespace vtr::fuzz
