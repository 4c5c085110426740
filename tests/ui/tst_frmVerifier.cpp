// The main window, driven as a user drives it, on a suite installation built in a temporary
// folder with its own settings store, window settings file, temporary folder and clock.
#include <QAbstractButton>
#include <QApplication>
#include <QClipboard>
#include <QComboBox>
#include <QGroupBox>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QMenu>
#include <QMimeData>
#include <QPlainTextEdit>
#include <QProcess>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScopeGuard>
#include <QSettings>
#include <QSignalSpy>
#include <QTabBar>
#include <QTabWidget>
#include <QTextBlock>
#include <QTextBrowser>
#include <QToolButton>
#include <QTreeView>
#include <QtTest>
#include <filesystem>
#include <fstream>
#include <functional>
#include <memory>

#include "ChmWriter.h"
#include "HelpViewer.h"
#include "ResultsView.h"
#include "UiTestMain.h"
#include "VtrVersion.h"
#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/VTRCommon.h"
#include "frmVerifier.h"
#include "schedule/DateTime.h"
#include "support/TempStore.h"

using vtr::FileDialogRequest;
using vtr::FileFilter;
using vtr::frmVerifier;
using vtr::ResultPtr;
using vtr::Severity;
namespace LibVerify = vtr::LibVerify;
namespace fs = std::filesystem;

namespace {

// Message boxes and file dialogs, written down instead of shown; file dialogs answer what
// the test says (cancel unless told otherwise).
class RecordingPresenter : public vtr::DialogPresenter {
  public:
    struct Box {
        QString title;
        QString text;
        bool operator==(const Box&) const = default;
    };
    QList<Box> boxes;
    QList<FileDialogRequest> requests;
    QStringList foldersOpened;
    bool folderOpens = true;
    std::function<std::optional<QString>(const FileDialogRequest&)> answer;

    void ShowError(QWidget*, const QString& title, const QString& text) override {
        boxes.append({title, text});
    }
    std::optional<QString> ChooseFile(QWidget*, const FileDialogRequest& request) override {
        requests.append(request);
        return answer ? answer(request) : std::nullopt;
    }
    bool OpenFolder(QWidget*, const QString& folder) override {
        foldersOpened.append(folder);
        return folderOpens;
    }
};

// A second notification client, registered after the window, that lets a test act while a
// run is going.
class Watcher : public vtr::INotificationClient {
  public:
    Watcher() { LibVerify::AddNotificationClient(this); }
    ~Watcher() override { LibVerify::RemoveNotificationClient(this); }

    void CheckAdded(vtr::ICheck&) override {}
    void CheckCompleted(vtr::ICheck&) override {
        ++completed;
        if (onCompleted)
            onCompleted(completed);
    }
    void Checking(vtr::ICheck&) override {
        if (onChecking)
            onChecking();
    }
    void ChecksCompleted(bool) override {}
    void Initializing() override { ++initializing; }
    void ResultAdded(const ResultPtr&) override {}
    void TransientMessage(const std::string&) override {}
    void VerificationCancelled() override {}

    int completed = 0;
    int initializing = 0;
    std::function<void(int completed)> onCompleted;
    std::function<void()> onChecking;
};

// The same moment for every time stamp: 24 December 2024, 3:07:09 in the afternoon.
vtr::DateTime FixedNow() {
    return vtr::DateTime::FromParts(2024, 12, 24, 15, 7, 9);
}
const QString kStamp = QStringLiteral("3:07:09 PM: ");

QStringList ListTexts(const QTreeView* list, int column = frmVerifier::DescriptionColumn) {
    QStringList texts;
    const QAbstractItemModel* model = list->model();
    for (int i = 0; i < model->rowCount(); ++i)
        texts.append(model->index(i, column).data().toString());
    return texts;
}

int RowCount(const QTreeView* list) {
    return list->model()->rowCount();
}

QModelIndex Row(const QTreeView* list, int row) {
    return list->model()->index(row, 0);
}

QString Text(const QModelIndex& row, int column) {
    return row.siblingAtColumn(column).data().toString();
}

qint64 IconKey(const QModelIndex& row) {
    return row.data(Qt::DecorationRole).value<QIcon>().cacheKey();
}

// The row of a result, at the top or inside a group.
QModelIndex ItemOf(const QTreeView* list, const ResultPtr& result) {
    const QAbstractItemModel* model = list->model();
    for (int i = 0; i < model->rowCount(); ++i) {
        const QModelIndex row = model->index(i, 0);
        if (frmVerifier::ResultOf(row) == result)
            return row;
        for (int j = 0; j < model->rowCount(row); ++j) {
            if (frmVerifier::ResultOf(model->index(j, 0, row)) == result)
                return model->index(j, 0, row);
        }
    }
    return {};
}

// A point on a row's description, in the list's viewport.
QPoint OnItem(const QTreeView* list, const QModelIndex& row) {
    const QRect rect = list->visualRect(row);
    return QPoint(rect.left() + 20, rect.center().y());
}

// A right click on an item through the window system, as a user's: the press reaches the
// window, which opens the context menu at the pointer.
QPoint RightClick(QTreeView* list, const QModelIndex& row) {
    const QPoint at = OnItem(list, row);
    QWidget* window = list->window();
    QTest::mouseClick(window->windowHandle(), Qt::RightButton, {},
                      list->viewport()->mapTo(window, at));
    return list->viewport()->mapToGlobal(at);
}

// A click on a menu's entry, where it is shown.
void ClickMenuEntry(QMenu* menu, const QString& text) {
    for (QAction* action : menu->actions()) {
        if (action->text() == text) {
            QTest::mouseClick(menu, Qt::LeftButton, {}, menu->actionGeometry(action).center());
            return;
        }
    }
    QFAIL(qPrintable(QStringLiteral("no menu entry ") + text));
}

#ifndef _WIN32
// A double-click on an item, as the system delivers it: press, release, then the double
// click itself (used by the help test, whose viewer is the program's own off Windows).
void DoubleClick(QTreeView* list, const QModelIndex& row) {
    const QPointF at = OnItem(list, row);
    const QPointF global = list->viewport()->mapToGlobal(at);
    for (QEvent::Type type : {QEvent::MouseButtonPress, QEvent::MouseButtonRelease,
                              QEvent::MouseButtonDblClick, QEvent::MouseButtonRelease}) {
        QMouseEvent event(type, at, global, Qt::LeftButton,
                          type == QEvent::MouseButtonRelease ? Qt::NoButton : Qt::LeftButton,
                          Qt::NoModifier);
        QApplication::sendEvent(list->viewport(), &event);
    }
}
#endif

// The command line's unignore, on the store in that file.
void UnignoreOnTheCommandLine(const std::string& store, const QStringList& what) {
    QProcess cli;
    cli.start(QStringLiteral(VTR_VERIFY_PROGRAM),
              QStringList{QStringLiteral("--registry"), QString::fromStdString(store),
                          QStringLiteral("unignore")} +
                  what);
    QVERIFY(cli.waitForFinished(30000));
    QCOMPARE(cli.exitStatus(), QProcess::NormalExit);
    QCOMPARE(cli.exitCode(), 0);
}

}  // namespace

class FrmVerifierTest : public QObject {
    Q_OBJECT

  private slots:
    void init();
    void cleanup();

    void loadsWithEveryControlAndBegins();
    void emptyTargetShowsItsMessageAndStartsNothing();
    void runFillsTheListsAndCounters();
    void runOnTheDemoInstallation();
    void cancelTakesEffectWhileTheRunGoes();
    void cancelFromTheKeyboard();
    void closingDuringARunCancelsItFirst();
    void resultsAreListedAndLoggedInTheirColours();
    void ignoredResultsAreListedApartAndStillLogged();
    void ignoringMovesTheListedResults();
    void resultListsSortByValue();
    void saveAsksForTheReportFileAndWritesIt();
    void targetDialogsAndTheirFailures();
    void filtersInTheDialogsNotation();
    void helpOnResultsAndOnTheVerifier();
    void placementAndTargetAreRemembered();
    void aDroppedFileBecomesTheTarget();
    void keyboardReachesTheCommands();
    void popupActsOnTheRowUnderThePointer();
    void countersFollowIgnoring();
    void relativeTargetsBecomeAbsolute();
    void aCancelledRunSaysSo();
    void versionAndHelpNeedNoDisplay();
    void logColoursSuitThePalette();
    void stopIgnoringFromTheIgnoredList();
    void detailsPaneShowsTheSelectedResultWhole();
    void filterFindsTextAndSeverities();
    void errorsFirstAndBackToTheOrderFound();
    void groupsCarryTheirCounts();
    void groupingFollowsARun();
    void detailColumnsShowFileNames();

  private:
    template <typename T>
    T* Find(const char* name) const {
        T* found = window_->findChild<T*>(QString::fromLatin1(name));
        if (found == nullptr)
            qFatal("no control %s", name);
        return found;
    }
    QTreeView* Results() const { return Find<QTreeView>("lvResults1"); }
    QTreeView* Ignored() const { return Find<QTreeView>("lvResults2"); }
    QStringList LogLines() const;
    QColor LogLineColour(int fromEnd) const;
    void Click(const char* button) const {
        QTest::mouseClick(Find<QPushButton>(button), Qt::LeftButton);
    }
    void ExpectIdle() const;
    std::unique_ptr<frmVerifier> MakeWindow();
    void ShowActive();
    std::string AppFolder() const { return folder_->File("app"); }
    std::string DataFolder() const { return folder_->File("data"); }
    std::vector<std::string> TemporaryFiles() const;
    // Seven results of one show: conflicts between sequences and inside one, a missing
    // sequence and show, information.
    struct Mix {
        ResultPtr conflict, missingSequence, conflictBack, noMedia, inside, intensity, missingShow;
    };
    Mix AddMix();
    void ChooseGroupBy(const QString& grouping);
    QString Shown() const { return Find<QLabel>("lblShown")->text(); }
    void Filter(const QString& text);

    std::unique_ptr<vtr::testsupport::TempFolder> folder_;
    std::unique_ptr<vtr::testsupport::ScopedStore> store_;
    std::unique_ptr<vtr::testsupport::ScopedEnvironment> tmpdir_;
    std::unique_ptr<vtr::ScopedNowSource> clock_;
    std::shared_ptr<RecordingPresenter> dialogs_;
    std::unique_ptr<frmVerifier> window_;
    std::string storeText_;
};

// Every test: an installed suite whose application folder is empty (so every application
// file is missing) and whose user-data folder holds no schedule.
void FrmVerifierTest::init() {
    folder_ = std::make_unique<vtr::testsupport::TempFolder>();
    fs::create_directories(AppFolder());
    fs::create_directories(DataFolder());
    fs::create_directories(folder_->File("tmp"));
    storeText_ =
        "Windows Registry Editor Version 5.00\r\n\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared]\r\n"
        "\"AppPath\"=\"" +
        AppFolder() +
        "\"\r\n"
        "\"UserDataPath\"=\"" +
        DataFolder() +
        "\"\r\n"
        "\"PostInstall\"=dword:00000001\r\n"
        "\"PostInstallVer\"=dword:00000035\r\n";
    vtr::testsupport::WriteFileBytes(folder_->File("registry.reg"), storeText_);
    store_ = std::make_unique<vtr::testsupport::ScopedStore>(folder_->File("registry.reg"));
    tmpdir_ = std::make_unique<vtr::testsupport::ScopedEnvironment>("TMPDIR", folder_->File("tmp"));
    clock_ = std::make_unique<vtr::ScopedNowSource>(&FixedNow);
    dialogs_ = std::make_shared<RecordingPresenter>();
    window_ = MakeWindow();
    ShowActive();
}

// Shown and active, as the user has it: keys reach the focused control, lists lay out.
void FrmVerifierTest::ShowActive() {
    window_->show();
    QVERIFY(QTest::qWaitForWindowExposed(window_.get()));
    window_->activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(window_.get()));
}

void FrmVerifierTest::cleanup() {
    window_.reset();
    dialogs_.reset();
    clock_.reset();
    tmpdir_.reset();
    store_.reset();
    folder_.reset();
}

std::unique_ptr<frmVerifier> FrmVerifierTest::MakeWindow() {
    frmVerifier::Options options;
    options.dialogs = dialogs_;
    options.settingsFile = QString::fromStdString(folder_->File("window.ini"));
    return std::make_unique<frmVerifier>(std::move(options));
}

QStringList FrmVerifierTest::LogLines() const {
    QStringList lines =
        Find<QPlainTextEdit>("rtxOutputLog")->toPlainText().split(QLatin1Char('\n'));
    // Every line ends with a break: the text ends with an empty line.
    if (!lines.isEmpty() && lines.constLast().isEmpty())
        lines.removeLast();
    return lines;
}

