#include "ResultsModel.h"

#include <QCollator>
#include <QFont>
#include <algorithm>
#include <string>
#include <unordered_map>

#include "UiText.h"

namespace vtr {
namespace {

// A row's internal id: 0 for a top row (a group, or an ungrouped result), the group's row
// plus one for a result inside a group.
constexpr quintptr kTopRow = 0;

QString CountText(int64_t count, const char* one, const char* many) {
    return QStringLiteral("%1 %2")
        .arg(QString::fromStdString(FormatCount(count)))
        .arg(QLatin1String(count == 1 ? one : many));
}

}  // namespace

QString ResultsModel::CountsText(const SeverityCounts& counts) {
    QStringList parts;
    if (counts.errors > 0)
        parts.append(CountText(counts.errors, "error", "errors"));
    if (counts.warnings > 0)
        parts.append(CountText(counts.warnings, "warning", "warnings"));
    if (counts.info > 0)
        parts.append(CountText(counts.info, "information result", "information results"));
    if (counts.other > 0)
        parts.append(CountText(counts.other, "other result", "other results"));
    return parts.join(QStringLiteral(", "));
}

ResultsModel::ResultsModel(const ResultGrouping& grouping, Listing listing, IconOf iconOf,
                           QObject* parent)
    : QAbstractItemModel(parent), grouping_(grouping), iconOf_(std::move(iconOf)) {
    query_.listing = listing;
}

// --- The view --------------------------------------------------------------------------

void ResultsModel::SetQuery(ResultQuery query) {
    query.listing = query_.listing;
    query_ = std::move(query);
    Relayout();
}

void ResultsModel::sort(int column, Qt::SortOrder order) {
    if (column == sortColumn_ && (column < 0 || order == sortOrder_))
        return;
    sortColumn_ = column;
    sortOrder_ = order;
    Relayout();
}

bool ResultsModel::Appends() const {
    return !IsGrouped() && query_.order == ResultOrder::RunOrder && sortColumn_ < 0;
}

bool ResultsModel::TakeNewResults() {
    const std::size_t size = grouping_.Size();
    if (seen_ == size)
        return false;
    if (!Appends()) {
        Relayout();
        return true;
    }
    // In the order of the run, ungrouped: the new results go after the others.
    std::vector<std::size_t> added;
    bool changed = false;
    for (std::size_t i = seen_; i < size; ++i) {
        if (grouping_.Ignored(i) != (query_.listing == Listing::Ignored))
            continue;
        changed = true;
        if (grouping_.Passes(i, query_.filter)) {
            added.push_back(i);
        } else {
            ++view_.hidden;
        }
    }
    seen_ = size;
    places_.resize(size);
    if (added.empty())
        return changed;
    const int first = static_cast<int>(view_.shown.size());
    beginInsertRows(QModelIndex(), first, first + static_cast<int>(added.size()) - 1);
    for (const std::size_t i : added) {
        places_[i] = Place{-1, static_cast<int32_t>(view_.shown.size())};
        view_.shown.push_back(i);
    }
    endInsertRows();
    return true;
}

void ResultsModel::Relayout() {
    seen_ = grouping_.Size();
    InstallView(MakeView());
}

void ResultsModel::Clear() {
    beginResetModel();
    view_ = ResultView();
    places_.clear();
    seen_ = 0;
    endResetModel();
}

ResultView ResultsModel::MakeView() const {
    ResultView view = grouping_.View(query_);
    if (sortColumn_ < 0)
        return view;
    if (view.groups.empty()) {
        SortRows(view.shown);
    } else {
        for (ResultGroup& group : view.groups)
            SortRows(group.members);
    }
    return view;
}

void ResultsModel::SortRows(std::vector<std::size_t>& rows) const {
    const bool descending = sortOrder_ == Qt::DescendingOrder;
    auto ordered = [&](auto less) {
        // Stable both ways: equal rows keep the order they had.
        std::stable_sort(rows.begin(), rows.end(), [&](std::size_t a, std::size_t b) {
            return descending ? less(b, a) : less(a, b);
        });
    };
    if (sortColumn_ == SeverityColumn) {
        ordered([&](std::size_t a, std::size_t b) {
            return grouping_.At(a)->Severity() < grouping_.At(b)->Severity();
        });
        return;
    }
    if (sortColumn_ == MsgNumColumn) {
        ordered([&](std::size_t a, std::size_t b) {
            return grouping_.At(a)->MessageNumber() < grouping_.At(b)->MessageNumber();
        });
        return;
    }
    // Texts: each compared by its collation key, made once per row.
    QCollator collator;
    collator.setNumericMode(true);
    std::unordered_map<std::size_t, QCollatorSortKey> keys;
    keys.reserve(rows.size());
    for (const std::size_t i : rows) {
        const Result& result = *grouping_.At(i);
        std::string text;
        if (sortColumn_ == DescriptionColumn) {
            text = result.Summary();
        } else {
            const std::size_t detail = static_cast<std::size_t>(sortColumn_ - Details1Column);
            if (detail < result.Details().size())
                text = result.Details()[detail];
        }
        keys.emplace(i, collator.sortKey(FromSuiteText(text)));
    }
    ordered([&](std::size_t a, std::size_t b) { return keys.at(a).compare(keys.at(b)) < 0; });
}

void ResultsModel::InstallView(ResultView view) {
    emit layoutAboutToBeChanged();
    // What each row the views hold on to shows: a group (by its key) or a result.
    struct Held {
        std::string groupKey;  // empty for a result's row
        std::optional<std::size_t> result;
        int column = 0;
    };
    const QModelIndexList from = persistentIndexList();
    std::vector<Held> held;
    held.reserve(static_cast<std::size_t>(from.size()));
    for (const QModelIndex& index : from) {
        Held row;
        row.column = index.column();
        if (const ResultGroup* group = GroupAt(index)) {
            row.groupKey = group->key;
        } else {
            row.result = ResultIndexOf(index);
        }
        held.push_back(std::move(row));
    }

    view_ = std::move(view);
    IndexPlaces();

    std::unordered_map<std::string, int> groupRows;
    for (std::size_t g = 0; g < view_.groups.size(); ++g)
        groupRows.emplace(view_.groups[g].key, static_cast<int>(g));
    QModelIndexList to;
    to.reserve(from.size());
    for (const Held& row : held) {
        QModelIndex moved;
        if (!row.groupKey.empty()) {
            const auto found = groupRows.find(row.groupKey);
            if (found != groupRows.end())
                moved = createIndex(found->second, row.column, kTopRow);
        } else if (row.result) {
            const QModelIndex shown = IndexOfResult(*row.result);
            if (shown.isValid())
                moved = createIndex(shown.row(), row.column, shown.internalId());
        }
        to.append(moved);
    }
    changePersistentIndexList(from, to);
    emit layoutChanged();
}

void ResultsModel::IndexPlaces() {
    places_.assign(grouping_.Size(), Place{});
    if (view_.groups.empty()) {
        for (std::size_t row = 0; row < view_.shown.size(); ++row)
            places_[view_.shown[row]] = Place{-1, static_cast<int32_t>(row)};
        return;
    }
    for (std::size_t g = 0; g < view_.groups.size(); ++g) {
        const std::vector<std::size_t>& members = view_.groups[g].members;
        for (std::size_t row = 0; row < members.size(); ++row)
            places_[members[row]] = Place{static_cast<int32_t>(g), static_cast<int32_t>(row)};
    }
}

// --- Rows ------------------------------------------------------------------------------

std::vector<std::size_t>& ResultsModel::RowsOf(int32_t group) {
    return group < 0 ? view_.shown : view_.groups[static_cast<std::size_t>(group)].members;
}

const std::vector<std::size_t>& ResultsModel::RowsOf(int32_t group) const {
    return group < 0 ? view_.shown : view_.groups[static_cast<std::size_t>(group)].members;
}

std::optional<std::size_t> ResultsModel::ResultIndexOf(const QModelIndex& index) const {
    if (!index.isValid() || index.model() != this)
        return std::nullopt;
    const auto row = static_cast<std::size_t>(index.row());
    if (index.internalId() == kTopRow) {
        if (!view_.groups.empty() || row >= view_.shown.size())
            return std::nullopt;
        return view_.shown[row];
    }
    const auto group = static_cast<std::size_t>(index.internalId() - 1);
    if (group >= view_.groups.size() || row >= view_.groups[group].members.size())
        return std::nullopt;
    return view_.groups[group].members[row];
}

ResultPtr ResultsModel::ResultAt(const QModelIndex& index) const {
    const auto resultIndex = ResultIndexOf(index);
    return resultIndex ? grouping_.At(*resultIndex) : nullptr;
}

QModelIndex ResultsModel::IndexOfResult(std::size_t resultIndex) const {
    if (resultIndex >= places_.size() || places_[resultIndex].row < 0)
        return {};
    const Place place = places_[resultIndex];
    return createIndex(place.row, 0, place.group < 0 ? kTopRow : quintptr(place.group) + 1);
}

const ResultGroup* ResultsModel::GroupAt(const QModelIndex& index) const {
    if (!index.isValid() || index.model() != this || index.internalId() != kTopRow ||
        view_.groups.empty())
        return nullptr;
    const auto row = static_cast<std::size_t>(index.row());
    return row < view_.groups.size() ? &view_.groups[row] : nullptr;
}

QModelIndex ResultsModel::index(int row, int column, const QModelIndex& parent) const {
    if (row < 0 || column < 0 || column >= kColumns)
        return {};
    if (!parent.isValid()) {
        const std::size_t rows = view_.groups.empty() ? view_.shown.size() : view_.groups.size();
        return static_cast<std::size_t>(row) < rows ? createIndex(row, column, kTopRow)
                                                    : QModelIndex();
    }
    const ResultGroup* group = GroupAt(parent);
    if (group == nullptr || static_cast<std::size_t>(row) >= group->members.size())
        return {};
    return createIndex(row, column, quintptr(parent.row()) + 1);
}

QModelIndex ResultsModel::parent(const QModelIndex& child) const {
    if (!child.isValid() || child.internalId() == kTopRow)
        return {};
    return createIndex(static_cast<int>(child.internalId() - 1), 0, kTopRow);
}

int ResultsModel::rowCount(const QModelIndex& parent) const {
    if (!parent.isValid())
        return static_cast<int>(view_.groups.empty() ? view_.shown.size() : view_.groups.size());
    if (parent.column() != 0)
        return 0;
    const ResultGroup* group = GroupAt(parent);
    return group != nullptr ? static_cast<int>(group->members.size()) : 0;
}

int ResultsModel::columnCount(const QModelIndex&) const {
    return kColumns;
}

bool ResultsModel::hasChildren(const QModelIndex& parent) const {
    if (!parent.isValid())
        return rowCount() > 0;
    return parent.column() == 0 && GroupAt(parent) != nullptr;
}

Qt::ItemFlags ResultsModel::flags(const QModelIndex& index) const {
    if (!index.isValid())
        return Qt::NoItemFlags;
    Qt::ItemFlags flags = Qt::ItemIsEnabled | Qt::ItemIsSelectable;
    if (GroupAt(index) == nullptr)
        flags |= Qt::ItemNeverHasChildren;
    return flags;
}

QVariant ResultsModel::headerData(int section, Qt::Orientation orientation, int role) const {
    if (orientation != Qt::Horizontal || role != Qt::DisplayRole || section < 0 ||
        section >= kColumns)
        return {};
    switch (section) {
        case DescriptionColumn:
            return QStringLiteral("Description");
        case SeverityColumn:
            return QStringLiteral("Severity");
        case MsgNumColumn:
            return QStringLiteral("Msg Num");
        default:
            return QStringLiteral("Details%1").arg(section - Details1Column + 1);
    }
}

QVariant ResultsModel::data(const QModelIndex& index, int role) const {
    if (const ResultGroup* group = GroupAt(index)) {
        if (index.column() != DescriptionColumn)
            return {};
        switch (role) {
            case Qt::DisplayRole:
                return FromSuiteText(GroupHeading(*group));
            case Qt::DecorationRole:
                return iconOf_(group->worst);
            case Qt::FontRole: {
                QFont font;
                font.setBold(true);
                return font;
            }
            case Qt::ToolTipRole:
                return FromSuiteText(group->title) + QLatin1Char('\n') + CountsText(group->counts);
            default:
                return {};
        }
    }
    const auto resultIndex = ResultIndexOf(index);
    if (!resultIndex)
        return {};
    const Result& result = *grouping_.At(*resultIndex);
    const int column = index.column();
    switch (role) {
        case Qt::DisplayRole:
            switch (column) {
                case DescriptionColumn:
                    return FromSuiteText(result.Summary());
                case SeverityColumn:
                    return FromSuiteText(result.SeverityText());
                case MsgNumColumn:
                    return QString::number(result.MessageNumber());
                default: {
                    const auto detail = static_cast<std::size_t>(column - Details1Column);
                    return detail < result.Details().size()
                               ? FromSuiteText(result.Details()[detail])
                               : QString();
                }
            }
        case Qt::DecorationRole:
            return column == DescriptionColumn ? QVariant(iconOf_(result.Severity())) : QVariant();
        case Qt::ToolTipRole: {
            // The whole result on the description; the whole detail on a detail's column.
            if (column >= Details1Column) {
                const auto detail = static_cast<std::size_t>(column - Details1Column);
                return detail < result.Details().size() ? FromSuiteText(result.Details()[detail])
                                                        : QVariant();
            }
            QString tip = FromSuiteText(result.Summary());
            for (const std::string& detail : result.Details())
                tip += QLatin1Char('\n') + FromSuiteText(detail);
            return tip;
        }
        case ResultIndexRole:
            return QVariant::fromValue(static_cast<qulonglong>(*resultIndex));
        default:
            return {};
    }
}

}  // namespace vtr
