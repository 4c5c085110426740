#pragma once

#include <QAbstractItemModel>
#include <QIcon>
#include <cstddef>
#include <functional>
#include <optional>
#include <vector>

#include "engine/ResultGrouping.h"

namespace vtr {

// One of the window's result lists as a model: the results of a ResultGrouping that one
// listing takes (not ignored, or ignored), filtered, ordered and grouped as the grouping's
// view says, and optionally sorted by a column. Ungrouped, every row is a result; grouped,
// the top rows are the groups ("Message 43: Channel conflict (2,491)") and their children
// the results.
//
// The model holds indices into the grouping, never results of its own: the grouping is the
// one place where a run's results are kept, filtered and grouped.
class ResultsModel : public QAbstractItemModel {
    Q_OBJECT
  public:
    // The columns of both lists.
    enum Column { DescriptionColumn = 0, SeverityColumn = 1, MsgNumColumn = 2, Details1Column = 3 };
    static constexpr int kDetailColumns = 9;
    static constexpr int kColumns = Details1Column + kDetailColumns;
    // The result's index in the grouping (result rows only).
    static constexpr int ResultIndexRole = Qt::UserRole + 1;

    using IconOf = std::function<QIcon(Severity)>;

    ResultsModel(const ResultGrouping& grouping, Listing listing, IconOf iconOf,
                 QObject* parent = nullptr);

    Listing ListingShown() const { return query_.listing; }
    // The filter, order and grouping (the listing stays the model's own). The rows follow at
    // once; rows that stay keep their place in views (selection, expanded groups).
    void SetQuery(ResultQuery query);
    const ResultQuery& Query() const { return query_; }

    // Takes the results the grouping gained since the model last looked. Ungrouped in the
    // order of the run with no column sorted, those the listing and filter take are
    // appended; otherwise the whole view is laid out again. Returns whether rows changed.
    bool TakeNewResults();
    // Whether new results are simply appended (ungrouped, in the order of the run, no column
    // sorted): cheap enough to take at every drawing of a run.
    bool Appends() const;
    // Lays the whole view out again from the grouping (after results were ignored or are
    // no longer, or to take new ones in any order).
    void Relayout();
    // Forgets every row (the grouping was cleared).
    void Clear();

    // Rows shown (results, not groups), and the results of the listing the filter hides.
    std::size_t ShownCount() const { return view_.shown.size(); }
    std::size_t HiddenCount() const { return view_.hidden; }

    // The grouping's index of a result row; nothing for a group row or an invalid index.
    std::optional<std::size_t> ResultIndexOf(const QModelIndex& index) const;
    ResultPtr ResultAt(const QModelIndex& index) const;
    // The row of a result of the grouping (column 0); invalid when it is not shown.
    QModelIndex IndexOfResult(std::size_t resultIndex) const;
    // The group of a group row; nullptr for anything else.
    const ResultGroup* GroupAt(const QModelIndex& index) const;
    bool IsGrouped() const { return query_.groupBy != GroupBy::None; }
    // What a group holds: "2 errors, 1 warning".
    static QString CountsText(const SeverityCounts& counts);

    // QAbstractItemModel.
    QModelIndex index(int row, int column, const QModelIndex& parent = {}) const override;
    QModelIndex parent(const QModelIndex& child) const override;
    int rowCount(const QModelIndex& parent = {}) const override;
    int columnCount(const QModelIndex& parent = {}) const override;
    bool hasChildren(const QModelIndex& parent = {}) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    QVariant headerData(int section, Qt::Orientation orientation,
                        int role = Qt::DisplayRole) const override;
    Qt::ItemFlags flags(const QModelIndex& index) const override;
    // A column (-1: none, the order the query asks for). Severity and message number sort by
    // value, the texts as the user's language orders them; equal ones keep their order.
    // Grouped, the results are sorted within each group.
    void sort(int column, Qt::SortOrder order = Qt::AscendingOrder) override;

  private:
    // Where a row of the view is: a group, or a result in a group (or ungrouped).
    struct Place {
        int32_t group = -1;  // the group's row, -1 ungrouped
        int32_t row = -1;    // the result's row in its group (or the list); -1 for a group
    };

    // The results in the order rows show them, below a parent: the groups' members, or the
    // ungrouped results.
    std::vector<std::size_t>& RowsOf(int32_t group);
    const std::vector<std::size_t>& RowsOf(int32_t group) const;
    // The view as the grouping gives it, with the column sort applied.
    ResultView MakeView() const;
    void SortRows(std::vector<std::size_t>& rows) const;
    // Installs a new view, moving the views' persistent rows (selection, current row,
    // expanded and spanned groups) to where their results and groups now are.
    void InstallView(ResultView view);
    void IndexPlaces();

    const ResultGrouping& grouping_;
    IconOf iconOf_;
    ResultQuery query_;
    int sortColumn_ = -1;
    Qt::SortOrder sortOrder_ = Qt::AscendingOrder;
    ResultView view_;
    // Per result of the grouping, where it is shown (group -1, row -1: not shown).
    std::vector<Place> places_;
    // How many of the grouping's results the model has looked at.
    std::size_t seen_ = 0;
};

}  // namespace vtr