QColor FrmVerifierTest::LogLineColour(int fromEnd) const {
    QTextBlock block = Find<QPlainTextEdit>("rtxOutputLog")->document()->lastBlock();
    for (int i = 0; i <= fromEnd; ++i)
        block = block.previous();
    return block.begin().fragment().charFormat().foreground().color();
}

void FrmVerifierTest::ExpectIdle() const {
    QVERIFY(Find<QPushButton>("cmdVerify")->isEnabled());
    QVERIFY(Find<QPushButton>("cmdSave")->isEnabled());
    QVERIFY(Find<QPushButton>("cmdHelp")->isEnabled());
    QVERIFY(!Find<QPushButton>("cmdCancel")->isEnabled());
    QVERIFY(!window_->IsRunning());
}

std::vector<std::string> FrmVerifierTest::TemporaryFiles() const {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder_->File("tmp")))
        names.push_back(entry.path().filename().string());
    return names;
}

void FrmVerifierTest::loadsWithEveryControlAndBegins() {
    QCOMPARE(window_->windowTitle(), QStringLiteral("Vantori Verifier"));
    QCOMPARE(window_->objectName(), QStringLiteral("frmVerifier"));
    QVERIFY(Find<QGroupBox>("frameTarget"));
    QCOMPARE(Find<QRadioButton>("optTargetSequence")->text(),
             QStringLiteral("Verify a Single Sequence"));
    QCOMPARE(Find<QRadioButton>("optTargetShow")->text(), QStringLiteral("Verify a Single Show"));
    QCOMPARE(Find<QRadioButton>("optTargetSchedule")->text(),
             QStringLiteral("Verify Entire Schedule"));
    QVERIFY(Find<QRadioButton>("optTargetSchedule")->isChecked());
    QVERIFY(Find<QLineEdit>("txtTargetSequence")->text().isEmpty());
    QVERIFY(Find<QLineEdit>("txtTargetShow")->text().isEmpty());
    QVERIFY(Find<QPushButton>("cmdTargetSequence"));
    QVERIFY(Find<QPushButton>("cmdTargetShow"));

    auto* tabs = Find<QTabWidget>("sstDetails");
    QCOMPARE(tabs->count(), 3);
    QCOMPARE(tabs->tabText(0), QStringLiteral("Output Log"));
    QCOMPARE(tabs->tabText(1), QStringLiteral("Results"));
    QCOMPARE(tabs->tabText(2), QStringLiteral("Ignored Results"));
    QCOMPARE(tabs->widget(0), Find<QPlainTextEdit>("rtxOutputLog"));
    QCOMPARE(tabs->widget(1), Results());
    QCOMPARE(tabs->widget(2), Ignored());
    QVERIFY(Find<QPlainTextEdit>("rtxOutputLog")->isReadOnly());

    QStringList columns{QStringLiteral("Description"), QStringLiteral("Severity"),
                        QStringLiteral("Msg Num")};
    for (int i = 1; i <= 9; ++i)
        columns.append(QStringLiteral("Details%1").arg(i));
    for (QTreeView* list : {Results(), Ignored()}) {
        QCOMPARE(list->model()->columnCount(), 12);
        QStringList headers;
        for (int i = 0; i < list->model()->columnCount(); ++i)
            headers.append(list->model()->headerData(i, Qt::Horizontal).toString());
        QCOMPARE(headers, columns);
    }
    auto* images = window_->findChild<vtr::SeverityImageList*>(QStringLiteral("imlSeverity"));
    QVERIFY(images != nullptr);
    QStringList keys = images->Keys();
    keys.sort();
    QCOMPARE(keys, (QStringList{QStringLiteral("Error"), QStringLiteral("Info"),
                                QStringLiteral("Warning")}));
    for (const QString& key : keys)
        QVERIFY(!images->Image(key).isNull());

    QCOMPARE(Find<QGroupBox>("frameSummary")->title(), QStringLiteral("Summary"));
    QCOMPARE(Find<QLabel>("lblChecksPerformed")->text(), QStringLiteral("Checks Performed:"));
    QCOMPARE(Find<QLabel>("lblChecksRemaining")->text(), QStringLiteral("Checks Remaining:"));
    QCOMPARE(Find<QLabel>("lblErrors")->text(), QStringLiteral("Errors Detected:"));
    QCOMPARE(Find<QLabel>("lblWarnings")->text(), QStringLiteral("Warnings Detected:"));
    QCOMPARE(Find<QPushButton>("cmdHelp")->text(), QStringLiteral("&Help"));
    QCOMPARE(Find<QPushButton>("cmdSave")->text(), QStringLiteral("&Save"));
    QCOMPARE(Find<QPushButton>("cmdCancel")->text(), QStringLiteral("&Cancel"));
    QCOMPARE(Find<QPushButton>("cmdVerify")->text(), QStringLiteral("&Verify"));

    // The pop-up menu's entries, the result's own first; then Copy.
    const QList<QAction*> popup = Find<QMenu>("mnuResultPopup")->actions();
    QCOMPARE(popup.size(), 6);
    QCOMPARE(popup[0]->text(), QStringLiteral("Help on this result"));
    QVERIFY(popup[1]->isSeparator());
    QCOMPARE(popup[2]->text(), QStringLiteral("Ignore this result"));
    QCOMPARE(popup[3]->text(), QStringLiteral("Ignore all results with this message number"));
    QVERIFY(popup[4]->isSeparator());
    QCOMPARE(popup[5]->text(), QStringLiteral("Copy"));
    ExpectIdle();

    // Loaded: registered with the driver, and BeginVerification ran once, queueing the three
    // root checks, which the log and the summary show.
    QCOMPARE(LibVerify::ChecksRemainingCount(), 3);
    QCOMPARE(Find<QLabel>("lblChecksRemainingCount")->text(), QStringLiteral("3"));
    QCOMPARE(
        LogLines().filter(QRegularExpression(QStringLiteral("^3:07:09 PM: Adding check: "))).size(),
        3);
    LibVerify::PostTransientMessage("Loading sequence: 40%");
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("Loading sequence: 40%"));
    QCOMPARE(LogLineColour(0), QColor(0, 0, 0));
}

void FrmVerifierTest::emptyTargetShowsItsMessageAndStartsNothing() {
    Watcher watcher;
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(QStringLiteral("   "));
    Click("cmdVerify");
    Find<QRadioButton>("optTargetSequence")->setChecked(true);
    Click("cmdVerify");
    QCOMPARE(dialogs_->boxes, (QList<RecordingPresenter::Box>{
                                  {QStringLiteral("Verifier Error"),
                                   QStringLiteral("Please specify the show file to verify")},
                                  {QStringLiteral("Verifier Error"),
                                   QStringLiteral("Please specify the sequence file to verify")}}));
    QCOMPARE(watcher.initializing, 0);
    QCOMPARE(watcher.completed, 0);
    ExpectIdle();
    QVERIFY(TemporaryFiles().empty());
    QVERIFY(QApplication::overrideCursor() == nullptr);
}

void FrmVerifierTest::runFillsTheListsAndCounters() {
    const std::string show = folder_->File("Missing Show.lss");
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(QString::fromStdString(show));
    QSignalSpy finished(window_.get(), &frmVerifier::VerificationFinished);
    Click("cmdVerify");

    QCOMPARE(finished.size(), 1);
    QCOMPARE(finished.constFirst().constFirst().toBool(), false);
    ExpectIdle();
    QCOMPARE(Find<QTabWidget>("sstDetails")->currentIndex(), int(frmVerifier::ResultsTab));
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("Verification completed"));
    QVERIFY(LogLines().contains(kStamp + QStringLiteral("Show file does not exist: ") +
                                QString::fromStdString(show)));

    // Lists and counters agree with the driver's collections.
    QCOMPARE(RowCount(Results()), int(LibVerify::GetResults().size()));
    QCOMPARE(RowCount(Ignored()), 0);
    for (std::size_t i = 0; i < LibVerify::GetResults().size(); ++i)
        QCOMPARE(frmVerifier::ResultOf(Row(Results(), int(i))), LibVerify::GetResults()[i]);
    QVERIFY(ListTexts(Results()).contains(QStringLiteral("Show file does not exist")));
    QVERIFY(ListTexts(Results()).contains(QStringLiteral("Application file does not exist")));
    QVERIFY(LibVerify::ErrorCount() > 1);
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QString::number(LibVerify::ErrorCount()));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QString::number(LibVerify::WarningCount()));
    QVERIFY(LibVerify::ChecksPerformedCount() > 10);
    QCOMPARE(Find<QLabel>("lblChecksPerformedCount")->text(),
             QString::number(LibVerify::ChecksPerformedCount()));
    QCOMPARE(Find<QLabel>("lblChecksRemainingCount")->text(), QStringLiteral("0"));
    auto* progress = Find<QProgressBar>("prgVerification");
    QCOMPARE(progress->maximum(), LibVerify::ChecksPerformedCount());
    QCOMPARE(progress->value(), progress->maximum());

    // The show was wrapped in temporary schedules, and none is left; the busy pointer is gone.
    QVERIFY(TemporaryFiles().empty());
    QVERIFY(QApplication::overrideCursor() == nullptr);
    // The settings store was only read.
    QCOMPARE(vtr::testsupport::ReadFileBytes(folder_->File("registry.reg")), storeText_);
}

void FrmVerifierTest::runOnTheDemoInstallation() {
    const std::string demoStore = std::string(VTR_BINARY_DIR) + "/demo/registry.reg";
    if (!fs::exists(demoStore))
        QSKIP("the demo installation is not in the build folder");
    // A copy of the demo's store, so that nothing the window does reaches the demo.
    fs::copy_file(demoStore, folder_->File("demo.reg"));
    window_.reset();
    vtr::testsupport::ScopedStore demo(folder_->File("demo.reg"));
    window_ = MakeWindow();
    ShowActive();
    Click("cmdVerify");  // the entire schedule
    ExpectIdle();
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("Verification completed"));
    QVERIFY(RowCount(Results()) > 0);
    QCOMPARE(RowCount(Results()), int(LibVerify::GetResults().size()));
    QCOMPARE(RowCount(Ignored()), int(LibVerify::GetIgnoredResults().size()));
    QVERIFY(LibVerify::ChecksPerformedCount() > 20);
    QCOMPARE(Find<QLabel>("lblChecksPerformedCount")->text(),
             QString::number(LibVerify::ChecksPerformedCount()));
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QString::number(LibVerify::ErrorCount()));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QString::number(LibVerify::WarningCount()));
    QVERIFY(LibVerify::ErrorCount() + LibVerify::WarningCount() > 0);
#ifndef _WIN32
    // Help on a result opens its page of the demo's help file, found by its help-context id.
    const ResultPtr first = frmVerifier::ResultOf(Row(Results(), 0));
    Results()->setCurrentIndex(Row(Results(), 0));
    Click("cmdHelp");
    auto* viewer = window_->findChild<vtr::HelpViewer*>(QStringLiteral("HelpViewer"));
    QVERIFY(viewer != nullptr);
    QCOMPARE(viewer->CurrentPage(),
             QStringLiteral("/messages/msg%1.htm").arg(first->MessageNumber()));
    QVERIFY(dialogs_->boxes.isEmpty());
#endif
    QCOMPARE(vtr::testsupport::ReadFileBytes(folder_->File("demo.reg")),
             vtr::testsupport::ReadFileBytes(demoStore));
    window_.reset();
}

