#include "Baseline.h"

#include <nlohmann/json.hpp>

#include <filesystem>
#include <system_error>

#include "VtrVersion.h"
#include "engine/IgnoreKeyText.h"
#include "engine/VtrError.h"
#include "show/WholeFile.h"

namespace vtr::cli {
namespace {

constexpr const char* kSource = "vantori-verify";
constexpr const char* kFormatName = "vantoriVerifyBaseline";
constexpr int kFormatVersion = 1;

[[noreturn]] void Refuse(const std::string& path, const std::string& reason) {
    Raise(ErrorNumbers::UserMessage, kSource, "the baseline " + path + " " + reason);
}

}  // namespace

Baseline Baseline::Read(const std::string& path) {
    std::error_code error;
    if (!std::filesystem::exists(path, error)) {
        Refuse(path, "does not exist; make it with --write-baseline " + path);
    }
    std::string text;
    if (const int32_t failure = ReadWholeFile(path, text); failure != 0)
        Refuse(path, "cannot be read: " + FileErrorDescription(failure));

    const nlohmann::json document = nlohmann::json::parse(text, nullptr, false);
    if (document.is_discarded() || !document.is_object() ||
        document.value(kFormatName, 0) != kFormatVersion || !document.contains("keys") ||
        !document["keys"].is_array())
        Refuse(path, "is not a baseline written by --write-baseline");
    Baseline baseline;
    for (const nlohmann::json& item : document["keys"]) {
        const auto key =
            item.is_string() ? IgnoreKeyText::Decode(item.get<std::string>()) : std::nullopt;
        if (!key)
            Refuse(path, "holds a key that is not a text of a result's key");
        baseline.keys_.insert(*key);
    }
    return baseline;
}

std::string Baseline::TextOf(const RunRecord& record) {
    nlohmann::ordered_json target;
    target["kind"] = TargetKindName(record.target);
    if (record.target != TargetKind::Schedule)
        target["file"] = record.targetFile;
    nlohmann::ordered_json keys = nlohmann::ordered_json::array();
    for (const RecordedResult& recorded : record.results) {
        if (recorded.result)
            keys.push_back(IgnoreKeyText::Encode(recorded.result->IgnoreKey()));
    }
    nlohmann::ordered_json document;
    document[kFormatName] = kFormatVersion;
    document["program"] = std::string("vantori-verify ") + kVersionText;
    document["target"] = std::move(target);
    document["keys"] = std::move(keys);
    return document.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

std::size_t Baseline::Mark(RunRecord& record) const {
    std::size_t marked = 0;
    for (RecordedResult& recorded : record.results) {
        recorded.inBaseline = recorded.result && keys_.count(recorded.result->IgnoreKey()) != 0;
        marked += recorded.inBaseline ? 1 : 0;
    }
    return marked;
}

}  // namespace vtr::cli
