#pragma once

#include <QStyledItemDelegate>
#include <QTreeView>

class QContextMenuEvent;

namespace vtr {

class ResultsModel;

// Draws a cell's text cut in the middle when it does not fit: a path keeps its file name.
class MiddleElidingDelegate : public QStyledItemDelegate {
    Q_OBJECT
  public:
    using QStyledItemDelegate::QStyledItemDelegate;
    void initStyleOption(QStyleOptionViewItem* option, const QModelIndex& index) const override;
};

// One of the window's result lists: a tree of a ResultsModel, one row per result, or the
// groups with their results below. The details' columns are wide and cut their text in the
// middle, so that a path keeps its file name in view; each cell's tool tip holds its whole
// text.
class ResultsView : public QTreeView {
    Q_OBJECT
  public:
    explicit ResultsView(ResultsModel* model, QWidget* parent = nullptr);

    ResultsModel* Model() const { return model_; }

  signals:
    // The pop-up menu is asked for on a row (the row under the pointer, or the current row
    // from the keyboard), to be shown at that place on the screen.
    void PopupRequested(const QModelIndex& index, const QPoint& globalPosition);

  protected:
    void focusInEvent(QFocusEvent* event) override;
    void contextMenuEvent(QContextMenuEvent* event) override;

  private:
    // Group rows span the list, with an expander; ungrouped lists have none.
    void ShowGroups();

    ResultsModel* model_;
};

}  // namespace vtr