void FrmVerifierTest::cancelTakesEffectWhileTheRunGoes() {
    Watcher watcher;
    bool runningState = false;
    Qt::CursorShape pointer = Qt::ArrowCursor;
    watcher.onChecking = [&] {
        runningState = Find<QPushButton>("cmdCancel")->isEnabled() &&
                       !Find<QPushButton>("cmdVerify")->isEnabled() &&
                       !Find<QPushButton>("cmdSave")->isEnabled() &&
                       !Find<QPushButton>("cmdHelp")->isEnabled() && window_->IsRunning();
        if (QApplication::overrideCursor() != nullptr)
            pointer = QApplication::overrideCursor()->shape();
    };
    // The click arrives as a user's would: queued, and seen when the core lets the window
    // process its events after the second check.
    watcher.onCompleted = [&](int completed) {
        if (completed == 2)
            QMetaObject::invokeMethod(Find<QPushButton>("cmdCancel"), "click",
                                      Qt::QueuedConnection);
    };
    QSignalSpy finished(window_.get(), &frmVerifier::VerificationFinished);
    Click("cmdVerify");

    QVERIFY(runningState);
    QCOMPARE(pointer, Qt::WaitCursor);
    QVERIFY(QApplication::overrideCursor() == nullptr);
    QCOMPARE(finished.size(), 1);
    QCOMPARE(finished.constFirst().constFirst().toBool(), true);
    ExpectIdle();
    QCOMPARE(watcher.completed, 2);
    QCOMPARE(LibVerify::ChecksPerformedCount(), 2);
    QCOMPARE(LibVerify::ChecksRemainingCount(), 0);
    QCOMPARE(Find<QLabel>("lblChecksRemainingCount")->text(), QStringLiteral("0"));
    QCOMPARE(LogLines().constLast(),
             kStamp + QStringLiteral("Stopping verification due to cancellation"));
    QVERIFY(LogLines().contains(kStamp + QStringLiteral("Verification cancelled")));
    QVERIFY(ListTexts(Results()).contains(QStringLiteral("Verification cancelled")));
    QVERIFY(!ListTexts(Results()).contains(QStringLiteral("No errors or warnings found")));
    QCOMPARE(Find<QTabWidget>("sstDetails")->currentIndex(), int(frmVerifier::ResultsTab));
}

void FrmVerifierTest::cancelFromTheKeyboard() {
    Watcher watcher;
    watcher.onCompleted = [&](int completed) {
        if (completed == 1)
            QMetaObject::invokeMethod(
                window_.get(), [this] { QTest::keyClick(window_.get(), Qt::Key_Escape); },
                Qt::QueuedConnection);
    };
    QTest::keyClick(window_.get(), Qt::Key_F5);  // Verify
    QCOMPARE(watcher.completed, 1);
    QCOMPARE(LogLines().constLast(),
             kStamp + QStringLiteral("Stopping verification due to cancellation"));
    ExpectIdle();
}

void FrmVerifierTest::closingDuringARunCancelsItFirst() {
    Watcher watcher;
    watcher.onCompleted = [&](int completed) {
        if (completed == 1)
            QMetaObject::invokeMethod(window_.get(), &QWidget::close, Qt::QueuedConnection);
    };
    Click("cmdVerify");
    // The run ended through cancellation; then the window closed.
    QCOMPARE(watcher.completed, 1);
    QVERIFY(ListTexts(Results()).contains(QStringLiteral("Verification cancelled")));
    QTRY_VERIFY(!window_->isVisible());
    QVERIFY(fs::exists(folder_->File("window.ini")));
}

void FrmVerifierTest::resultsAreListedAndLoggedInTheirColours() {
    const ResultPtr warning =
        LibVerify::AddResult(Severity::Warning, "Channel conflict", 43, 43, {"A", "B"});
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("Channel conflict: A / B"));
    QCOMPARE(LogLineColour(0), QColor(255, 128, 0));
    const ResultPtr info =
        LibVerify::AddResult(Severity::Info, "No errors or warnings found", 1, 1);
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("No errors or warnings found"));
    QCOMPARE(LogLineColour(0), QColor(0, 0, 255));
    const ResultPtr error =
        LibVerify::AddResult(Severity::Error, "Show file does not exist", 21, 21, {"", "x.lss"});
    QCOMPARE(LogLines().constLast(), kStamp + QStringLiteral("Show file does not exist: x.lss"));
    QCOMPARE(LogLineColour(0), QColor(255, 0, 0));
    const ResultPtr odd = LibVerify::AddResult(static_cast<Severity>(7), "Odd", 99, 98,
                                               {"1", "2", "3", "4", "5", "6", "7", "8", "9"});
    QCOMPARE(LogLines().constLast(),
             kStamp + QStringLiteral("Odd: 1 / 2 / 3 / 4 / 5 / 6 / 7 / 8 / 9"));
    QCOMPARE(LogLineColour(0), QColor(0, 0, 0));
    // Earlier lines keep their colours.
    QCOMPARE(LogLineColour(3), QColor(255, 128, 0));

    QTreeView* list = Results();
    QCOMPARE(RowCount(list), 4);
    const QModelIndex item = Row(list, 0);
    QCOMPARE(frmVerifier::ResultOf(item), warning);
    QStringList texts;
    for (int column = 0; column < 12; ++column)
        texts.append(Text(item, column));
    QCOMPARE(texts, (QStringList{QStringLiteral("Channel conflict"),
                                 QStringLiteral("Warning"),
                                 QStringLiteral("43"),
                                 QStringLiteral("A"),
                                 QStringLiteral("B"),
                                 {},
                                 {},
                                 {},
                                 {},
                                 {},
                                 {},
                                 {}}));
    auto* images = window_->findChild<vtr::SeverityImageList*>(QStringLiteral("imlSeverity"));
    QCOMPARE(IconKey(item), images->Image(QStringLiteral("Warning")).cacheKey());
    QCOMPARE(IconKey(Row(list, 1)), images->Image(QStringLiteral("Info")).cacheKey());
    QCOMPARE(IconKey(Row(list, 2)), images->Image(QStringLiteral("Error")).cacheKey());
    QCOMPARE(Text(Row(list, 2), 3), QStringLiteral("x.lss"));
    const QModelIndex oddItem = Row(list, 3);
    QCOMPARE(frmVerifier::ResultOf(oddItem), odd);
    QCOMPARE(Text(oddItem, 1), QStringLiteral("Severity 7"));
    QCOMPARE(Text(oddItem, 2), QStringLiteral("98"));
    QCOMPARE(Text(oddItem, 11), QStringLiteral("9"));
    QVERIFY(oddItem.data(Qt::DecorationRole).value<QIcon>().isNull());
    // The counters follow the results as they come.
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QStringLiteral("1"));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("1"));
    Q_UNUSED(info);
    Q_UNUSED(error);
}

void FrmVerifierTest::ignoredResultsAreListedApartAndStillLogged() {
    vtr::IgnoreLists::IgnoreMessageNumber(23);
    const ResultPtr ignored =
        LibVerify::AddResult(Severity::Error, "Sequence file does not exist", 23, 23, {"a.lms"});
    QCOMPARE(RowCount(Results()), 0);
    QCOMPARE(RowCount(Ignored()), 1);
    QCOMPARE(frmVerifier::ResultOf(Row(Ignored(), 0)), ignored);
    QCOMPARE(LogLines().constLast(),
             kStamp + QStringLiteral("Sequence file does not exist: a.lms"));
    QCOMPARE(LogLineColour(0), QColor(255, 0, 0));
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QStringLiteral("0"));
}

void FrmVerifierTest::ignoringMovesTheListedResults() {
    const ResultPtr a = LibVerify::AddResult(Severity::Warning, "Five A", 5, 5, {"A"});
    const ResultPtr b = LibVerify::AddResult(Severity::Warning, "Five B", 5, 5, {"B"});
    const ResultPtr c = LibVerify::AddResult(Severity::Error, "Six C", 6, 6, {"C"});
    const ResultPtr d = LibVerify::AddResult(Severity::Warning, "Five D", 5, 5, {"D"});
    QTreeView* results = Results();
    QTreeView* ignored = Ignored();
    auto* menu = Find<QMenu>("mnuResultPopup");

    // Right click on B, "Ignore this result": B moves at once.
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    RightClick(results, ItemOf(results, b));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Ignore this result"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(results), (QStringList{QStringLiteral("Five A"), QStringLiteral("Six C"),
                                              QStringLiteral("Five D")}));
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Five B")}));
    QVERIFY(vtr::testsupport::ReadFileBytes(folder_->File("registry.reg"))
                .find("\"IgnoreMsg1\"=\"5-B / \"") != std::string::npos);

    // "Ignore all results with this message number" on A: the other fives follow, and the
    // ignored list keeps the order in which the results were produced.
    RightClick(results, ItemOf(results, a));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Ignore all results with this message number"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(results), (QStringList{QStringLiteral("Six C")}));
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Five A"), QStringLiteral("Five B"),
                                              QStringLiteral("Five D")}));
    QVERIFY(vtr::testsupport::ReadFileBytes(folder_->File("registry.reg"))
                .find("\"IgnoreMsgNum1\"=\"5\"") != std::string::npos);

    // Taken off the message-number list, A and D come back in place; B stays ignored on its own.
    vtr::IgnoreLists::UnignoreMessageNumber(5);
    window_->RefreshIgnoredResults();
    QCOMPARE(ListTexts(results), (QStringList{QStringLiteral("Five A"), QStringLiteral("Six C"),
                                              QStringLiteral("Five D")}));
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Five B")}));

    // The keyboard: Delete ignores the selected result.
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    results->setFocus();
    results->setCurrentIndex(ItemOf(results, c));
    QTest::keyClick(results, Qt::Key_Delete);
    QCOMPARE(ListTexts(results), (QStringList{QStringLiteral("Five A"), QStringLiteral("Five D")}));
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Five B"), QStringLiteral("Six C")}));
    QVERIFY(dialogs_->boxes.isEmpty());
}

void FrmVerifierTest::resultListsSortByValue() {
    LibVerify::AddResult(Severity::Error, "ten first", 10, 10);
    LibVerify::AddResult(Severity::Info, "two", 2, 2);
    LibVerify::AddResult(Severity::Warning, "ten second", 10, 10);
    LibVerify::AddResult(Severity::Warning, "seven", 7, 7);
    QTreeView* list = Results();
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    // Until a header is clicked, the order produced.
    QCOMPARE(ListTexts(list), (QStringList{QStringLiteral("ten first"), QStringLiteral("two"),
                                           QStringLiteral("ten second"), QStringLiteral("seven")}));
    // Message numbers by value (2 before 10), equal ones in the order produced.
    const int msgNumX = list->header()->sectionViewportPosition(frmVerifier::MsgNumColumn) + 5;
    QTest::mouseClick(list->header()->viewport(), Qt::LeftButton, {}, QPoint(msgNumX, 5));
    QCOMPARE(list->header()->sortIndicatorSection(), int(frmVerifier::MsgNumColumn));
    QCOMPARE(ListTexts(list),
             (QStringList{QStringLiteral("two"), QStringLiteral("seven"),
                          QStringLiteral("ten first"), QStringLiteral("ten second")}));
    // Severities by weight, not by name.
    list->sortByColumn(frmVerifier::SeverityColumn, Qt::AscendingOrder);
    QCOMPARE(ListTexts(list), (QStringList{QStringLiteral("two"), QStringLiteral("ten second"),
                                           QStringLiteral("seven"), QStringLiteral("ten first")}));
    // A result added to a sorted list takes its place there.
    LibVerify::AddResult(Severity::Info, "one", 1, 1);
    QTRY_COMPARE(ListTexts(list).indexOf(QStringLiteral("one")), 1);
}

