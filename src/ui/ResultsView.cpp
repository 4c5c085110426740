#include "ResultsView.h"

#include <QContextMenuEvent>
#include <QHeaderView>

#include "ResultsModel.h"

namespace vtr {

void MiddleElidingDelegate::initStyleOption(QStyleOptionViewItem* option,
                                            const QModelIndex& index) const {
    QStyledItemDelegate::initStyleOption(option, index);
    option->textElideMode = Qt::ElideMiddle;
}

ResultsView::ResultsView(ResultsModel* model, QWidget* parent) : QTreeView(parent), model_(model) {
    setModel(model);
    setRootIsDecorated(false);
    setUniformRowHeights(true);
    setAlternatingRowColors(true);
    setAllColumnsShowFocus(true);
    setSelectionMode(QAbstractItemView::SingleSelection);
    setSelectionBehavior(QAbstractItemView::SelectRows);
    QHeaderView* columns = header();
    columns->setStretchLastSection(false);
    setColumnWidth(ResultsModel::DescriptionColumn, 300);
    setColumnWidth(ResultsModel::SeverityColumn, 80);
    setColumnWidth(ResultsModel::MsgNumColumn, 70);
    auto* details = new MiddleElidingDelegate(this);
    for (int i = 0; i < ResultsModel::kDetailColumns; ++i) {
        setColumnWidth(ResultsModel::Details1Column + i, 380);
        setItemDelegateForColumn(ResultsModel::Details1Column + i, details);
    }
    // The results stay in the order produced until a column header is clicked; a third
    // click on the same header goes back to it.
    columns->setSortIndicatorClearable(true);
    columns->setSortIndicator(-1, Qt::AscendingOrder);
    setSortingEnabled(true);
    connect(model, &QAbstractItemModel::layoutChanged, this, &ResultsView::ShowGroups);
    connect(model, &QAbstractItemModel::modelReset, this, &ResultsView::ShowGroups);
}

void ResultsView::ShowGroups() {
    const bool grouped = model_->IsGrouped();
    setRootIsDecorated(grouped);
    if (!grouped)
        return;
    for (int row = 0; row < model_->rowCount(); ++row)
        setFirstColumnSpanned(row, QModelIndex(), true);
}

void ResultsView::focusInEvent(QFocusEvent* event) {
    QTreeView::focusInEvent(event);
    // Reached from the keyboard, the list has a current row: it is the selected one, which
    // the details pane shows and the keys act on.
    const QModelIndex current = currentIndex();
    if (current.isValid() && !selectionModel()->hasSelection())
        selectionModel()->select(current,
                                 QItemSelectionModel::ClearAndSelect | QItemSelectionModel::Rows);
}

void ResultsView::contextMenuEvent(QContextMenuEvent* event) {
    if (event->reason() == QContextMenuEvent::Mouse) {
        // A click: the row under the pointer, where the pointer is. The event comes through
        // the viewport, in its coordinates.
        const QModelIndex index = indexAt(event->pos());
        if (index.isValid())
            emit PopupRequested(index, event->globalPos());
        return;
    }
    // The keyboard: the current row, below its text.
    const QModelIndex current = currentIndex();
    if (!current.isValid())
        return;
    scrollTo(current);
    emit PopupRequested(current, viewport()->mapToGlobal(visualRect(current).bottomLeft()));
}

}  // namespace vtr
