#pragma once

#include <QFrame>
#include <QIcon>
#include <QString>
#include <functional>

#include "engine/Result.h"

class QLabel;
class QPushButton;
class QTextBrowser;
class QUrl;

namespace vtr {

// The selected result whole, under the result lists: its summary, severity and message
// number, every detail line unabridged and selectable, a link to its help topic, "Copy"
// (the result as text on the clipboard) and, beside each detail line that names a file or
// folder, "Open containing folder".
//
// Controls carry object names: "lblResultSummary", "lblResultKind", "lblResultHelp",
// "txtResultDetails", "cmdCopyResult".
class ResultDetailsPane : public QFrame {
    Q_OBJECT
  public:
    explicit ResultDetailsPane(QWidget* parent = nullptr);

    // Shows a result (nothing: the pane says how to pick one). icon is its severity's image;
    // ignoredBy says why an ignored result is ignored ("" for one that is not).
    void ShowResult(const ResultPtr& result, const QIcon& icon = {}, const QString& ignoredBy = {});
    // Shows a group's row: its title and what it holds.
    void ShowGroup(const QString& title, const QIcon& icon, const QString& counts);
    const ResultPtr& CurrentResult() const { return result_; }

    // The pane's controls that take the keyboard, in reading order.
    QList<QWidget*> TabOrder() const;

    // Puts the result shown on the clipboard as text (nothing when none is shown).
    void CopyResult() const;

    // The result as text: the lines the results report writes for it.
    static QString ResultText(const Result& result);
    // The folder to open for a detail line that names a file or folder by its absolute
    // path (after a label such as "[SEQUENCE]: "): the folder itself, or the folder that
    // holds the file; "" when the line names none, or when that folder does not exist.
    static QString ContainingFolder(const QString& detail);

  signals:
    void HelpRequested(const vtr::ResultPtr& result);
    void OpenFolderRequested(const QString& folder);

  private:
    void LinkActivated(const QUrl& link);

    ResultPtr result_;
    QStringList folders_;  // per detail line: the folder to open, or ""
    QLabel* icon_ = nullptr;
    QLabel* summary_ = nullptr;
    QLabel* kind_ = nullptr;
    QLabel* help_ = nullptr;
    QPushButton* copy_ = nullptr;
    QTextBrowser* details_ = nullptr;
};

}  // namespace vtr