void FrmVerifierTest::saveAsksForTheReportFileAndWritesIt() {
    LibVerify::AddResult(Severity::Warning, "Five", 5, 5, {"A"});
    LibVerify::AddResult(Severity::Error, "Six", 6, 6, {"B", "C"});
    const std::string report = folder_->File("report.txt");
    dialogs_->answer = [&](const FileDialogRequest&) { return QString::fromStdString(report); };
    Click("cmdSave");

    QCOMPARE(dialogs_->requests.size(), 1);
    const FileDialogRequest& request = dialogs_->requests.constFirst();
    QCOMPARE(request.kind, FileDialogRequest::Kind::Save);
    QCOMPARE(request.title, QStringLiteral("Save Verifier Results"));
    QCOMPARE(request.initialFolder, QString::fromStdString(vtr::VTRCommon::GetUserDataPath()));
    QCOMPARE(request.fileName, QStringLiteral("VTRVerifier Results"));
    QCOMPARE(request.defaultExtension, QStringLiteral("txt"));
    QCOMPARE(request.filters,
             (QList<FileFilter>{{QStringLiteral("Text Files (*.txt)"), {QStringLiteral("*.txt")}},
                                {QStringLiteral("HTML report"), {QStringLiteral("*.html")}}}));
    QCOMPARE(request.filterIndex, 1);
    QVERIFY(request.promptToOverwrite && request.hideReadOnlyBox && request.pathMustExist &&
            request.refuseReadOnlyFile);
    QCOMPARE(vtr::testsupport::ReadFileBytes(report),
             "Message Number: 5\r\nSeverity: Warning\r\nDescription: Five\r\nDetail: A\r\n" +
                 std::string(79, '=') +
                 "\r\nMessage Number: 6\r\nSeverity: Error\r\nDescription: Six\r\n"
                 "Detail #1: B\r\nDetail #2: C\r\n");
    QVERIFY(dialogs_->boxes.isEmpty());

    // A name ending in .html gets the HTML report of the same results.
    const std::string page = folder_->File("report.html");
    dialogs_->answer = [&](const FileDialogRequest&) { return QString::fromStdString(page); };
    Click("cmdSave");
    const std::string html = vtr::testsupport::ReadFileBytes(page);
    QVERIFY(html.starts_with("<!DOCTYPE html>"));
    QVERIFY(html.find("<meta name=\"generator\" content=\"vantori-verifier ") != std::string::npos);
    QVERIFY(html.find("id=\"count-errors\" data-count=\"1\"") != std::string::npos);
    QVERIFY(html.find("id=\"count-warnings\" data-count=\"1\"") != std::string::npos);
    QVERIFY(html.find("<span class=\"sm\">Six</span><ul class=\"d\"><li>B</li><li>C</li></ul>") !=
            std::string::npos);
    QVERIFY(dialogs_->boxes.isEmpty());

    // Cancelling the dialog saves nothing.
    fs::remove(report);
    dialogs_->answer = nullptr;
    Click("cmdSave");
    QVERIFY(!fs::exists(report));
    QVERIFY(dialogs_->boxes.isEmpty());

    // A file that cannot be written: the error under its title.
    const std::string unwritable = folder_->File("no such folder") + "/report.txt";
    dialogs_->answer = [&](const FileDialogRequest&) { return QString::fromStdString(unwritable); };
    Click("cmdSave");
    QCOMPARE(dialogs_->boxes.size(), 1);
    QCOMPARE(dialogs_->boxes[0].title, QStringLiteral("Error Saving Verifier Messages"));
    QVERIFY(dialogs_->boxes[0].text.startsWith(
        QString::fromStdString("Cannot create the results file " + unwritable)));

    // Never over a file of the suite that the window reads, such as its help file.
    const std::string helpFile = AppFolder() + "/VTRHelp.chm";
    vtr::testsupport::WriteFileBytes(helpFile, "help");
    dialogs_->boxes.clear();
    dialogs_->answer = [&](const FileDialogRequest&) { return QString::fromStdString(helpFile); };
    Click("cmdSave");
    QCOMPARE(dialogs_->boxes.size(), 1);
    QCOMPARE(dialogs_->boxes[0].title, QStringLiteral("Error Saving Verifier Messages"));
    QVERIFY(dialogs_->boxes[0].text.startsWith(
        QString::fromStdString("Cannot save the results file as " + helpFile)));
    QCOMPARE(vtr::testsupport::ReadFileBytes(helpFile), std::string("help"));
}

void FrmVerifierTest::targetDialogsAndTheirFailures() {
    const QList<FileFilter> sequenceFilters{
        {QStringLiteral("Vantori Sequence Files"),
         {QStringLiteral("*.las"), QStringLiteral("*.lms")}},
        {QStringLiteral("- Animation Sequences"), {QStringLiteral("*.las")}},
        {QStringLiteral("- Musical Sequences"), {QStringLiteral("*.lms")}}};
    const QString chosen = QString::fromStdString(folder_->File("Carol.lms"));
    dialogs_->answer = [&](const FileDialogRequest&) { return chosen; };
    Click("cmdTargetSequence");
    QCOMPARE(dialogs_->requests.size(), 1);
    FileDialogRequest request = dialogs_->requests.takeFirst();
    QCOMPARE(request.kind, FileDialogRequest::Kind::Open);
    QCOMPARE(request.title, QStringLiteral("Choose Target Sequence"));
    QVERIFY(request.fileName.isEmpty());
    QCOMPARE(request.filters, sequenceFilters);
    QCOMPARE(request.filterIndex, 1);
    QVERIFY(request.fileMustExist && request.pathMustExist && request.hideReadOnlyBox &&
            request.refuseReadOnlyFile && !request.promptToOverwrite);
    // With no file yet, the dialog starts in the user-data folder.
    QCOMPARE(request.initialFolder, QString::fromStdString(vtr::VTRCommon::GetUserDataPath()));
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(), chosen);
    QVERIFY(Find<QRadioButton>("optTargetSequence")->isChecked());

    // Cancelling leaves the box as it was.
    dialogs_->answer = nullptr;
    Click("cmdTargetSequence");
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(), chosen);
    // The next dialog starts where the chosen file is.
    QCOMPARE(dialogs_->requests.takeFirst().initialFolder, QString::fromStdString(folder_->Path()));

    Click("cmdTargetShow");
    request = dialogs_->requests.takeFirst();
    QCOMPARE(request.title, QStringLiteral("Choose Target Show"));
    QCOMPARE(
        request.filters,
        (QList<FileFilter>{{QStringLiteral("Vantori Show Files"), {QStringLiteral("*.lss")}}}));
    QVERIFY(Find<QLineEdit>("txtTargetShow")->text().isEmpty());
    QVERIFY(Find<QRadioButton>("optTargetSequence")->isChecked());
    QVERIFY(dialogs_->boxes.isEmpty());

    // A dialog that fails: its error under the title of the dialog's kind.
    dialogs_->answer = [](const FileDialogRequest&) -> std::optional<QString> {
        vtr::Raise(37, "test", "The dialog failed");
    };
    Click("cmdTargetShow");
    Click("cmdTargetSequence");
    QCOMPARE(
        dialogs_->boxes,
        (QList<RecordingPresenter::Box>{
            {QStringLiteral("Error Selecting Show"), QStringLiteral("The dialog failed")},
            {QStringLiteral("Error Selecting Sequence"), QStringLiteral("The dialog failed")}}));
}

void FrmVerifierTest::filtersInTheDialogsNotation() {
    QCOMPARE(vtr::FilterText({QStringLiteral("Vantori Sequence Files"),
                              {QStringLiteral("*.las"), QStringLiteral("*.lms")}}),
             QStringLiteral("Vantori Sequence Files (*.las *.lms)"));
    QCOMPARE(vtr::FilterText({QStringLiteral("Text Files (*.txt)"), {QStringLiteral("*.txt")}}),
             QStringLiteral("Text Files (*.txt)"));
    QCOMPARE(
        vtr::ParseFilterList(QStringLiteral("Text Files (*.txt)|*.txt")),
        (QList<FileFilter>{{QStringLiteral("Text Files (*.txt)"), {QStringLiteral("*.txt")}}}));
    QCOMPARE(vtr::ParseFilterList(QStringLiteral("Sequences|*.las; *.lms|Shows|*.lss|dangling")),
             (QList<FileFilter>{
                 {QStringLiteral("Sequences"), {QStringLiteral("*.las"), QStringLiteral("*.lms")}},
                 {QStringLiteral("Shows"), {QStringLiteral("*.lss")}}}));
}

void FrmVerifierTest::helpOnResultsAndOnTheVerifier() {
#ifdef _WIN32
    QSKIP("help goes to the system's help viewer on Windows");
#else
    vtr::testsupport::ChmContent help;
    help.files = {{"/Verifier.htm", "<h1>The Verifier</h1>"},
                  {"/msg43.htm", "<h1>Channel conflict</h1>"}};
    help.contextMap = {{43, "msg43.htm"}};
    const std::string helpFile = AppFolder() + "/VTRHelp.chm";
    vtr::testsupport::WriteChm(helpFile, help);
    auto viewerPage = [this] {
        auto* viewer = window_->findChild<vtr::HelpViewer*>(QStringLiteral("HelpViewer"));
        return viewer != nullptr && viewer->isVisible() ? viewer->CurrentPage() : QString();
    };

    // On the log tab: the verifier's own page.
    Click("cmdHelp");
    QCOMPARE(viewerPage(), QStringLiteral("/Verifier.htm"));

    const ResultPtr conflict = LibVerify::AddResult(Severity::Warning, "Channel conflict", 43, 43);
    const ResultPtr other =
        LibVerify::AddResult(Severity::Warning, "Trigger uses undefined network", 56, 53);
    auto* tabs = Find<QTabWidget>("sstDetails");
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    Results()->setCurrentIndex(ItemOf(Results(), conflict));
    Click("cmdHelp");
    QCOMPARE(viewerPage(), QStringLiteral("/msg43.htm"));
    // The ignored tab with nothing selected: the verifier's page again.
    tabs->setCurrentIndex(frmVerifier::IgnoredResultsTab);
    Click("cmdHelp");
    QCOMPARE(viewerPage(), QStringLiteral("/Verifier.htm"));

    // "Help on this result" and a double-click open the result's topic; an id the help file
    // does not map opens the verifier's page.
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    auto* menu = Find<QMenu>("mnuResultPopup");
    RightClick(Results(), ItemOf(Results(), conflict));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Help on this result"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(viewerPage(), QStringLiteral("/msg43.htm"));
    window_->OpenResult(other);
    QCOMPARE(viewerPage(), QStringLiteral("/Verifier.htm"));
    const QModelIndex item = ItemOf(Results(), conflict);
    DoubleClick(Results(), item);
    QCOMPARE(viewerPage(), QStringLiteral("/msg43.htm"));
    QVERIFY(dialogs_->boxes.isEmpty());

    // Without the help file, each way reports under its own title.
    fs::remove(helpFile);
    const QString failure = QString::fromStdString("Cannot open the help file " + helpFile);
    Click("cmdHelp");
    window_->HelpOnResult(conflict);
    DoubleClick(Results(), item);
    QCOMPARE(dialogs_->boxes, (QList<RecordingPresenter::Box>{
                                  {QStringLiteral("Help File Error"), failure},
                                  {QStringLiteral("Help Context Error"), failure},
                                  {QStringLiteral("Details List Double Click Error"), failure}}));
#endif
}

void FrmVerifierTest::placementAndTargetAreRemembered() {
    const QString show =
        QDir::toNativeSeparators(QString::fromStdString(folder_->File("Main.lss")));
    const QString sequence =
        QDir::toNativeSeparators(QString::fromStdString(folder_->File("Carol.lms")));
    // A size the window's layout allows: a smaller one grows to the layout's minimum, which
    // depends on the fonts there are (with none, every letter is a box and the minimum is
    // far wider).
    const QSize minimum = window_->minimumSizeHint();
    QVERIFY2(minimum.width() <= 777 && minimum.height() <= 555,
             qPrintable(QStringLiteral("the window needs at least %1 x %2")
                            .arg(minimum.width())
                            .arg(minimum.height())));
    window_->resize(777, 555);
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(show);
    Find<QLineEdit>("txtTargetSequence")->setText(sequence);
    QVERIFY(window_->close());

    window_ = MakeWindow();
    QCOMPARE(window_->size(), QSize(777, 555));
    QVERIFY(Find<QRadioButton>("optTargetShow")->isChecked());
    QCOMPARE(Find<QLineEdit>("txtTargetShow")->text(), show);
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(), sequence);
    // Kept in the window's own file, never in the suite's settings store.
    QCOMPARE(vtr::testsupport::ReadFileBytes(folder_->File("registry.reg")), storeText_);
}

void FrmVerifierTest::aDroppedFileBecomesTheTarget() {
    auto drop = [this](const QList<QUrl>& urls) {
        QMimeData data;
        data.setUrls(urls);
        QDragEnterEvent enter(QPoint(10, 10), Qt::CopyAction, &data, Qt::LeftButton,
                              Qt::NoModifier);
        QApplication::sendEvent(window_.get(), &enter);
        if (!enter.isAccepted())
            return false;
        QDropEvent dropped(QPointF(10, 10), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QApplication::sendEvent(window_.get(), &dropped);
        return dropped.isAccepted();
    };
    const QString show = QString::fromStdString(folder_->File("Main.LSS"));
    QVERIFY(drop({QUrl::fromLocalFile(show)}));
    QCOMPARE(Find<QLineEdit>("txtTargetShow")->text(), show);
    QVERIFY(Find<QRadioButton>("optTargetShow")->isChecked());
    const QString sequence = QString::fromStdString(folder_->File("Intro.las"));
    QVERIFY(drop({QUrl::fromLocalFile(sequence)}));
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(), sequence);
    QVERIFY(Find<QRadioButton>("optTargetSequence")->isChecked());

    // Not a target: another kind of file, two files, a remote address.
    QVERIFY(!drop({QUrl::fromLocalFile(QString::fromStdString(folder_->File("notes.txt")))}));
    QVERIFY(!drop({QUrl::fromLocalFile(show), QUrl::fromLocalFile(sequence)}));
    QVERIFY(!drop({QUrl(QStringLiteral("https://example.invalid/Main.lss"))}));
    QVERIFY(!window_->SetTargetFile(QStringLiteral("weeksched.lsc")));
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(), sequence);
    QVERIFY(Find<QRadioButton>("optTargetSequence")->isChecked());
}

