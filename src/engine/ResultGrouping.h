#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "engine/Result.h"

// Presenting a run's results without changing them: which are shown (by severity and by a
// text), in which order (as the run produced them, or errors first), under which headings
// (by message, show, sequence or sequence pair), and how many of each kind there are. The
// command line's listings, the window's lists and the shared reports all use it.
//
// A ResultGrouping holds the results by their index, 0 for the first one added, and reads
// each result's details once: for its headings when the first grouped view asks, for the
// text filter when the first filter with a text asks (an output that neither groups nor
// filters by text never reads them). The results must not change once added.
// Every answer is a list of indices, so a front end can keep its own rows beside them.
namespace vtr {

// Errors first, then warnings, then information, then any other severity: 0, 1, 2 and 3.
int SeverityRank(Severity severity);

// How many results of each severity ("other" is any severity but the three named ones).
struct SeverityCounts {
    int64_t errors = 0;
    int64_t warnings = 0;
    int64_t info = 0;
    int64_t other = 0;

    void Add(Severity severity);
    int64_t Total() const { return errors + warnings + info + other; }
    bool operator==(const SeverityCounts&) const = default;
};

// Which results are shown: the severities ticked (a severity other than the three named ones
// is shown with the information results) and a text that the summary or one of the details
// contains, without regard to letter case (ASCII letters, and in UTF-8 text the Latin, Greek
// and Cyrillic letters of the two-byte range). An empty text matches every result.
struct ResultFilter {
    bool errors = true;
    bool warnings = true;
    bool info = true;
    std::string text;

    // That severity and every worse one: AtLeast(Warning) shows errors and warnings.
    static ResultFilter AtLeast(Severity minimum);
    bool ShowsSeverity(Severity severity) const;
};

enum class ResultOrder {
    RunOrder,     // as the run produced them
    ErrorsFirst,  // errors, warnings, information, other severities; run order within each
};

// The headings results are gathered under.
//   Message       one group per message number, "Message 43: Channel conflict".
//   Show          the show a result names: its "[SHOW]: " (or "[SHOW] ") detail, the show of a
//                 missing sequence's "[SHOW]: show ..." reference, or the show file that
//                 messages 21, 22 and 25 name; titled with the show's path.
//   Sequence      the sequence a result is about: its first "[SEQUENCE]: " detail (for a
//                 conflict between two sequences, the one the check was walking), or the
//                 sequence file that messages 24, 29 and 42 name; titled with its path.
//   SequencePair  the conflicts between two sequences (messages 43, 47 and 48) under the two
//                 sequences and the sections they play in, within their show: A against B
//                 and B against A are one pair, and the same two sequences in another show
//                 are another pair; titled "Glow.las (Background) and Anim-2.las
//                 (Animation), show Show0.lss". Conflicts inside one sequence (messages 27,
//                 32, 45 and 46) go under that sequence: "Inside Overflow.las".
// Results that name no show (sequence, conflict) go into one group, "Other results", placed
// after the others.
enum class GroupBy { None, Message, Show, Sequence, SequencePair };

// Which results a view takes: those not ignored (the main list), the ignored ones, or all.
enum class Listing { NotIgnored, Ignored, All };

struct ResultQuery {
    Listing listing = Listing::NotIgnored;
    ResultFilter filter;
    ResultOrder order = ResultOrder::RunOrder;
    GroupBy groupBy = GroupBy::None;
};

// The heading a result goes under. The key is the same for the same heading in every view,
// whatever the filter or order, so a tree can keep its expanded rows across a regrouping.
struct GroupIdentity {
    std::string key;
    std::string title;
};

struct ResultGroup {
    std::string key;
    std::string title;
    std::vector<std::size_t> members;  // in the order asked for
    SeverityCounts counts;             // of the members
    Severity worst = Severity::Info;   // the members' worst severity (by SeverityRank)
};

struct ResultView {
    // Every shown result in display order: group after group when grouped.
    std::vector<std::size_t> shown;
    // Groups in display order (in order of their first result; with errors first, groups
    // holding errors before those holding warnings, and so on); empty for GroupBy::None.
    std::vector<ResultGroup> groups;
    // Results of the listing that the filter left out.
    std::size_t hidden = 0;
};

// One line of statistics: a message number, how many results carry it, and what it is.
struct MessageStatistic {
    int32_t messageNumber = 0;
    int64_t count = 0;
    Severity severity = Severity::Info;  // the worst severity its results carry
    std::string summary;                 // the summary of its first result
    bool operator==(const MessageStatistic&) const = default;
};

class ResultGrouping {
  public:
    // Adds a result at the next index, which it returns.
    std::size_t Add(ResultPtr result, bool ignored = false);
    // A result was ignored, or is no longer.
    void SetIgnored(std::size_t index, bool ignored);
    void Clear();

