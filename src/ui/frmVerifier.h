#pragma once

#include <QColor>
#include <QElapsedTimer>
#include <QHash>
#include <QIcon>
#include <QMainWindow>
#include <QString>
#include <memory>
#include <string>

#include "DialogPresenter.h"
#include "HelpProvider.h"
#include "ResultsModel.h"
#include "engine/INotificationClient.h"
#include "engine/Result.h"
#include "engine/ResultGrouping.h"

class QAction;
class QComboBox;
class QGroupBox;
class QLabel;
class QLineEdit;
class QMenu;
class QPlainTextEdit;
class QProgressBar;
class QPushButton;
class QRadioButton;
class QTabWidget;
class QTimer;
class QToolButton;

namespace vtr {

class ResultDetailsPane;
class ResultsView;

// The three severity images of the result lists, keyed "Info", "Warning" and "Error".
class SeverityImageList : public QObject {
    Q_OBJECT
  public:
    explicit SeverityImageList(QWidget* owner);
    // The image of a key; a null icon for any other key.
    QIcon Image(const QString& key) const { return images_.value(key); }
    QStringList Keys() const { return images_.keys(); }

  private:
    QHash<QString, QIcon> images_;
};

// The main window: the user chooses what to verify, starts and cancels the run, follows it
// in the output log, reads the results and the ignored results, ignores results, opens
// help on a result and saves the results report. Everything the run changes on it arrives
// through its notification handlers.
//
// Controls carry their names as object names ("cmdVerify", "lvResults1", "lvResults2",
// ...), so that tests and accessibility tools can find them.
class frmVerifier : public QMainWindow, public INotificationClient {
    Q_OBJECT
  public:
    struct Options {
        // Message boxes and file dialogs; the Qt dialogs when not given.
        std::shared_ptr<DialogPresenter> dialogs;
        // The help of this platform when not given.
        std::unique_ptr<HelpProvider> help;
        // Where the window keeps its size, position and last target (an INI file); the
        // per-user default of the program when empty. Never the suite's settings store.
        QString settingsFile;
    };

    // The tabs of sstDetails, in order.
    enum Tab { OutputLogTab = 0, ResultsTab = 1, IgnoredResultsTab = 2 };
    // The columns of both result lists.
    enum Column {
        DescriptionColumn = ResultsModel::DescriptionColumn,
        SeverityColumn = ResultsModel::SeverityColumn,
        MsgNumColumn = ResultsModel::MsgNumColumn,
        Details1Column = ResultsModel::Details1Column
    };

    // Loads the window: caption, notification client, help, the event pump and busy pointer
    // hooks, and the driver's collections (BeginVerification once).
    explicit frmVerifier(Options options, QWidget* parent = nullptr);
    explicit frmVerifier(QWidget* parent = nullptr);
    ~frmVerifier() override;

    // --- Notification handlers ---------------------------------------------------------
    void CheckAdded(ICheck& check) override;
    void CheckCompleted(ICheck& check) override;
    void Checking(ICheck& check) override;
    void ChecksCompleted(bool cancelled) override;
    void Initializing() override;
    void ResultAdded(const ResultPtr& result) override;
    void TransientMessage(const std::string& message) override;
    void VerificationCancelled() override;