void FrmVerifierTest::keyboardReachesTheCommands() {
    // The buttons' own letters, and the usual keys.
    // (A button's letter presses it visibly: the click follows a moment later.)
    QTest::keyClick(window_.get(), Qt::Key_S, Qt::AltModifier);
    QTRY_COMPARE(dialogs_->requests.size(), 1);
    QTest::keyClick(window_.get(), Qt::Key_S, Qt::ControlModifier);
    QCOMPARE(dialogs_->requests.size(), 2);
    QCOMPARE(dialogs_->requests[1].title, QStringLiteral("Save Verifier Results"));
    Find<QRadioButton>("optTargetSequence")->setChecked(true);
    QTest::keyClick(window_.get(), Qt::Key_O, Qt::ControlModifier);
    QCOMPARE(dialogs_->requests.size(), 3);
    QCOMPARE(dialogs_->requests[2].title, QStringLiteral("Choose Target Sequence"));
    // Alt+V verifies; the empty sequence box says so.
    QTest::keyClick(window_.get(), Qt::Key_V, Qt::AltModifier);
    QTRY_COMPARE(dialogs_->boxes.size(), 1);
    QCOMPARE(dialogs_->boxes[0].text, QStringLiteral("Please specify the sequence file to verify"));
    // F1: help (here without a help file, so its error).
    QTest::keyClick(window_.get(), Qt::Key_F1);
    QCOMPARE(dialogs_->boxes.size(), 2);
    QCOMPARE(dialogs_->boxes[1].title, QStringLiteral("Help File Error"));
    // The menu key opens the pop-up menu on the current result.
    LibVerify::AddResult(Severity::Warning, "Five", 5, 5);
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    Results()->setFocus();
    Results()->setCurrentIndex(Row(Results(), 0));
    QContextMenuEvent menuKey(QContextMenuEvent::Keyboard, QPoint(0, 0),
                              Results()->mapToGlobal(QPoint(0, 0)));
    QApplication::sendEvent(Results(), &menuKey);
    auto* menu = Find<QMenu>("mnuResultPopup");
    QTRY_VERIFY(menu->isVisible());
    menu->hide();

    // Tab goes down the window: from the grouping (Alt+G) to the tabs, the list on view, and
    // the result shown in the details pane (its Copy, its details).
    QTest::keyClick(window_.get(), Qt::Key_G, Qt::AltModifier);
    QCOMPARE(QApplication::focusWidget(), Find<QComboBox>("cboGroupBy"));
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QVERIFY(qobject_cast<QTabBar*>(QApplication::focusWidget()) != nullptr);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QCOMPARE(QApplication::focusWidget(), static_cast<QWidget*>(Results()));
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QCOMPARE(QApplication::focusWidget(), Find<QPushButton>("cmdCopyResult"));
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QCOMPARE(QApplication::focusWidget(), Find<QTextBrowser>("txtResultDetails"));
    // Alt+F: the filter.
    QTest::keyClick(window_.get(), Qt::Key_F, Qt::AltModifier);
    QCOMPARE(QApplication::focusWidget(), Find<QLineEdit>("txtFilter"));
}

void FrmVerifierTest::popupActsOnTheRowUnderThePointer() {
    const ResultPtr error =
        LibVerify::AddResult(Severity::Error, "Show file does not exist", 21, 21, {"a.lss"});
    const ResultPtr first = LibVerify::AddResult(Severity::Warning, "Five A", 5, 5, {"A"});
    const ResultPtr second = LibVerify::AddResult(Severity::Warning, "Five B", 5, 5, {"B"});
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    QTreeView* results = Results();
    // The user had selected the error, then right-clicks the second warning.
    QTest::mouseClick(results->viewport(), Qt::LeftButton, {},
                      OnItem(results, ItemOf(results, error)));
    QCOMPARE(results->currentIndex(), ItemOf(results, error));
    auto* menu = Find<QMenu>("mnuResultPopup");
    const QPoint pointer = RightClick(results, ItemOf(results, second));
    QTRY_VERIFY(menu->isVisible());
    // The menu opens at the pointer, on the row under it, which becomes the selected one.
    QCOMPARE(menu->pos(), pointer);
    QCOMPARE(results->currentIndex(), ItemOf(results, second));
    ClickMenuEntry(menu, QStringLiteral("Ignore this result"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(results),
             (QStringList{QStringLiteral("Show file does not exist"), QStringLiteral("Five A")}));
    QCOMPARE(ListTexts(Ignored()), (QStringList{QStringLiteral("Five B")}));
    const std::string store = vtr::testsupport::ReadFileBytes(folder_->File("registry.reg"));
    QVERIFY(store.find("\"IgnoreMsg1\"=\"5-B / \"") != std::string::npos);
    QVERIFY(store.find("\"CountIgnoreMsg\"=dword:00000001") != std::string::npos);

    // The same on the first row, right under the header.
    RightClick(results, ItemOf(results, error));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Ignore all results with this message number"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(results), (QStringList{QStringLiteral("Five A")}));
    QVERIFY(vtr::testsupport::ReadFileBytes(folder_->File("registry.reg"))
                .find("\"IgnoreMsgNum1\"=\"21\"") != std::string::npos);
    Q_UNUSED(first);
}

void FrmVerifierTest::countersFollowIgnoring() {
    const ResultPtr e1 = LibVerify::AddResult(Severity::Error, "Error one", 21, 21, {"1"});
    const ResultPtr e2 = LibVerify::AddResult(Severity::Error, "Error two", 21, 21, {"2"});
    LibVerify::AddResult(Severity::Error, "Error three", 22, 22, {"3"});
    const ResultPtr w1 = LibVerify::AddResult(Severity::Warning, "Warning one", 5, 5, {"4"});
    const ResultPtr w2 = LibVerify::AddResult(Severity::Warning, "Warning two", 5, 5, {"5"});
    LibVerify::AddResult(Severity::Info, "Info", 1, 1);
    auto* tabs = Find<QTabWidget>("sstDetails");
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    QTreeView* results = Results();
    QTreeView* ignored = Ignored();
    auto* menu = Find<QMenu>("mnuResultPopup");
    auto* ignoredMenu = Find<QMenu>("mnuIgnoredPopup");
    // What the counters say, with what the list on view holds.
    auto counters = [this] {
        return QStringList{Find<QLabel>("lblErrorsCount")->text(),
                           Find<QLabel>("lblWarningsCount")->text(), Shown()};
    };
    auto choose = [](QTreeView* list, QMenu* popup, const ResultPtr& result, const char* entry) {
        RightClick(list, ItemOf(list, result));
        QTRY_VERIFY(popup->isVisible());
        ClickMenuEntry(popup, QString::fromLatin1(entry));
        QTRY_VERIFY(!popup->isVisible());
    };
    QCOMPARE(counters(), (QStringList{"3", "2", "6 of 6 shown"}));

    // Ignoring, by the Results list's menu and its keys.
    choose(results, menu, e2, "Ignore this result");
    QCOMPARE(counters(), (QStringList{"2", "2", "5 of 5 shown"}));
    results->setCurrentIndex(ItemOf(results, w1));
    QTest::keyClick(results, Qt::Key_Delete, Qt::ShiftModifier);
    QCOMPARE(counters(), (QStringList{"2", "0", "3 of 3 shown"}));
    choose(results, menu, e1, "Ignore all results with this message number");
    QCOMPARE(counters(), (QStringList{"1", "0", "2 of 2 shown"}));  // e2 now ignored twice over

    // And back, from the Ignored Results list; the counters count the Results list whichever
    // list is on view.
    tabs->setCurrentIndex(frmVerifier::IgnoredResultsTab);
    QCOMPARE(counters(), (QStringList{"1", "0", "4 of 4 shown"}));
    const std::string storeFile = folder_->File("registry.reg");
    const std::string cliStore = folder_->File("cli.reg");
    fs::copy_file(storeFile, cliStore);
    choose(ignored, ignoredMenu, w2, "Stop ignoring all results with this message number");
    QCOMPARE(counters(), (QStringList{"1", "2", "2 of 2 shown"}));
    // The store changed exactly as the command line's unignore changes it.
    UnignoreOnTheCommandLine(cliStore, {QStringLiteral("--message"), QStringLiteral("5")});
    QCOMPARE(vtr::testsupport::ReadFileBytes(storeFile), vtr::testsupport::ReadFileBytes(cliStore));

    choose(ignored, ignoredMenu, e1, "Stop ignoring all results with this message number");
    QCOMPARE(counters(), (QStringList{"2", "2", "1 of 1 shown"}));  // e2 still ignored alone
    ignored->setFocus();
    ignored->setCurrentIndex(ItemOf(ignored, e2));
    QTest::keyClick(ignored, Qt::Key_Delete);
    QCOMPARE(counters(), (QStringList{"3", "2", "0 of 0 shown"}));
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    QCOMPARE(counters(), (QStringList{"3", "2", "6 of 6 shown"}));
    QVERIFY(dialogs_->boxes.isEmpty());
}

void FrmVerifierTest::relativeTargetsBecomeAbsolute() {
    // The working folder is the test's; the target is named relative to it.
    const QString previous = QDir::currentPath();
    QVERIFY(QDir::setCurrent(QString::fromStdString(folder_->Path())));
    auto restore = qScopeGuard([&] { QDir::setCurrent(previous); });
    fs::create_directories(folder_->File("shows"));
    const QString absoluteShow = QDir::toNativeSeparators(
        QString::fromStdString(folder_->File("shows")) + QStringLiteral("/Missing.lss"));

    // Typed.
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(QStringLiteral("shows/../shows/Missing.lss"));
    Click("cmdVerify");
    QCOMPARE(Find<QLineEdit>("txtTargetShow")->text(), absoluteShow);
    QVERIFY(
        LogLines().contains(kStamp + QStringLiteral("Show file does not exist: ") + absoluteShow));

#ifndef Q_OS_WIN
    // Typed from the home folder, as on a terminal.
    fs::create_directories(folder_->File("home"));
    const vtr::testsupport::ScopedEnvironment home("HOME", folder_->File("home"));
    Find<QLineEdit>("txtTargetShow")->setText(QStringLiteral("~/Evening.lss"));
    Click("cmdVerify");
    QCOMPARE(Find<QLineEdit>("txtTargetShow")->text(),
             QString::fromStdString(folder_->File("home") + "/Evening.lss"));
#endif

    // Given on the command line (or dropped).
    QVERIFY(window_->SetTargetFile(QStringLiteral("Intro.las")));
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(),
             QDir::toNativeSeparators(QString::fromStdString(folder_->File("Intro.las"))));

    // Remembered: absolute, so that it holds wherever the window opens next.
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(QStringLiteral("Other.lss"));
    QVERIFY(window_->close());
    const QSettings settings(QString::fromStdString(folder_->File("window.ini")),
                             QSettings::IniFormat);
    QCOMPARE(settings.value(QStringLiteral("target/show")).toString(),
             QDir::toNativeSeparators(QString::fromStdString(folder_->File("Other.lss"))));

    // A relative one remembered by an older window is read against the working folder.
    {
        QSettings old(QString::fromStdString(folder_->File("window.ini")), QSettings::IniFormat);
        old.setValue(QStringLiteral("target/sequence"), QStringLiteral("old/Carol.lms"));
    }
    window_ = MakeWindow();
    QCOMPARE(Find<QLineEdit>("txtTargetSequence")->text(),
             QDir::toNativeSeparators(QString::fromStdString(folder_->File("old")) +
                                      QStringLiteral("/Carol.lms")));
}

void FrmVerifierTest::aCancelledRunSaysSo() {
    Watcher watcher;
    watcher.onCompleted = [&](int completed) {
        if (completed == 2)
            QMetaObject::invokeMethod(Find<QPushButton>("cmdCancel"), "click",
                                      Qt::QueuedConnection);
    };
    Click("cmdVerify");
    auto* progress = Find<QProgressBar>("prgVerification");
    QCOMPARE(progress->text(), QStringLiteral("Cancelled"));
    // The bar stops where the run did, short of the checks that were dropped.
    QCOMPARE(progress->value(), 2);
    QVERIFY(progress->maximum() > 2);
    QVERIFY(Find<QLabel>("lblStatus")->text().startsWith(QStringLiteral("Cancelled")));

    // The next run counts checks again.
    watcher.onCompleted = nullptr;
    Click("cmdVerify");
    QCOMPARE(progress->text(), QStringLiteral("%1 of %1 checks").arg(progress->maximum()));
    QVERIFY(!Find<QLabel>("lblStatus")->text().startsWith(QStringLiteral("Cancelled")));
}