    std::size_t Size() const { return entries_.size(); }
    const ResultPtr& At(std::size_t index) const { return entries_[index].result; }
    bool Ignored(std::size_t index) const { return entries_[index].ignored; }

    // Whether one result passes the filter (for a result added while a view is shown).
    bool Passes(std::size_t index, const ResultFilter& filter) const;
    // The heading one result goes under; key and title are empty for GroupBy::None.
    GroupIdentity GroupOf(std::size_t index, GroupBy groupBy) const;

    ResultView View(const ResultQuery& query) const;

    // The results of the listing by severity.
    SeverityCounts Counts(Listing listing) const;
    // One entry per message number of the given results, the most frequent first (message
    // number order between equal counts).
    std::vector<MessageStatistic> Statistics(const std::vector<std::size_t>& indices) const;

  private:
    // Lets the heading tables be searched with a string_view, without making a string.
    struct NameHash {
        using is_transparent = void;
        std::size_t operator()(std::string_view name) const {
            return std::hash<std::string_view>()(name);
        }
    };

    // The headings of one kind of grouping, each interned once by a name that identifies it
    // within the grouping; the first one is "Other results".
    struct Headings {
        Headings();
        std::vector<GroupIdentity> identities;
        std::unordered_map<std::string, int32_t, NameHash, std::equal_to<>> byName;
        // The heading of that name, made by identify() when it is new.
        template <class Identify>
        int32_t Intern(std::string_view name, Identify identify);
    };

    struct Entry {
        ResultPtr result;
        bool ignored = false;
        std::string folded;       // summary and details, case-folded, one per line
        int32_t heading[4] = {};  // per grouping, in the order of GroupBy but None
    };

    // The entry's folded text, and its headings (interned in the order of the entries, so
    // that the headings are numbered as the results came).
    static void Fold(Entry& entry);
    void Head(Entry& entry) const;
    // Brings the folded texts, or the headings, up to the last entry added.
    void FoldAll() const;
    void HeadAll() const;

    static bool InListing(const Entry& entry, Listing listing);
    bool Matches(const Entry& entry, const ResultFilter& filter, std::string_view needle) const;

    // Mutable: the folded texts and headings are worked out when first asked for.
    mutable std::vector<Entry> entries_;
    mutable std::size_t folded_ = 0;  // entries whose text is folded
    mutable std::size_t headed_ = 0;  // entries whose headings are known
    mutable Headings headings_[4];
    mutable std::unordered_map<int32_t, int32_t> messageHeadings_;  // message number to heading
    mutable std::string scratch_;  // a pair's name while it is made
};

// A count with thousands separated by commas: "2,491".
std::string FormatCount(int64_t count);

// A group's title and how many results it holds: "Message 43: Channel conflict (2,491)".
std::string GroupHeading(const ResultGroup& group);

// The text in the folded form the filter compares, for a front end that keeps its own texts.
std::string FoldCase(std::string_view text);

}  // namespace vtr