    // --- Commands ---------------------------------------------------------------------
    // cmdVerify: applies the target and runs the verification (returns when it ended).
    void Verify();
    // cmdCancel: cancels the running verification.
    void Cancel();
    // cmdSave: asks for the report's file name and saves the report there.
    void Save();
    // cmdHelp: help on the selected result of the tab shown, else the verifier's page.
    void Help();
    // cmdTargetSequence / cmdTargetShow: the open-file dialogs of the target.
    void ChooseTargetSequence();
    void ChooseTargetShow();
    // The pop-up menu's commands for the result of an item of either list.
    void HelpOnResult(const ResultPtr& result);
    void IgnoreResult(const ResultPtr& result);
    void IgnoreMessageNumber(const ResultPtr& result);
    // The Ignored Results list's: take the result's key, or its message number, off the
    // ignore lists (as the command line's unignore does); what is no longer ignored moves
    // back to the Results list.
    void StopIgnoringResult(const ResultPtr& result);
    void StopIgnoringMessageNumber(const ResultPtr& result);
    // Puts a result on the clipboard as text (the pop-up menus' "Copy", Ctrl+C).
    void CopyResult(const ResultPtr& result);
    // Shows a folder in the desktop's file manager ("Open containing folder").
    void OpenFolder(const QString& folder);
    // A double-click (or Enter) on an item: help on its result.
    void OpenResult(const ResultPtr& result);

    // Chooses a file as the target by its kind: "lss" a show, "las"/"lms" a sequence
    // (any letter case), named by its absolute path (a relative one is taken from the working
    // folder). False, with nothing changed, for anything else or while running.
    bool SetTargetFile(const QString& file);

    // The report dialog: the chosen file name, or "" when the user cancelled.
    std::string ChooseResultsReportFile();
    // Writes the report of the last run (raises VtrError on failure).
    void SaveResultsReport(const std::string& fileName);

    // Moves every listed result to the list its Ignorable now calls for.
    void RefreshIgnoredResults();
    // The lists' filter, order and grouping, as the controls above the lists choose them.
    ResultQuery ChosenQuery() const;
    // Sets the four count labels from the driver's counts.
    void RefreshSummary();
    // Writes one line to the output log: time stamp, ": ", the text, in the colour of its
    // kind (a severity's number for a result's line, -1 for any other).
    void WriteLog(const QString& text, int kind);

    // The log colour of a line's kind on a page of that palette. On a light page: Info
    // blue, Warning orange, Error red, other lines black. On a dark one: lighter tones of the
    // same, other lines in the palette's text colour.
    static QColor LogColour(int kind, const QPalette& palette);
    // The result of a row of either list; null for a group's row or anything else.
    static ResultPtr ResultOf(const QModelIndex& index);

    bool IsRunning() const { return running_; }

  signals:
    // A verification started by Verify ended (after the window went back to idle).
    void VerificationFinished(bool cancelled);

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;
    void closeEvent(QCloseEvent* event) override;
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dropEvent(QDropEvent* event) override;

  private:
    void BuildControls();
    ResultsView* BuildResultList(const QString& name, Listing listing);
    // The filter box, the severity toggles, errors first, group by, and "N of M shown".
    QWidget* BuildFindBar(QWidget* parent);
    void BuildMenus();
    void SetTabOrder();
    void InstallPlatformHooks();
    // The event pump the core calls while a run goes.
    void PumpEvents();
    void LoadPlacement();
    void SavePlacement() const;

    void SetRunning(bool running);
    // The summary and the status text changed: shown at once when idle, at the next
    // drawing of the window while a run goes.
    void SummaryChanged();
    void SetStatus(const QString& text);
    // Writes the log lines kept back while a run goes.
    void FlushLog();
    // Colours every line of the log again, for the palette now in use.
    void RecolourLog();
    void ResetSummary();
    void ApplyTarget();
    void ChooseTarget(bool sequence);
    // The lists take the results added since they last looked: now, or (while a run goes)
    // as often as each list can afford.
    void TakeNewResults(bool now);
    // Both lists laid out again from the grouping, keeping the selected row in view.
    void RelayoutLists();
    // Applies the chosen filter, order and grouping to both lists.
    void ApplyQuery();
    // "N of M shown" for the list on view.
    void ShowCounts();
    void ShowResultPopup(ResultsView* list, const QModelIndex& index, const QPoint& globalPosition);
    // The details pane follows the selected result of the list shown.
    void ShowSelectedResult();
    ResultPtr SelectedResult(const ResultsView* list) const;
    // Changes the ignore lists for a result and moves the listed results accordingly; a
    // failure is shown under "Ignore List Error".
    template <typename Change>
    void ChangeIgnoreLists(const ResultPtr& result, Change&& change);
    // Runs a command; a failure is shown in a message box with that title.
    template <typename Command>
    void Guarded(const QString& title, Command&& command);
    void ShowError(const QString& title, const QString& text);