void FrmVerifierTest::versionAndHelpNeedNoDisplay() {
    // A platform that cannot be had: the answers must come before any window system is asked.
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("no-such-platform"));
    environment.remove(QStringLiteral("DISPLAY"));
    environment.remove(QStringLiteral("WAYLAND_DISPLAY"));
    auto run = [&](const QString& argument) {
        QProcess program;
        program.setProcessEnvironment(environment);
        program.start(QStringLiteral(VTR_VERIFIER_PROGRAM), {argument});
        program.waitForFinished(30000);
        return std::make_pair(
            program.exitStatus() == QProcess::NormalExit ? program.exitCode() : -1,
            QString::fromLocal8Bit(program.readAllStandardOutput()));
    };
    const auto [versionStatus, version] = run(QStringLiteral("--version"));
    QCOMPARE(versionStatus, 0);
    QCOMPARE(version.trimmed(),
             QStringLiteral("vantori-verifier ") + QString::fromLatin1(vtr::kVersionText));
    const auto [helpStatus, help] = run(QStringLiteral("--help"));
    QCOMPARE(helpStatus, 0);
    QVERIFY(help.contains(QStringLiteral("--registry <FILE>")));
    QVERIFY(help.contains(QStringLiteral("[TARGET]")));

#ifdef Q_OS_WIN
    // A window program has no console: from the command prompt, with its output redirected
    // to a file, the answer is in the file (not in a message box).
    const QString answerFile = QString::fromStdString(folder_->File("version.txt"));
    QProcess prompt;
    prompt.setProcessEnvironment(environment);
    prompt.setProgram(QStringLiteral("cmd.exe"));
    prompt.setNativeArguments(
        QStringLiteral("/c \"\"%1\" --version > \"%2\"\"")
            .arg(QDir::toNativeSeparators(QStringLiteral(VTR_VERIFIER_PROGRAM)),
                 QDir::toNativeSeparators(answerFile)));
    prompt.start();
    QVERIFY(prompt.waitForFinished(30000));
    QCOMPARE(QString::fromStdString(vtr::testsupport::ReadFileBytes(answerFile.toStdString())),
             QStringLiteral("vantori-verifier ") + QString::fromLatin1(vtr::kVersionText) +
                 QStringLiteral("\r\n"));
#endif

#if defined(Q_OS_UNIX) && !defined(Q_OS_MACOS)
    // Opening the window with no display at all: a message that says why, not an abort.
    environment.remove(QStringLiteral("QT_QPA_PLATFORM"));
    QProcess program;
    program.setProcessEnvironment(environment);
    program.start(
        QStringLiteral(VTR_VERIFIER_PROGRAM),
        {QStringLiteral("--registry"), QString::fromStdString(folder_->File("registry.reg"))});
    QVERIFY(program.waitForFinished(30000));
    QCOMPARE(program.exitStatus(), QProcess::NormalExit);
    QCOMPARE(program.exitCode(), 3);
    QCOMPARE(QString::fromLocal8Bit(program.readAllStandardError()),
             QStringLiteral("vantori-verifier: there is no display to open the window on "
                            "(neither DISPLAY nor WAYLAND_DISPLAY is set).\nOn a terminal, "
                            "vantori-verify verifies the same installation without a window.\n"));
#endif
}

void FrmVerifierTest::logColoursSuitThePalette() {
    auto* log = Find<QPlainTextEdit>("rtxOutputLog");
    // On a light page: the severities' own colours, and black.
    LibVerify::AddResult(Severity::Info, "Info", 1, 1);
    QCOMPARE(LogLineColour(0), QColor(0, 0, 255));
    LibVerify::AddResult(Severity::Warning, "Warning", 5, 5);
    QCOMPARE(LogLineColour(0), QColor(255, 128, 0));
    LibVerify::AddResult(Severity::Error, "Error", 21, 21);
    QCOMPARE(LogLineColour(0), QColor(255, 0, 0));

    // A dark palette: every line stays readable against the page, the earlier ones included.
    QPalette dark;
    dark.setColor(QPalette::Base, QColor(30, 30, 30));
    dark.setColor(QPalette::Text, QColor(220, 220, 220));
    dark.setColor(QPalette::Window, QColor(45, 45, 45));
    dark.setColor(QPalette::WindowText, QColor(220, 220, 220));
    window_->setPalette(dark);
    LibVerify::PostTransientMessage("Loading sequence: 40%");
    const QColor page = log->palette().color(QPalette::Base);
    QCOMPARE(page, QColor(30, 30, 30));
    auto readable = [&](const QColor& colour) {
        return colour.lightnessF() - page.lightnessF() > 0.4;
    };
    QVERIFY(readable(LogLineColour(0)));  // the plain line
    const QColor info = LogLineColour(3);
    const QColor warning = LogLineColour(2);
    const QColor error = LogLineColour(1);
    for (const QColor& colour : {info, warning, error})
        QVERIFY2(readable(colour), qPrintable(colour.name()));
    // Still the same hues: blue, orange, red.
    QVERIFY(info.blue() > info.red() && info.blue() > info.green());
    QVERIFY(warning.red() > warning.green() && warning.green() > warning.blue());
    QVERIFY(error.red() > error.green() && error.green() == error.blue());
    LibVerify::AddResult(Severity::Error, "Error", 21, 21);
    QCOMPARE(LogLineColour(0), error);

    // Back to light: the severities' own colours again.
    window_->setPalette(QPalette(QColor(240, 240, 240)));
    QCOMPARE(LogLineColour(0), QColor(255, 0, 0));
    QCOMPARE(LogLineColour(4), QColor(0, 0, 255));
}

void FrmVerifierTest::stopIgnoringFromTheIgnoredList() {
    const ResultPtr a = LibVerify::AddResult(Severity::Warning, "Five A", 5, 5, {"A"});
    const ResultPtr b = LibVerify::AddResult(Severity::Warning, "Five B", 5, 5, {"B"});
    const ResultPtr c = LibVerify::AddResult(Severity::Error, "Six C", 6, 6, {"C"});
    const ResultPtr d = LibVerify::AddResult(Severity::Warning, "Seven D", 7, 7, {"D"});
    window_->IgnoreResult(b);
    window_->IgnoreMessageNumber(c);
    window_->IgnoreResult(d);
    window_->IgnoreMessageNumber(d);  // D is ignored twice over
    auto* tabs = Find<QTabWidget>("sstDetails");
    tabs->setCurrentIndex(frmVerifier::IgnoredResultsTab);
    QTreeView* ignored = Ignored();
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Five B"), QStringLiteral("Six C"),
                                              QStringLiteral("Seven D")}));
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QStringLiteral("0"));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("1"));

    // The ignored list's menu offers the way back, for what each result is ignored by.
    auto* menu = Find<QMenu>("mnuIgnoredPopup");
    QStringList entries;
    for (QAction* action : menu->actions())
        entries.append(action->text());
    QCOMPARE(entries, (QStringList{QStringLiteral("Help on this result"), QString(),
                                   QStringLiteral("Stop ignoring this result"),
                                   QStringLiteral("Stop ignoring all results with this message "
                                                  "number"),
                                   QString(), QStringLiteral("Copy")}));
    auto* byKey = Find<QAction>("mnuStopIgnoringResult");
    auto* byNumber = Find<QAction>("mnuStopIgnoringMessageNumber");
    RightClick(ignored, ItemOf(ignored, c));
    QTRY_VERIFY(menu->isVisible());
    QVERIFY(!Find<QMenu>("mnuResultPopup")->isVisible());
    QVERIFY(!byKey->isEnabled());
    QVERIFY(byNumber->isEnabled());
    menu->hide();
    RightClick(ignored, ItemOf(ignored, d));
    QTRY_VERIFY(menu->isVisible());
    QVERIFY(byKey->isEnabled() && byNumber->isEnabled());
    menu->hide();

    // B, ignored on its own: back in its place at once, and the store changed exactly as the
    // command line's unignore changes it.
    const std::string storeFile = folder_->File("registry.reg");
    const std::string cliStore = folder_->File("cli.reg");
    fs::copy_file(storeFile, cliStore);
    RightClick(ignored, ItemOf(ignored, b));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Stop ignoring this result"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(Results()),
             (QStringList{QStringLiteral("Five A"), QStringLiteral("Five B")}));
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Six C"), QStringLiteral("Seven D")}));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("2"));
    UnignoreOnTheCommandLine(cliStore, {QStringLiteral("--key"), QStringLiteral("5-B / ")});
    QCOMPARE(vtr::testsupport::ReadFileBytes(storeFile), vtr::testsupport::ReadFileBytes(cliStore));
    const std::string store = vtr::testsupport::ReadFileBytes(storeFile);
    QVERIFY(store.find("\"CountIgnoreMsg\"=dword:00000001") != std::string::npos);
    QVERIFY(store.find("\"IgnoreMsg1\"=\"7-D / \"") != std::string::npos);

    // C, ignored by its message number: the keyboard's Shift+Delete.
    ignored->setFocus();
    ignored->setCurrentIndex(ItemOf(ignored, c));
    QTest::keyClick(ignored, Qt::Key_Delete, Qt::ShiftModifier);
    QCOMPARE(ListTexts(Results()), (QStringList{QStringLiteral("Five A"), QStringLiteral("Five B"),
                                                QStringLiteral("Six C")}));
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QStringLiteral("1"));
    QVERIFY(vtr::testsupport::ReadFileBytes(storeFile).find(
                "\"CountIgnoreMsgNum\"=dword:00000001") != std::string::npos);

    // D, ignored twice over, stays ignored until both entries are gone.
    window_->StopIgnoringResult(d);
    QCOMPARE(ListTexts(ignored), (QStringList{QStringLiteral("Seven D")}));
    window_->StopIgnoringMessageNumber(d);
    QVERIFY(ListTexts(ignored).isEmpty());
    QCOMPARE(ListTexts(Results()),
             (QStringList{QStringLiteral("Five A"), QStringLiteral("Five B"),
                          QStringLiteral("Six C"), QStringLiteral("Seven D")}));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("3"));
    QVERIFY(dialogs_->boxes.isEmpty());
    Q_UNUSED(a);
}

// Where a link of a text browser is shown, in its viewport: the occurrence of its text whose
// target is href.
QPoint LinkPosition(QTextBrowser* browser, const QString& text, const QString& href) {
    QTextCursor found(browser->document());
    while (!(found = browser->document()->find(text, found)).isNull()) {
        QTextCursor inside(browser->document());
        inside.setPosition(found.selectionStart() + 2);
        if (inside.charFormat().anchorHref() == href)
            return browser->cursorRect(inside).center();
    }
    return {-1, -1};
}

