#include "engine/ResultGrouping.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <initializer_list>
#include <optional>
#include <utility>

#include "engine/Messages.h"

namespace vtr {
namespace {

constexpr std::string_view kShowLabel = "[SHOW]: ";
constexpr std::string_view kTriggerShowLabel = "[SHOW] ";  // the trigger checks' form
constexpr std::string_view kSequenceLabel = "[SEQUENCE]: ";
constexpr std::string_view kSectionLabel = "[SECTION]: ";
// A missing sequence names where it is referenced: "show <path>" or "sequence <path>".
constexpr std::string_view kShowReference = "show ";

constexpr const char* kOtherKey = "other";
constexpr const char* kOtherTitle = "Other results";
constexpr int32_t kOther = 0;  // every grouping's first heading

// Where each grouping keeps its heading in an entry.
int Slot(GroupBy groupBy) {
    return static_cast<int>(groupBy) - 1;
}

bool IsOneOf(int32_t number, std::initializer_list<Message> messages) {
    return std::any_of(messages.begin(), messages.end(),
                       [&](const Message& message) { return message.number == number; });
}

// Messages whose only detail is the file itself.
bool NamesShowFile(int32_t number) {
    return IsOneOf(number, {Messages::ShowFileMissing, Messages::ShowFileUnreadable,
                            Messages::ShowHasNoSequences});
}
bool NamesSequenceFile(int32_t number) {
    return IsOneOf(number, {Messages::SequenceCannotLoad, Messages::SequenceCompletelyOff,
                            Messages::ShellCommandNotSet});
}
// Conflicts between two sequences, and conflicts inside one.
bool IsPairConflict(int32_t number) {
    return IsOneOf(number, {Messages::ChannelConflict, Messages::IntensityFileConflict,
                            Messages::ChannelIntensityFileConflict});
}
bool IsInsideConflict(int32_t number) {
    return IsOneOf(
        number,
        {Messages::SequenceChannelSettingsConflict, Messages::ChannelLengthConflict,
         Messages::SequenceIntensityFileSettingsConflict, Messages::IntensityFileSettingsConflict});
}

// The text after the label of the first detail that carries it.
std::optional<std::string_view> Labelled(const Result& result, std::string_view label) {
    for (const std::string& detail : result.Details()) {
        if (detail.starts_with(label))
            return std::string_view(detail).substr(label.size());
    }
    return std::nullopt;
}

std::optional<std::string_view> NonEmpty(std::optional<std::string_view> text) {
    if (text && text->empty())
        return std::nullopt;
    return text;
}

std::optional<std::string_view> ShowOf(const Result& result) {
    const int32_t number = result.MessageNumber();
    if (NamesShowFile(number))
        return result.Details().empty() ? std::nullopt
                                        : NonEmpty(std::string_view(result.Details().front()));
    if (number == Messages::SequenceFileMissing.number) {
        const auto reference = Labelled(result, kShowLabel);
        if (!reference || !reference->starts_with(kShowReference))
            return std::nullopt;
        return NonEmpty(reference->substr(kShowReference.size()));
    }
    if (auto show = Labelled(result, kShowLabel))
        return NonEmpty(show);
    return NonEmpty(Labelled(result, kTriggerShowLabel));
}

std::optional<std::string_view> SequenceOf(const Result& result) {
    if (NamesSequenceFile(result.MessageNumber()))
        return result.Details().empty() ? std::nullopt
                                        : NonEmpty(std::string_view(result.Details().front()));
    return NonEmpty(Labelled(result, kSequenceLabel));
}

// The last part of a path, whichever separator it uses; the whole text when that is empty.
std::string_view FileName(std::string_view path) {
    const std::size_t slash = path.find_last_of("/\\");
    if (slash == std::string_view::npos || slash + 1 == path.size())
        return path;
    return path.substr(slash + 1);
}

// A key made of several texts, each preceded by its length, so that no two lists of texts
// give the same key whatever bytes they hold.
void AppendPart(std::string& key, std::string_view part) {
    key += std::to_string(part.size());
    key += ':';
    key += part;
}

struct Side {
    std::string_view section;
    std::string_view sequence;
    bool operator<(const Side& other) const {
        return std::pair(sequence, section) < std::pair(other.sequence, other.section);
    }
    bool operator==(const Side&) const = default;
};

// The two sides of a conflict between sequences: after the show, each "[SECTION]: " detail
// begins a side and the "[SEQUENCE]: " detail after it names that side's sequence.
std::optional<std::array<Side, 2>> SidesOf(const Result& result) {
    std::array<Side, 2> sides{};
    std::size_t count = 0;
    for (const std::string& detail : result.Details()) {
        const std::string_view text(detail);
        if (text.starts_with(kSectionLabel)) {
            if (++count > sides.size())
                return std::nullopt;
            sides[count - 1].section = text.substr(kSectionLabel.size());
        } else if (text.starts_with(kSequenceLabel) && count > 0 &&
                   sides[count - 1].sequence.empty()) {
            sides[count - 1].sequence = text.substr(kSequenceLabel.size());
        }
    }
    if (count != 2 || sides[0].sequence.empty() || sides[1].sequence.empty())
        return std::nullopt;
    if (sides[1] < sides[0])
        std::swap(sides[0], sides[1]);
    return sides;
}

std::string SideTitle(const Side& side) {
    return std::string(FileName(side.sequence)) + " (" + std::string(side.section) + ")";
}

// The lower-case partner of a letter of the two-byte range, or the code point itself.
uint32_t LowerTwoByte(uint32_t c) {
    if ((c >= 0xC0 && c <= 0xDE && c != 0xD7) || (c >= 0x391 && c <= 0x3AB && c != 0x3A2) ||
        (c >= 0x410 && c <= 0x42F))
        return c + 0x20;
    if (c >= 0x400 && c <= 0x40F)
        return c + 0x50;
    // The Greek capitals with an accent.
    if (c == 0x386)
        return 0x3AC;
    if (c >= 0x388 && c <= 0x38A)
        return c + 0x25;
    if (c == 0x38C)
        return 0x3CC;
    if (c == 0x38E || c == 0x38F)
        return c + 0x3F;
    if (c == 0x178)
        return 0xFF;
    // Latin Extended-A pairs its letters: upper case even, lower case odd, but for the runs
    // from 0x139 to 0x148 and from 0x179 to 0x17E, which begin one later.
    const bool oddUpper = (c >= 0x139 && c <= 0x148) || (c >= 0x179 && c <= 0x17E);
    const bool evenUpper = (c >= 0x100 && c <= 0x137) || (c >= 0x14A && c <= 0x177);
    if ((evenUpper && c % 2 == 0) || (oddUpper && c % 2 == 1))
        return c + 1;
    return c;
}

// Appends the text case-folded: ASCII letters, and the letters of the two-byte range of
// UTF-8; any other byte as it is. A letter of the two-byte range folds to one of the same
// range, so the folded text is as long as the text.
void FoldInto(std::string& out, std::string_view text) {
    const std::size_t start = out.size();
    out.resize(start + text.size());
    char* to = out.data() + start;
    std::size_t i = 0;
    // Eight bytes at a time while they are all ASCII: each byte from 'A' to 'Z' gains 0x20.
    constexpr uint64_t kHigh = 0x8080808080808080u;
    constexpr uint64_t kEach = 0x0101010101010101u;
    for (; i + 8 <= text.size(); i += 8) {
        uint64_t word;
        std::memcpy(&word, text.data() + i, 8);
        if ((word & kHigh) != 0)
            break;
        const uint64_t atLeastA = word + (0x80 - 'A') * kEach;
        const uint64_t aboveZ = word + (0x7F - 'Z') * kEach;
        word |= ((atLeastA & ~aboveZ) & kHigh) >> 2;
        std::memcpy(to + i, &word, 8);
    }
    for (; i < text.size(); ++i) {
        const auto byte = static_cast<unsigned char>(text[i]);
        if (byte < 0x80) {
            to[i] = static_cast<char>(byte >= 'A' && byte <= 'Z' ? byte + ('a' - 'A') : byte);
            continue;
        }
        to[i] = text[i];
        if ((byte & 0xE0) != 0xC0 || i + 1 == text.size() ||
            (static_cast<unsigned char>(text[i + 1]) & 0xC0) != 0x80)
            continue;
        const uint32_t codePoint =
            ((byte & 0x1Fu) << 6) | (static_cast<unsigned char>(text[i + 1]) & 0x3Fu);
        // An overlong form (below 0x80) is not a letter: its bytes stay as they are.
        const uint32_t lower = codePoint >= 0x80 ? LowerTwoByte(codePoint) : codePoint;
        to[i] = static_cast<char>(codePoint >= 0x80 ? 0xC0 | (lower >> 6) : byte);
        to[i + 1] = static_cast<char>(codePoint >= 0x80 ? 0x80 | (lower & 0x3F) : text[i + 1]);
        ++i;
    }
}

}  // namespace

int SeverityRank(Severity severity) {
    switch (severity) {
        case Severity::Error:
            return 0;
        case Severity::Warning:
            return 1;
        case Severity::Info:
            return 2;
    }
    return 3;
}

void SeverityCounts::Add(Severity severity) {
    switch (severity) {
        case Severity::Error:
            ++errors;
            return;
        case Severity::Warning:
            ++warnings;
            return;
        case Severity::Info:
            ++info;
            return;
    }
    ++other;
}

ResultFilter ResultFilter::AtLeast(Severity minimum) {
    const int rank = SeverityRank(minimum);
    ResultFilter filter;
    filter.warnings = rank >= SeverityRank(Severity::Warning);
    filter.info = rank >= SeverityRank(Severity::Info);
    return filter;
}

bool ResultFilter::ShowsSeverity(Severity severity) const {
    switch (severity) {
        case Severity::Error:
            return errors;
        case Severity::Warning:
            return warnings;
        case Severity::Info:
            return info;
    }
    return info;
}

std::string FoldCase(std::string_view text) {
    std::string folded;
    folded.reserve(text.size());
    FoldInto(folded, text);
    return folded;
}

std::string FormatCount(int64_t count) {
    const std::string digits = std::to_string(count < 0 ? -count : count);
    std::string text = count < 0 ? "-" : "";
    for (std::size_t i = 0; i < digits.size(); ++i) {
        if (i > 0 && (digits.size() - i) % 3 == 0)
            text += ',';
        text += digits[i];
    }
    return text;
}

std::string GroupHeading(const ResultGroup& group) {
    return group.title + " (" + FormatCount(static_cast<int64_t>(group.members.size())) + ")";
}

ResultGrouping::Headings::Headings() {
    identities.push_back(GroupIdentity{kOtherKey, kOtherTitle});
}

template <class Identify>
int32_t ResultGrouping::Headings::Intern(std::string_view name, Identify identify) {
    if (const auto found = byName.find(name); found != byName.end())
        return found->second;
    const auto heading = static_cast<int32_t>(identities.size());
    identities.push_back(identify());
    byName.emplace(std::string(name), heading);
    return heading;
}

std::size_t ResultGrouping::Add(ResultPtr result, bool ignored) {
    Entry entry;
    entry.ignored = ignored;
    entry.result = std::move(result);
    entries_.push_back(std::move(entry));
    return entries_.size() - 1;
}

void ResultGrouping::Fold(Entry& entry) {
    const Result& r = *entry.result;
    std::size_t length = r.Summary().size();
    for (const std::string& detail : r.Details())
        length += detail.size() + 1;
    entry.folded.reserve(length);
    FoldInto(entry.folded, r.Summary());
    for (const std::string& detail : r.Details()) {
        entry.folded += '\n';
        FoldInto(entry.folded, detail);
    }
}

void ResultGrouping::Head(Entry& entry) const {
    const Result& r = *entry.result;
    const int32_t number = r.MessageNumber();
    Headings& messages = headings_[Slot(GroupBy::Message)];
    const auto [message, newMessage] = messageHeadings_.emplace(number, 0);
    if (newMessage) {
        message->second = static_cast<int32_t>(messages.identities.size());
        const std::string numberText = std::to_string(number);
        messages.identities.push_back(
            GroupIdentity{"message:" + numberText, "Message " + numberText + ": " + r.Summary()});
    }
    entry.heading[Slot(GroupBy::Message)] = message->second;

    const auto show = ShowOf(r);
    entry.heading[Slot(GroupBy::Show)] =
        show ? headings_[Slot(GroupBy::Show)].Intern(
                   *show,
                   [&] {
                       return GroupIdentity{"show:" + std::string(*show), std::string(*show)};
                   })
             : kOther;

    const auto sequence = SequenceOf(r);
    entry.heading[Slot(GroupBy::Sequence)] =
        sequence ? headings_[Slot(GroupBy::Sequence)].Intern(
                       *sequence,
                       [&] {
                           return GroupIdentity{"sequence:" + std::string(*sequence),
                                                std::string(*sequence)};
                       })
                 : kOther;

    // Pairs and the conflicts inside one sequence share a table: their names begin apart.
    Headings& pairs = headings_[Slot(GroupBy::SequencePair)];
    int32_t pair = kOther;
    if (IsPairConflict(number)) {
        if (const auto sides = SidesOf(r)) {
            const std::string_view showPath = show.value_or(std::string_view());
            scratch_ = "pair:";
            AppendPart(scratch_, showPath);
            for (const Side& side : *sides) {
                AppendPart(scratch_, side.section);
                AppendPart(scratch_, side.sequence);
            }
            pair = pairs.Intern(scratch_, [&] {
                std::string title = (*sides)[0] == (*sides)[1]
                                        ? SideTitle((*sides)[0]) + " with itself"
                                        : SideTitle((*sides)[0]) + " and " + SideTitle((*sides)[1]);
                if (!showPath.empty())
                    title += ", show " + std::string(FileName(showPath));
                return GroupIdentity{scratch_, std::move(title)};
            });
        }
    } else if (IsInsideConflict(number) && sequence) {
        scratch_ = "inside:";
        scratch_ += *sequence;
        pair = pairs.Intern(scratch_, [&] {
            return GroupIdentity{scratch_, "Inside " + std::string(FileName(*sequence))};
        });
    }
    entry.heading[Slot(GroupBy::SequencePair)] = pair;
}

void ResultGrouping::FoldAll() const {
    for (; folded_ < entries_.size(); ++folded_)
        Fold(entries_[folded_]);
}

void ResultGrouping::HeadAll() const {
    for (; headed_ < entries_.size(); ++headed_)
        Head(entries_[headed_]);
}

void ResultGrouping::SetIgnored(std::size_t index, bool ignored) {
    entries_[index].ignored = ignored;
}

void ResultGrouping::Clear() {
    entries_.clear();
    folded_ = 0;
    headed_ = 0;
    for (Headings& headings : headings_)
        headings = Headings();
    messageHeadings_.clear();
}

bool ResultGrouping::InListing(const Entry& entry, Listing listing) {
    switch (listing) {
        case Listing::NotIgnored:
            return !entry.ignored;
        case Listing::Ignored:
            return entry.ignored;
        case Listing::All:
            return true;
    }
    return true;
}

bool ResultGrouping::Matches(const Entry& entry, const ResultFilter& filter,
                             std::string_view needle) const {
    return filter.ShowsSeverity(entry.result->Severity()) &&
           (needle.empty() || entry.folded.find(needle) != std::string::npos);
}

bool ResultGrouping::Passes(std::size_t index, const ResultFilter& filter) const {
    if (!filter.text.empty())
        FoldAll();
    return Matches(entries_[index], filter, FoldCase(filter.text));
}

GroupIdentity ResultGrouping::GroupOf(std::size_t index, GroupBy groupBy) const {
    if (groupBy == GroupBy::None)
        return {};
    HeadAll();
    const int slot = Slot(groupBy);
    return headings_[slot].identities[entries_[index].heading[slot]];
}

ResultView ResultGrouping::View(const ResultQuery& query) const {
    ResultView view;
    const std::string needle = FoldCase(query.filter.text);
    if (!needle.empty())
        FoldAll();

    // The shown results in the order asked for: one run per severity rank for errors first.
    std::array<std::vector<std::size_t>, 4> byRank;
    for (std::size_t i = 0; i < entries_.size(); ++i) {
        const Entry& entry = entries_[i];
        if (!InListing(entry, query.listing))
            continue;
        if (!Matches(entry, query.filter, needle)) {
            ++view.hidden;
            continue;
        }
        const int rank =
            query.order == ResultOrder::ErrorsFirst ? SeverityRank(entry.result->Severity()) : 0;
        byRank[rank].push_back(i);
    }
    std::vector<std::size_t> ordered = std::move(byRank[0]);
    for (int rank = 1; rank < 4; ++rank)
        ordered.insert(ordered.end(), byRank[rank].begin(), byRank[rank].end());

    if (query.groupBy == GroupBy::None) {
        view.shown = std::move(ordered);
        return view;
    }

    HeadAll();
    const int slot = Slot(query.groupBy);
    const Headings& headings = headings_[slot];
    std::vector<int32_t> groupOfHeading(headings.identities.size(), -1);
    for (const std::size_t i : ordered) {
        const int32_t heading = entries_[i].heading[slot];
        if (groupOfHeading[heading] < 0) {
            groupOfHeading[heading] = static_cast<int32_t>(view.groups.size());
            ResultGroup group;
            group.key = headings.identities[heading].key;
            group.title = headings.identities[heading].title;
            group.worst = entries_[i].result->Severity();
            view.groups.push_back(std::move(group));
        }
        ResultGroup& group = view.groups[groupOfHeading[heading]];
        const Severity severity = entries_[i].result->Severity();
        group.members.push_back(i);
        group.counts.Add(severity);
        if (SeverityRank(severity) < SeverityRank(group.worst))
            group.worst = severity;
    }

    // Other results after the rest; with errors first, by the worst severity they hold.
    std::stable_partition(view.groups.begin(), view.groups.end(),
                          [](const ResultGroup& group) { return group.key != kOtherKey; });
    if (query.order == ResultOrder::ErrorsFirst) {
        std::stable_sort(view.groups.begin(), view.groups.end(),
                         [](const ResultGroup& a, const ResultGroup& b) {
                             return SeverityRank(a.worst) < SeverityRank(b.worst);
                         });
    }
    view.shown.reserve(ordered.size());
    for (const ResultGroup& group : view.groups)
        view.shown.insert(view.shown.end(), group.members.begin(), group.members.end());
    return view;
}

SeverityCounts ResultGrouping::Counts(Listing listing) const {
    SeverityCounts counts;
    for (const Entry& entry : entries_) {
        if (InListing(entry, listing))
            counts.Add(entry.result->Severity());
    }
    return counts;
}

std::vector<MessageStatistic> ResultGrouping::Statistics(
    const std::vector<std::size_t>& indices) const {
    std::vector<MessageStatistic> statistics;
    std::unordered_map<int32_t, std::size_t> byNumber;
    for (const std::size_t i : indices) {
        const Result& result = *entries_[i].result;
        const auto [found, added] = byNumber.emplace(result.MessageNumber(), statistics.size());
        if (added) {
            statistics.push_back(
                MessageStatistic{result.MessageNumber(), 0, result.Severity(), result.Summary()});
        }
        MessageStatistic& statistic = statistics[found->second];
        ++statistic.count;
        if (SeverityRank(result.Severity()) < SeverityRank(statistic.severity))
            statistic.severity = result.Severity();
    }
    std::sort(statistics.begin(), statistics.end(),
              [](const MessageStatistic& a, const MessageStatistic& b) {
                  return a.count != b.count ? a.count > b.count : a.messageNumber < b.messageNumber;
              });
    return statistics;
}

}  // namespace vtr