    std::shared_ptr<DialogPresenter> dialogs_;
    std::unique_ptr<HelpProvider> help_;
    QString settingsFile_;

    // Target.
    QGroupBox* frameTarget_ = nullptr;
    QRadioButton* optTargetSequence_ = nullptr;
    QLineEdit* txtTargetSequence_ = nullptr;
    QPushButton* cmdTargetSequence_ = nullptr;
    QRadioButton* optTargetShow_ = nullptr;
    QLineEdit* txtTargetShow_ = nullptr;
    QPushButton* cmdTargetShow_ = nullptr;
    QRadioButton* optTargetSchedule_ = nullptr;
    // Details.
    QTabWidget* sstDetails_ = nullptr;
    QPlainTextEdit* rtxOutputLog_ = nullptr;
    // The run's results, for both lists; each list is a view of it.
    ResultGrouping grouping_;
    // What the Results list holds, by severity (whatever its filter hides).
    SeverityCounts listedCounts_;
    ResultsView* lvResults_[2] = {nullptr, nullptr};
    // Finding what matters.
    QLineEdit* txtFilter_ = nullptr;
    QToolButton* chkShowErrors_ = nullptr;
    QToolButton* chkShowWarnings_ = nullptr;
    QToolButton* chkShowInfo_ = nullptr;
    QToolButton* chkErrorsFirst_ = nullptr;
    QComboBox* cboGroupBy_ = nullptr;
    QLabel* lblShown_ = nullptr;
    QTimer* filterTimer_ = nullptr;
    SeverityImageList* imlSeverity_ = nullptr;
    ResultDetailsPane* fraResultDetails_ = nullptr;
    // Summary.
    QGroupBox* frameSummary_ = nullptr;
    QLabel* lblChecksPerformedCount_ = nullptr;
    QLabel* lblChecksRemainingCount_ = nullptr;
    QLabel* lblErrorsCount_ = nullptr;
    QLabel* lblWarningsCount_ = nullptr;
    QProgressBar* prgVerification_ = nullptr;
    QLabel* lblStatus_ = nullptr;
    // Commands.
    QPushButton* cmdHelp_ = nullptr;
    QPushButton* cmdSave_ = nullptr;
    QPushButton* cmdCancel_ = nullptr;
    QPushButton* cmdVerify_ = nullptr;
    QMenu* mnuResultPopup_ = nullptr;
    QAction* mnuHelpOnResult_ = nullptr;
    QAction* mnuIgnoreResult_ = nullptr;
    QAction* mnuIgnoreMessageNumber_ = nullptr;
    QMenu* mnuIgnoredPopup_ = nullptr;
    QAction* mnuStopIgnoringResult_ = nullptr;
    QAction* mnuStopIgnoringMessageNumber_ = nullptr;
    ResultPtr popupResult_;  // the result the pop-up menu was opened on

    static constexpr qint64 kRepaintIntervalMs = 50;
    static constexpr qint64 kLogIntervalMs = 200;
    QElapsedTimer repaintClock_;
    QElapsedTimer logClock_;
    bool summaryPending_ = false;
    struct LogLine {
        QString text;
        int kind;
    };
    QList<LogLine> pendingLog_;
    QString statusText_;
    bool running_ = false;
    bool runCancelled_ = false;  // the last run ended by cancellation
    int checksDropped_ = 0;      // the checks its cancellation dropped from the queue
    bool closeWhenFinished_ = false;
    // How often lists that must be laid out whole take new results while a run goes.
    static constexpr qint64 kRelayoutIntervalMs = 400;
    QElapsedTimer relayoutClock_;
};

}  // namespace vtr