void FrmVerifierTest::detailsPaneShowsTheSelectedResultWhole() {
    fs::create_directories(DataFolder() + "/sequences");
    vtr::testsupport::WriteFileBytes(DataFolder() + "/sequences/Glow.las", "");
    const QString data = QDir::toNativeSeparators(QString::fromStdString(DataFolder()));
    const QString sequences = data + QDir::separator() + QStringLiteral("sequences");
    const std::string show = DataFolder() + "/Show0.lss";  // missing, in a folder that is there
    const std::string glow = DataFolder() + "/sequences/Glow.las";
    const std::string elsewhere = folder_->File("no such folder") + "/Gone.las";
    const ResultPtr conflict =
        LibVerify::AddResult(Severity::Warning, "Channel conflict", 43, 43,
                             {"[SHOW]: " + show, "[SECTION]: Background", "[SEQUENCE]: " + glow,
                              "[APPLICATION]: " + AppFolder(), "[FILE]: " + elsewhere});
    const ResultPtr bare = LibVerify::AddResult(Severity::Error, "Bare", 3, 3);
    auto* tabs = Find<QTabWidget>("sstDetails");
    auto* pane = Find<QFrame>("frameResultDetails");
    // The log tab has no result to show.
    QVERIFY(!pane->isVisible());
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    QVERIFY(pane->isVisible());
    QTRY_VERIFY(Find<QLabel>("lblResultHelp")->height() > 0);  // laid out
    QCOMPARE(Find<QLabel>("lblResultKind")->text(),
             QStringLiteral("Select a result to see it whole here."));
    QVERIFY(!Find<QPushButton>("cmdCopyResult")->isEnabled());

    // A click on a result shows it whole.
    QTest::mouseClick(Results()->viewport(), Qt::LeftButton, {},
                      OnItem(Results(), ItemOf(Results(), conflict)));
    QCOMPARE(Find<QLabel>("lblResultSummary")->text(), QStringLiteral("Channel conflict"));
    QCOMPARE(Find<QLabel>("lblResultKind")->text(), QStringLiteral("Warning, message number 43"));
    auto* details = Find<QTextBrowser>("txtResultDetails");
    const QString link = QStringLiteral("Open containing folder");
    const QString links = QStringLiteral("   ") + link;
    QCOMPARE(details->toPlainText().split(QLatin1Char('\n')),
             (QStringList{QString::fromStdString("[SHOW]: " + show) + links,
                          QStringLiteral("[SECTION]: Background"),
                          QString::fromStdString("[SEQUENCE]: " + glow) + links,
                          QString::fromStdString("[APPLICATION]: " + AppFolder()) + links,
                          QString::fromStdString("[FILE]: " + elsewhere)}));
    QVERIFY(details->textInteractionFlags() & Qt::TextSelectableByMouse);

    // "Open containing folder" beside the sequence: the folder that holds it; beside the
    // application folder: that folder.
    QTest::mouseClick(details->viewport(), Qt::LeftButton, {},
                      LinkPosition(details, link, QStringLiteral("folder:2")));
    QTest::mouseClick(details->viewport(), Qt::LeftButton, {},
                      LinkPosition(details, link, QStringLiteral("folder:3")));
    QTest::mouseClick(details->viewport(), Qt::LeftButton, {},
                      LinkPosition(details, link, QStringLiteral("folder:0")));
    QCOMPARE(
        dialogs_->foldersOpened,
        (QStringList{sequences,
                     QDir::toNativeSeparators(QDir::cleanPath(QString::fromStdString(AppFolder()))),
                     data}));
    // A folder the desktop cannot show: a message box says so.
    dialogs_->folderOpens = false;
    QTest::mouseClick(details->viewport(), Qt::LeftButton, {},
                      LinkPosition(details, link, QStringLiteral("folder:2")));
    QCOMPARE(
        dialogs_->boxes,
        (QList<RecordingPresenter::Box>{{QStringLiteral("Error Opening Folder"),
                                         QStringLiteral("Cannot open the folder ") + sequences}}));
    dialogs_->boxes.clear();

    // Copy: the whole result as text, as the report has it.
    QApplication::clipboard()->clear();
    QTest::mouseClick(Find<QPushButton>("cmdCopyResult"), Qt::LeftButton);
    const QString expected = QString::fromStdString(
        "Message Number: 43\nSeverity: Warning\nDescription: Channel conflict\n"
        "Detail #1: [SHOW]: " +
        show +
        "\nDetail #2: [SECTION]: Background\n"
        "Detail #3: [SEQUENCE]: " +
        glow + "\nDetail #4: [APPLICATION]: " + AppFolder() + "\nDetail #5: [FILE]: " + elsewhere +
        "\n");
    QCOMPARE(QApplication::clipboard()->text(), expected);
    // Ctrl+C in the list copies the selected result too.
    QApplication::clipboard()->clear();
    Results()->setFocus();
    QTest::keyClick(Results(), Qt::Key_C, Qt::ControlModifier);
    QCOMPARE(QApplication::clipboard()->text(), expected);

    // The help link: the result's topic (here the help file is missing, so its error).
    auto* help = Find<QLabel>("lblResultHelp");
    QTest::mouseClick(help, Qt::LeftButton, {}, QPoint(8, help->height() / 2));
    QCOMPARE(dialogs_->boxes.size(), 1);
    QCOMPARE(dialogs_->boxes[0].title, QStringLiteral("Help Context Error"));

    // A result without details; then an ignored one says why it is ignored.
    QTest::keyClick(Results(), Qt::Key_Down);
    QCOMPARE(Find<QLabel>("lblResultSummary")->text(), QStringLiteral("Bare"));
    QCOMPARE(details->toPlainText(), QStringLiteral("This result has no details."));
    QApplication::clipboard()->clear();
    QTest::mouseClick(Find<QPushButton>("cmdCopyResult"), Qt::LeftButton);
    QCOMPARE(QApplication::clipboard()->text(),
             QStringLiteral("Message Number: 3\nSeverity: Error\nDescription: Bare\n"));
    window_->IgnoreMessageNumber(conflict);
    window_->IgnoreResult(conflict);
    tabs->setCurrentIndex(frmVerifier::IgnoredResultsTab);
    QTest::mouseClick(Ignored()->viewport(), Qt::LeftButton, {},
                      OnItem(Ignored(), ItemOf(Ignored(), conflict)));
    QCOMPARE(Find<QLabel>("lblResultKind")->text(),
             QStringLiteral("Warning, message number 43 (ignored: this result, and all results "
                            "with message number 43)"));
    window_->StopIgnoringResult(conflict);
    QCOMPARE(Find<QLabel>("lblResultKind")->text(),
             QStringLiteral("Warning, message number 43 (ignored: all results with message "
                            "number 43)"));
}

FrmVerifierTest::Mix FrmVerifierTest::AddMix() {
    auto conflict = [](const char* first, const char* firstSequence, const char* second,
                       const char* secondSequence, const char* channel) {
        return std::vector<std::string>{"[SHOW]: /d/Show0.lss",
                                        std::string("[SECTION]: ") + first,
                                        std::string("[SEQUENCE]: ") + firstSequence,
                                        "[TRACK]: Track 1: T",
                                        std::string("[CHANNEL]: ") + channel,
                                        std::string("[SECTION]: ") + second,
                                        std::string("[SEQUENCE]: ") + secondSequence,
                                        "[TRACK]: Track 1: T",
                                        std::string("[CHANNEL]: ") + channel};
    };
    Mix mix;
    mix.conflict = LibVerify::AddResult(
        Severity::Warning, "Channel conflict", 43, 43,
        conflict("Animation", "/d/A.las", "Background", "/d/Glow.las", "Channel 1"));
    mix.missingSequence =
        LibVerify::AddResult(Severity::Error, "Sequence file does not exist", 23, 23,
                             {"[SEQUENCE]: /d/Gone.lms", "[SHOW]: show /d/Show0.lss"});
    // The same two sequences, the check walking from the other side.
    mix.conflictBack = LibVerify::AddResult(
        Severity::Warning, "Channel conflict", 43, 43,
        conflict("Background", "/d/Glow.las", "Animation", "/d/A.las", "Channel 2"));
    mix.noMedia = LibVerify::AddResult(Severity::Info, "Sequence uses no media file", 60, 60,
                                       {"[SEQUENCE]: /d/A.las"});
    mix.inside = LibVerify::AddResult(
        Severity::Warning, "Conflicting channel settings in sequence", 27, 27,
        {"[SEQUENCE]: /d/A.las", "[TRACK]: Track 2: U", "[CHANNEL]: Channel 3"});
    mix.intensity =
        LibVerify::AddResult(Severity::Warning, "Intensity file conflict", 49, 47,
                             conflict("Animation", "/d/A.las", "Musical", "/d/B.lms", "Channel 4"));
    mix.missingShow =
        LibVerify::AddResult(Severity::Error, "Show file does not exist", 21, 21, {"/d/Show1.lss"});
    return mix;
}

// Picks a grouping as a user does: the combo box, from the keyboard.
void FrmVerifierTest::ChooseGroupBy(const QString& grouping) {
    auto* box = Find<QComboBox>("cboGroupBy");
    box->setFocus();
    const int wanted = box->findText(grouping);
    QVERIFY(wanted >= 0);
    while (box->currentIndex() < wanted)
        QTest::keyClick(box, Qt::Key_Down);
    while (box->currentIndex() > wanted)
        QTest::keyClick(box, Qt::Key_Up);
    QCOMPARE(box->currentText(), grouping);
}

// Types a filter (replacing the one there) and applies it with Enter.
void FrmVerifierTest::Filter(const QString& text) {
    auto* box = Find<QLineEdit>("txtFilter");
    box->setFocus();
    QTest::keyClick(box, Qt::Key_A, Qt::ControlModifier);
    QTest::keyClick(box, Qt::Key_Backspace);
    QTest::keyClicks(box, text);
    QTest::keyClick(box, Qt::Key_Return);
}

QStringList ChildTexts(const QTreeView* list, int group) {
    QStringList texts;
    const QAbstractItemModel* model = list->model();
    const QModelIndex parent = model->index(group, 0);
    for (int i = 0; i < model->rowCount(parent); ++i)
        texts.append(model->index(i, 0, parent).data().toString());
    return texts;
}

// A click on a group's expander.
void ClickExpander(QTreeView* list, int group) {
    const QRect rect = list->visualRect(list->model()->index(group, 0));
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {},
                      QPoint(rect.left() - list->indentation() / 2, rect.center().y()));
}

void FrmVerifierTest::filterFindsTextAndSeverities() {
    const Mix mix = AddMix();
    auto* tabs = Find<QTabWidget>("sstDetails");
    QCOMPARE(tabs->currentIndex(), int(frmVerifier::OutputLogTab));
    QCOMPARE(Shown(), QStringLiteral("7 of 7 shown"));

    // Text in the details, whatever its letter case; looking for it turns to the results.
    Filter(QStringLiteral("glow.LAS"));
    QCOMPARE(tabs->currentIndex(), int(frmVerifier::ResultsTab));
    QCOMPARE(ListTexts(Results()),
             (QStringList{QStringLiteral("Channel conflict"), QStringLiteral("Channel conflict")}));
    QCOMPARE(Shown(), QStringLiteral("2 of 7 shown"));
    // The counters count what was found, not what is shown.
    QCOMPARE(Find<QLabel>("lblErrorsCount")->text(), QStringLiteral("2"));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("4"));

    // Text in the description; applied once typing pauses, without Enter.
    auto* box = Find<QLineEdit>("txtFilter");
    QTest::keyClick(box, Qt::Key_A, Qt::ControlModifier);
    QTest::keyClicks(box, QStringLiteral("does not"));
    QTRY_COMPARE(ListTexts(Results()), (QStringList{QStringLiteral("Sequence file does not exist"),
                                                    QStringLiteral("Show file does not exist")}));
    QCOMPARE(Shown(), QStringLiteral("2 of 7 shown"));

    // The severities, by their toggles.
    Filter(QString());
    QCOMPARE(Shown(), QStringLiteral("7 of 7 shown"));
    QTest::mouseClick(Find<QToolButton>("chkShowWarnings"), Qt::LeftButton);
    QCOMPARE(ListTexts(Results()), (QStringList{QStringLiteral("Sequence file does not exist"),
                                                QStringLiteral("Sequence uses no media file"),
                                                QStringLiteral("Show file does not exist")}));
    QCOMPARE(Shown(), QStringLiteral("3 of 7 shown"));
    QTest::mouseClick(Find<QToolButton>("chkShowErrors"), Qt::LeftButton);
    QCOMPARE(ListTexts(Results()), (QStringList{QStringLiteral("Sequence uses no media file")}));
    // Text and severity together.
    QTest::mouseClick(Find<QToolButton>("chkShowWarnings"), Qt::LeftButton);
    Filter(QStringLiteral("A.las"));
    QCOMPARE(ListTexts(Results()),
             (QStringList{QStringLiteral("Channel conflict"), QStringLiteral("Channel conflict"),
                          QStringLiteral("Sequence uses no media file"),
                          QStringLiteral("Conflicting channel settings in sequence"),
                          QStringLiteral("Intensity file conflict")}));
    QTest::mouseClick(Find<QToolButton>("chkShowErrors"), Qt::LeftButton);
    Filter(QString());

    // The ignored list is filtered alike, and the count follows the list on view.
    window_->IgnoreResult(mix.noMedia);
    QCOMPARE(Shown(), QStringLiteral("6 of 6 shown"));
    tabs->setCurrentIndex(frmVerifier::IgnoredResultsTab);
    QCOMPARE(Shown(), QStringLiteral("1 of 1 shown"));
    QTest::mouseClick(Find<QToolButton>("chkShowInfo"), Qt::LeftButton);
    QCOMPARE(Shown(), QStringLiteral("0 of 1 shown"));
    QCOMPARE(RowCount(Ignored()), 0);
    // Stopping to ignore a result hidden from the Results list: it is back, still hidden.
    window_->StopIgnoringResult(mix.noMedia);
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    QCOMPARE(Shown(), QStringLiteral("6 of 7 shown"));
    QVERIFY(!ListTexts(Results()).contains(QStringLiteral("Sequence uses no media file")));
}

void FrmVerifierTest::errorsFirstAndBackToTheOrderFound() {
    const Mix mix = AddMix();
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    const QStringList found{QStringLiteral("Channel conflict"),
                            QStringLiteral("Sequence file does not exist"),
                            QStringLiteral("Channel conflict"),
                            QStringLiteral("Sequence uses no media file"),
                            QStringLiteral("Conflicting channel settings in sequence"),
                            QStringLiteral("Intensity file conflict"),
                            QStringLiteral("Show file does not exist")};
    const QStringList errorsFirst{QStringLiteral("Sequence file does not exist"),
                                  QStringLiteral("Show file does not exist"),
                                  QStringLiteral("Channel conflict"),
                                  QStringLiteral("Channel conflict"),
                                  QStringLiteral("Conflicting channel settings in sequence"),
                                  QStringLiteral("Intensity file conflict"),
                                  QStringLiteral("Sequence uses no media file")};
    QCOMPARE(ListTexts(Results()), found);
    // One click: errors, then warnings, then information, each in the order found.
    auto* button = Find<QToolButton>("chkErrorsFirst");
    QTest::mouseClick(button, Qt::LeftButton);
    QVERIFY(button->isChecked());
    QCOMPARE(ListTexts(Results()), errorsFirst);
    QCOMPARE(ItemOf(Results(), mix.conflictBack).row(), 3);
    // A result found later takes its place.
    LibVerify::AddResult(Severity::Error, "Late error", 22, 22, {"/d/Late.lss"});
    QCOMPARE(ListTexts(Results()).indexOf(QStringLiteral("Late error")), 2);
    // The key: back to the order found.
    QTest::keyClick(window_.get(), Qt::Key_E, Qt::ControlModifier);
    QTRY_VERIFY(!button->isChecked());
    QCOMPARE(ListTexts(Results()), found + QStringList{QStringLiteral("Late error")});

    // A column's order replaces errors first; a third click on its header goes back to the
    // order found.
    QTest::mouseClick(button, Qt::LeftButton);
    QTreeView* list = Results();
    const int msgNumX = list->header()->sectionViewportPosition(frmVerifier::MsgNumColumn) + 5;
    QTest::mouseClick(list->header()->viewport(), Qt::LeftButton, {}, QPoint(msgNumX, 5));
    QVERIFY(!button->isChecked());
    QCOMPARE(ListTexts(list, frmVerifier::MsgNumColumn),
             (QStringList{QStringLiteral("21"), QStringLiteral("22"), QStringLiteral("23"),
                          QStringLiteral("27"), QStringLiteral("43"), QStringLiteral("43"),
                          QStringLiteral("47"), QStringLiteral("60")}));
    QTest::mouseClick(list->header()->viewport(), Qt::LeftButton, {}, QPoint(msgNumX, 5));
    QCOMPARE(ListTexts(list, frmVerifier::MsgNumColumn).constFirst(), QStringLiteral("60"));
    QTest::mouseClick(list->header()->viewport(), Qt::LeftButton, {}, QPoint(msgNumX, 5));
    QCOMPARE(list->header()->sortIndicatorSection(), -1);
    QCOMPARE(ListTexts(Results()), found + QStringList{QStringLiteral("Late error")});
    // Errors first again clears the column's order.
    QTest::mouseClick(list->header()->viewport(), Qt::LeftButton, {}, QPoint(msgNumX, 5));
    QTest::mouseClick(button, Qt::LeftButton);
    QCOMPARE(list->header()->sortIndicatorSection(), -1);
    QCOMPARE(
        ListTexts(Results()).mid(0, 3),
        (QStringList{QStringLiteral("Sequence file does not exist"),
                     QStringLiteral("Show file does not exist"), QStringLiteral("Late error")}));
}

void FrmVerifierTest::groupsCarryTheirCounts() {
    const Mix mix = AddMix();
    auto* tabs = Find<QTabWidget>("sstDetails");
    tabs->setCurrentIndex(frmVerifier::ResultsTab);
    QTreeView* list = Results();

    ChooseGroupBy(QStringLiteral("Message"));
    QCOMPARE(
        ListTexts(list),
        (QStringList{QStringLiteral("Message 43: Channel conflict (2)"),
                     QStringLiteral("Message 23: Sequence file does not exist (1)"),
                     QStringLiteral("Message 60: Sequence uses no media file (1)"),
                     QStringLiteral("Message 27: Conflicting channel settings in sequence (1)"),
                     QStringLiteral("Message 47: Intensity file conflict (1)"),
                     QStringLiteral("Message 21: Show file does not exist (1)")}));
    QCOMPARE(Shown(), QStringLiteral("7 of 7 shown"));
    // A group's row, selected, is told in the details pane.
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, OnItem(list, Row(list, 0)));
    QCOMPARE(Find<QLabel>("lblResultSummary")->text(),
             QStringLiteral("Message 43: Channel conflict"));
    QCOMPARE(Find<QLabel>("lblResultKind")->text(), QStringLiteral("2 warnings"));
    QVERIFY(!Find<QPushButton>("cmdCopyResult")->isEnabled());
    // A group's row spans the list; it opens into its results.
    QVERIFY(list->isFirstColumnSpanned(0, QModelIndex()));
    QVERIFY(!list->isExpanded(Row(list, 0)));
    ClickExpander(list, 0);
    QVERIFY(list->isExpanded(Row(list, 0)));
    QCOMPARE(ChildTexts(list, 0),
             (QStringList{QStringLiteral("Channel conflict"), QStringLiteral("Channel conflict")}));
    QCOMPARE(ItemOf(list, mix.conflictBack).parent().row(), 0);

    // By sequence pair: the conflicts between the same two sequences are one group whichever
    // side the check began with; a conflict inside one sequence goes under that sequence.
    ChooseGroupBy(QStringLiteral("Sequence pair"));
    const QString glowPair =
        QStringLiteral("A.las (Animation) and Glow.las (Background), show Show0.lss");
    QCOMPARE(ListTexts(list),
             (QStringList{glowPair + QStringLiteral(" (2)"), QStringLiteral("Inside A.las (1)"),
                          QStringLiteral("A.las (Animation) and B.lms (Musical), show Show0.lss "
                                         "(1)"),
                          QStringLiteral("Other results (3)")}));
    QCOMPARE(ChildTexts(list, 3), (QStringList{QStringLiteral("Sequence file does not exist"),
                                               QStringLiteral("Sequence uses no media file"),
                                               QStringLiteral("Show file does not exist")}));

    // Ignoring from inside a group: the result pointed at; the group's count follows, and
    // the next row is selected.
    ClickExpander(list, 0);
    QCOMPARE(ChildTexts(list, 0).size(), 2);
    auto* menu = Find<QMenu>("mnuResultPopup");
    RightClick(list, ItemOf(list, mix.conflictBack));
    QTRY_VERIFY(menu->isVisible());
    ClickMenuEntry(menu, QStringLiteral("Ignore this result"));
    QTRY_VERIFY(!menu->isVisible());
    QCOMPARE(ListTexts(list).constFirst(), glowPair + QStringLiteral(" (1)"));
    QCOMPARE(frmVerifier::ResultOf(list->currentIndex()), mix.conflict);
    QCOMPARE(ListTexts(Ignored()), (QStringList{glowPair + QStringLiteral(" (1)")}));
    QCOMPARE(Find<QLabel>("lblWarningsCount")->text(), QStringLiteral("3"));
    // A group's row has no result to act on: no menu.
    RightClick(list, Row(list, 1));
    QTest::qWait(50);
    QVERIFY(!menu->isVisible());

    // An opened group stays open, and the selected result selected, while the filter and
    // the order change.
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {},
                      OnItem(list, ItemOf(list, mix.conflict)));
    QVERIFY(list->isExpanded(Row(list, 0)));
    Filter(QStringLiteral("channel"));
    QCOMPARE(ListTexts(list),
             (QStringList{glowPair + QStringLiteral(" (1)"), QStringLiteral("Inside A.las (1)"),
                          QStringLiteral("A.las (Animation) and B.lms (Musical), "
                                         "show Show0.lss (1)")}));
    QVERIFY(list->isExpanded(Row(list, 0)));
    QCOMPARE(frmVerifier::ResultOf(list->currentIndex()), mix.conflict);
    Filter(QString());

    // Errors first puts the groups holding errors first.
    QTest::mouseClick(Find<QToolButton>("chkErrorsFirst"), Qt::LeftButton);
    QCOMPARE(ListTexts(list).constFirst(), QStringLiteral("Other results (3)"));
    QCOMPARE(ChildTexts(list, 0), (QStringList{QStringLiteral("Sequence file does not exist"),
                                               QStringLiteral("Show file does not exist"),
                                               QStringLiteral("Sequence uses no media file")}));
    QTest::mouseClick(Find<QToolButton>("chkErrorsFirst"), Qt::LeftButton);

    // By show: a missing sequence goes under the show that names it.
    ChooseGroupBy(QStringLiteral("Show"));
    QCOMPARE(ListTexts(list),
             (QStringList{QStringLiteral("/d/Show0.lss (3)"), QStringLiteral("/d/Show1.lss (1)"),
                          QStringLiteral("Other results (2)")}));
    // And back: one row per result, in the order found, the selection kept.
    ChooseGroupBy(QStringLiteral("None"));
    QCOMPARE(ListTexts(list),
             (QStringList{QStringLiteral("Channel conflict"),
                          QStringLiteral("Sequence file does not exist"),
                          QStringLiteral("Sequence uses no media file"),
                          QStringLiteral("Conflicting channel settings in sequence"),
                          QStringLiteral("Intensity file conflict"),
                          QStringLiteral("Show file does not exist")}));
    QCOMPARE(frmVerifier::ResultOf(list->currentIndex()), mix.conflict);
    QVERIFY(!list->isFirstColumnSpanned(0, QModelIndex()));
    QVERIFY(dialogs_->boxes.isEmpty());
}

void FrmVerifierTest::groupingFollowsARun() {
    // Grouped before the run: the results of the run arrive in their groups.
    ChooseGroupBy(QStringLiteral("Message"));
    Find<QRadioButton>("optTargetShow")->setChecked(true);
    Find<QLineEdit>("txtTargetShow")->setText(QString::fromStdString(folder_->File("Gone.lss")));
    Click("cmdVerify");
    QTreeView* list = Results();
    QVERIFY(RowCount(list) > 1);
    int members = 0;
    for (int group = 0; group < RowCount(list); ++group) {
        const int count = list->model()->rowCount(Row(list, group));
        members += count;
        QVERIFY(Text(Row(list, group), 0).endsWith(QStringLiteral(" (%1)").arg(count)));
    }
    QCOMPARE(members, int(LibVerify::GetResults().size()));
    QVERIFY(ListTexts(list).contains(QStringLiteral("Message 21: Show file does not exist (1)")));
    QCOMPARE(Shown(), QStringLiteral("%1 of %1 shown").arg(members));
}

void FrmVerifierTest::detailColumnsShowFileNames() {
    const std::string path =
        "/a/long/folder/of/the/installation/with/many/parts/sequences/Background Glow.las";
    const ResultPtr result = LibVerify::AddResult(Severity::Warning, "Channel is missing settings",
                                                  30, 30, {"[SEQUENCE]: " + path});
    Find<QTabWidget>("sstDetails")->setCurrentIndex(frmVerifier::ResultsTab);
    QTreeView* list = Results();
    // Wide columns that keep a path's ends, its file name among them, and tell the rest in
    // the tool tip.
    const QModelIndex detail = ItemOf(list, result).siblingAtColumn(frmVerifier::Details1Column);
    for (int column = frmVerifier::Details1Column; column < frmVerifier::Details1Column + 9;
         ++column) {
        QVERIFY(list->columnWidth(column) >= 380);
        auto* delegate =
            qobject_cast<vtr::MiddleElidingDelegate*>(list->itemDelegateForColumn(column));
        QVERIFY(delegate != nullptr);
        QStyleOptionViewItem option;
        delegate->initStyleOption(&option, detail);
        QCOMPARE(option.textElideMode, Qt::ElideMiddle);
    }
    // A description is cut at its end, as text is.
    QCOMPARE(list->textElideMode(), Qt::ElideRight);
    QCOMPARE(detail.data(Qt::ToolTipRole).toString(),
             QString::fromStdString("[SEQUENCE]: " + path));
    QCOMPARE(ItemOf(list, result).data(Qt::ToolTipRole).toString(),
             QString::fromStdString("Channel is missing settings\n[SEQUENCE]: " + path));
    // Reached from the keyboard, the list's first result is the selected one, shown whole.
    QTest::keyClick(window_.get(), Qt::Key_G, Qt::AltModifier);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
    QCOMPARE(QApplication::focusWidget(), static_cast<QWidget*>(list));
    QVERIFY(list->selectionModel()->isRowSelected(0, QModelIndex()));
    QCOMPARE(Find<QTextBrowser>("txtResultDetails")->toPlainText(),
             QString::fromStdString("[SEQUENCE]: " + path));
}

VTR_UI_TEST_MAIN(FrmVerifierTest)
#include "tst_frmVerifier.moc"
