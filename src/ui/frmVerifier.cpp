#include "frmVerifier.h"

#include <QAction>
#include <QApplication>
#include <QClipboard>
#include <QCloseEvent>
#include <QComboBox>
#include <QCursor>
#include <QDir>
#include <QDragEnterEvent>
#include <QDropEvent>
#include <QFileInfo>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QMenu>
#include <QMimeData>
#include <QPlainTextEdit>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QScrollBar>
#include <QSettings>
#include <QShortcut>
#include <QSplitter>
#include <QStyle>
#include <QTabWidget>
#include <QTextBlock>
#include <QTimer>
#include <QToolButton>
#include <QVBoxLayout>
#include <algorithm>
#include <exception>

#include "ResultDetailsPane.h"
#include "ResultsModel.h"
#include "ResultsView.h"
#include "UiText.h"
#include "engine/IgnoreLists.h"
#include "engine/LibVerify.h"
#include "engine/OutputLog.h"
#include "engine/ResultsReport.h"
#include "engine/ScopedMousePointer.h"
#include "engine/VtrError.h"
#include "environment/VTRCommon.h"
#include "report/HtmlReport.h"

namespace vtr {
namespace {

constexpr const char* kCaption = "Vantori Verifier";
constexpr const char* kSource = "frmVerifier";
constexpr const char* kHelpFileName = "VTRHelp.chm";

// Message box titles.
const QString kVerifierError = QStringLiteral("Verifier Error");
const QString kErrorSelectingSequence = QStringLiteral("Error Selecting Sequence");
const QString kErrorSelectingShow = QStringLiteral("Error Selecting Show");
const QString kErrorSavingMessages = QStringLiteral("Error Saving Verifier Messages");
const QString kHelpContextError = QStringLiteral("Help Context Error");
const QString kHelpFileError = QStringLiteral("Help File Error");
const QString kDoubleClickError = QStringLiteral("Details List Double Click Error");
const QString kIgnoreListError = QStringLiteral("Ignore List Error");
const QString kOpenFolderError = QStringLiteral("Error Opening Folder");

// Settings of the window's own file.
const QString kGeometryKey = QStringLiteral("window/geometry");
const QString kTargetKindKey = QStringLiteral("target/kind");
const QString kTargetSequenceKey = QStringLiteral("target/sequence");
const QString kTargetShowKey = QStringLiteral("target/show");

// The progress bar's text while a run goes and after it completed.
const QString kProgressFormat = QStringLiteral("%v of %m checks");

// What a file is as a target, by its extension.
enum class TargetKind { None, Sequence, Show };

TargetKind KindOfFile(const QString& path) {
    const QString suffix = QFileInfo(path).suffix().toLower();
    if (suffix == QLatin1String("lss"))
        return TargetKind::Show;
    if (suffix == QLatin1String("las") || suffix == QLatin1String("lms"))
        return TargetKind::Sequence;
    return TargetKind::None;
}

// A target file as the window verifies and remembers it: absolute, relative names taken from
// the working folder, "." and ".." resolved, in the system's own notation. The results name
// the file this way, and so does the key that ignores one of them, wherever the window is
// opened next. Away from Windows, a name typed from the home folder ("~/shows/Evening.lss")
// is taken from there, as the shell would. Empty stays empty.
QString AbsoluteTarget(const QString& path) {
    QString name = QDir::fromNativeSeparators(path.trimmed());
    if (name.isEmpty())
        return name;
#ifndef Q_OS_WIN
    if (name == QLatin1String("~") || name.startsWith(QLatin1String("~/")))
        name = QDir::homePath() + name.mid(1);
#endif
    return QDir::toNativeSeparators(QDir::cleanPath(QDir::current().absoluteFilePath(name)));
}

// Whether two queries show a listing alike: the same filter, order and grouping.
bool SameView(const ResultQuery& a, const ResultQuery& b) {
    return a.filter.text == b.filter.text && a.filter.errors == b.filter.errors &&
           a.filter.warnings == b.filter.warnings && a.filter.info == b.filter.info &&
           a.order == b.order && a.groupBy == b.groupBy;
}

// The screen's pointer as the core's ScopedMousePointer sees it: a number. The window
// shows it as the application's override cursor.
int16_t g_pointer = MousePointer::Default;

Qt::CursorShape CursorShapeOf(int16_t pointer) {
    switch (pointer) {
        case 2:
            return Qt::CrossCursor;
        case 3:
            return Qt::IBeamCursor;
        case MousePointer::Hourglass:
            return Qt::WaitCursor;
        case 12:
            return Qt::ForbiddenCursor;
        case 13:
            return Qt::BusyCursor;
        case 14:
            return Qt::WhatsThisCursor;
        case 15:
            return Qt::SizeAllCursor;
        default:
            return Qt::ArrowCursor;
    }
}

void SetScreenPointer(int16_t pointer) {
    if (g_pointer != MousePointer::Default)
        QApplication::restoreOverrideCursor();
    if (pointer != MousePointer::Default)
        QApplication::setOverrideCursor(QCursor(CursorShapeOf(pointer)));
    g_pointer = pointer;
}

QString DefaultSettingsFile() {
    return QSettings(QSettings::IniFormat, QSettings::UserScope, QStringLiteral("Vantori"),
                     QStringLiteral("vantori-verifier"))
        .fileName();
}

}  // namespace

// --- Severity images -----------------------------------------------------------------------

SeverityImageList::SeverityImageList(QWidget* owner) : QObject(owner) {
    setObjectName(QStringLiteral("imlSeverity"));
    QStyle* style = owner->style();
    images_.insert(QStringLiteral("Info"), style->standardIcon(QStyle::SP_MessageBoxInformation));
    images_.insert(QStringLiteral("Warning"), style->standardIcon(QStyle::SP_MessageBoxWarning));
    images_.insert(QStringLiteral("Error"), style->standardIcon(QStyle::SP_MessageBoxCritical));
}

// --- Loading -------------------------------------------------------------------------------

frmVerifier::frmVerifier(QWidget* parent) : frmVerifier(Options{}, parent) {}

frmVerifier::frmVerifier(Options options, QWidget* parent)
    : QMainWindow(parent),
      dialogs_(std::move(options.dialogs)),
      help_(std::move(options.help)),
      settingsFile_(options.settingsFile) {
    setObjectName(QStringLiteral("frmVerifier"));
    if (!dialogs_)
        dialogs_ = std::make_shared<QtDialogPresenter>();
    if (!help_)
        help_ = CreateHelpProvider(this);
    if (settingsFile_.isEmpty())
        settingsFile_ = DefaultSettingsFile();

    BuildControls();
    BuildMenus();
    LoadPlacement();
    SetRunning(false);

    setWindowTitle(QString::fromLatin1(kCaption));
    InstallPlatformHooks();
    LibVerify::AddNotificationClient(this);
    help_->Prepare(VTRCommon::GetAppPath() + kHelpFileName);
    // The driver's collections exist from now on, before the first run.
    LibVerify::BeginVerification();
}

frmVerifier::~frmVerifier() {
    // The lists' models read grouping_, a member that is gone before QWidget's own destructor
    // hides the lists and lays them out one last time: the lists let go of them first.
    for (ResultsView* list : lvResults_) {
        if (list) {
            const QSignalBlocker blocker(list);
            list->setModel(nullptr);
        }
    }
    LibVerify::RemoveNotificationClient(this);
    LibVerify::SetEventPump(nullptr);
    ScopedMousePointer::InstallHooks(nullptr, nullptr);
    if (g_pointer != MousePointer::Default)
        SetScreenPointer(MousePointer::Default);
}

void frmVerifier::InstallPlatformHooks() {
    // The core lets the user interface run its pending events after every check and inside
    // long ones: that is where a click on Cancel arrives while a run is going.
    LibVerify::SetEventPump([this] { PumpEvents(); });
    ScopedMousePointer::InstallHooks([] { return g_pointer; }, &SetScreenPointer);
}

void frmVerifier::PumpEvents() {
    if (!running_) {
        QCoreApplication::processEvents();
        return;
    }
    // During a run the core calls this after every check and result, thousands of times
    // on a large schedule. Input is handled every time, so a click on Cancel is seen at
    // once; what the run changes on screen changes at most every kRepaintIntervalMs (the
    // summary, the lists that are cheap to add to) or kLogIntervalMs (the log, which costs
    // the most to lay out and draw), since that costs far more than a check: in between,
    // handling events finds nothing to draw.
    if (!repaintClock_.isValid() || repaintClock_.hasExpired(kRepaintIntervalMs)) {
        repaintClock_.restart();
        if (!logClock_.isValid() || logClock_.hasExpired(kLogIntervalMs)) {
            logClock_.restart();
            FlushLog();
        }
        TakeNewResults(false);
        if (summaryPending_)
            RefreshSummary();
        lblStatus_->setText(statusText_);
    }
    QCoreApplication::processEvents();
}

void frmVerifier::BuildControls() {
    auto* central = new QWidget(this);
    setCentralWidget(central);

    // Target.
    frameTarget_ = new QGroupBox(QStringLiteral("Target"), central);
    frameTarget_->setObjectName(QStringLiteral("frameTarget"));
    optTargetSequence_ = new QRadioButton(QStringLiteral("Verify a Single Sequence"), frameTarget_);
    optTargetSequence_->setObjectName(QStringLiteral("optTargetSequence"));
    txtTargetSequence_ = new QLineEdit(frameTarget_);
    txtTargetSequence_->setObjectName(QStringLiteral("txtTargetSequence"));
    txtTargetSequence_->setAccessibleName(QStringLiteral("Sequence file"));
    cmdTargetSequence_ = new QPushButton(QStringLiteral("..."), frameTarget_);
    cmdTargetSequence_->setObjectName(QStringLiteral("cmdTargetSequence"));
    cmdTargetSequence_->setAccessibleName(QStringLiteral("Choose Target Sequence"));
    cmdTargetSequence_->setToolTip(QStringLiteral("Choose the sequence file (Ctrl+O)"));
    optTargetShow_ = new QRadioButton(QStringLiteral("Verify a Single Show"), frameTarget_);
    optTargetShow_->setObjectName(QStringLiteral("optTargetShow"));
    txtTargetShow_ = new QLineEdit(frameTarget_);
    txtTargetShow_->setObjectName(QStringLiteral("txtTargetShow"));
    txtTargetShow_->setAccessibleName(QStringLiteral("Show file"));
    cmdTargetShow_ = new QPushButton(QStringLiteral("..."), frameTarget_);
    cmdTargetShow_->setObjectName(QStringLiteral("cmdTargetShow"));
    cmdTargetShow_->setAccessibleName(QStringLiteral("Choose Target Show"));
    cmdTargetShow_->setToolTip(QStringLiteral("Choose the show file (Ctrl+O)"));
    optTargetSchedule_ = new QRadioButton(QStringLiteral("Verify Entire Schedule"), frameTarget_);
    optTargetSchedule_->setObjectName(QStringLiteral("optTargetSchedule"));
    optTargetSchedule_->setChecked(true);
    for (QPushButton* button : {cmdTargetSequence_, cmdTargetShow_})
        button->setFixedWidth(button->fontMetrics().horizontalAdvance(QStringLiteral("....")) + 24);

    auto* targetLayout = new QGridLayout(frameTarget_);
    targetLayout->addWidget(optTargetSequence_, 0, 0);
    targetLayout->addWidget(txtTargetSequence_, 0, 1);
    targetLayout->addWidget(cmdTargetSequence_, 0, 2);
    targetLayout->addWidget(optTargetShow_, 1, 0);
    targetLayout->addWidget(txtTargetShow_, 1, 1);
    targetLayout->addWidget(cmdTargetShow_, 1, 2);
    targetLayout->addWidget(optTargetSchedule_, 2, 0, 1, 3);
    targetLayout->setColumnStretch(1, 1);

    // Typing a file name, or choosing one, picks its option.
    connect(txtTargetSequence_, &QLineEdit::textEdited, optTargetSequence_,
            [this] { optTargetSequence_->setChecked(true); });
    connect(txtTargetShow_, &QLineEdit::textEdited, optTargetShow_,
            [this] { optTargetShow_->setChecked(true); });
    connect(cmdTargetSequence_, &QPushButton::clicked, this, &frmVerifier::ChooseTargetSequence);
    connect(cmdTargetShow_, &QPushButton::clicked, this, &frmVerifier::ChooseTargetShow);

    // Details.
    sstDetails_ = new QTabWidget(central);
    sstDetails_->setObjectName(QStringLiteral("sstDetails"));
    rtxOutputLog_ = new QPlainTextEdit(sstDetails_);
    rtxOutputLog_->setObjectName(QStringLiteral("rtxOutputLog"));
    rtxOutputLog_->setReadOnly(true);
    rtxOutputLog_->setLineWrapMode(QPlainTextEdit::NoWrap);
    rtxOutputLog_->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOn);
    rtxOutputLog_->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOn);
    rtxOutputLog_->setUndoRedoEnabled(false);
    rtxOutputLog_->setTextInteractionFlags(Qt::TextSelectableByMouse |
                                           Qt::TextSelectableByKeyboard);
    // The lines' colours follow the palette: chosen again whenever it changes.
    rtxOutputLog_->installEventFilter(this);
    imlSeverity_ = new SeverityImageList(this);
    lvResults_[0] = BuildResultList(QStringLiteral("lvResults1"), Listing::NotIgnored);
    lvResults_[1] = BuildResultList(QStringLiteral("lvResults2"), Listing::Ignored);
    sstDetails_->addTab(rtxOutputLog_, QStringLiteral("Output Log"));
    sstDetails_->addTab(lvResults_[0], QStringLiteral("Results"));
    sstDetails_->addTab(lvResults_[1], QStringLiteral("Ignored Results"));

    // Summary.
    frameSummary_ = new QGroupBox(QStringLiteral("Summary"), central);
    frameSummary_->setObjectName(QStringLiteral("frameSummary"));
    auto* summaryLayout = new QGridLayout(frameSummary_);
    auto addCount = [&](const char* name, const char* caption, int row, int column) {
        auto* label = new QLabel(QString::fromLatin1(caption), frameSummary_);
        label->setObjectName(QString::fromLatin1(name));
        auto* count = new QLabel(QStringLiteral("0"), frameSummary_);
        count->setObjectName(QString::fromLatin1(name) + QStringLiteral("Count"));
        count->setMinimumWidth(count->fontMetrics().horizontalAdvance(QStringLiteral("000000")));
        count->setTextInteractionFlags(Qt::TextSelectableByMouse);
        label->setBuddy(count);
        summaryLayout->addWidget(label, row, column);
        summaryLayout->addWidget(count, row, column + 1);
        return count;
    };
    lblChecksPerformedCount_ = addCount("lblChecksPerformed", "Checks Performed:", 0, 0);
    lblChecksRemainingCount_ = addCount("lblChecksRemaining", "Checks Remaining:", 1, 0);
    lblErrorsCount_ = addCount("lblErrors", "Errors Detected:", 0, 2);
    lblWarningsCount_ = addCount("lblWarnings", "Warnings Detected:", 1, 2);
    summaryLayout->setColumnStretch(4, 1);
    summaryLayout->setColumnMinimumWidth(4, 160);
    summaryLayout->setHorizontalSpacing(12);

    // Commands.
    cmdHelp_ = new QPushButton(QStringLiteral("&Help"), central);
    cmdHelp_->setObjectName(QStringLiteral("cmdHelp"));
    cmdSave_ = new QPushButton(QStringLiteral("&Save"), central);
    cmdSave_->setObjectName(QStringLiteral("cmdSave"));
    cmdCancel_ = new QPushButton(QStringLiteral("&Cancel"), central);
    cmdCancel_->setObjectName(QStringLiteral("cmdCancel"));
    cmdVerify_ = new QPushButton(QStringLiteral("&Verify"), central);
    cmdVerify_->setObjectName(QStringLiteral("cmdVerify"));
    cmdHelp_->setToolTip(QStringLiteral("Help on the selected result (F1)"));
    cmdSave_->setToolTip(
        QStringLiteral("Save the results to a text file or an HTML report (Ctrl+S)"));
    cmdCancel_->setToolTip(QStringLiteral("Stop the verification (Esc)"));
    cmdVerify_->setToolTip(QStringLiteral("Verify the target (F5)"));
    connect(cmdHelp_, &QPushButton::clicked, this, &frmVerifier::Help);
    connect(cmdSave_, &QPushButton::clicked, this, &frmVerifier::Save);
    connect(cmdCancel_, &QPushButton::clicked, this, &frmVerifier::Cancel);
    connect(cmdVerify_, &QPushButton::clicked, this, &frmVerifier::Verify);
    auto* buttons = new QGridLayout;
    buttons->addWidget(cmdHelp_, 0, 0);
    buttons->addWidget(cmdSave_, 0, 1);
    buttons->addWidget(cmdCancel_, 1, 0);
    buttons->addWidget(cmdVerify_, 1, 1);

    auto* bottom = new QHBoxLayout;
    bottom->addWidget(frameSummary_, 1);
    bottom->addLayout(buttons);
    // The selected result whole, under the lists; the user sets the share of each.
    fraResultDetails_ = new ResultDetailsPane(central);
    auto* splitter = new QSplitter(Qt::Vertical, central);
    splitter->setObjectName(QStringLiteral("splDetails"));
    auto* lists = new QWidget(splitter);
    auto* listsLayout = new QVBoxLayout(lists);
    listsLayout->setContentsMargins(0, 0, 0, 0);
    listsLayout->setSpacing(4);
    listsLayout->addWidget(BuildFindBar(lists));
    listsLayout->addWidget(sstDetails_, 1);
    splitter->addWidget(lists);
    splitter->addWidget(fraResultDetails_);
    splitter->setStretchFactor(0, 3);
    splitter->setStretchFactor(1, 1);
    splitter->setSizes({400, fontMetrics().height() * 12});
    splitter->setChildrenCollapsible(false);
    connect(sstDetails_, &QTabWidget::currentChanged, this, [this] {
        ShowSelectedResult();
        ShowCounts();
    });
    connect(fraResultDetails_, &ResultDetailsPane::HelpRequested, this, &frmVerifier::HelpOnResult);
    connect(fraResultDetails_, &ResultDetailsPane::OpenFolderRequested, this,
            &frmVerifier::OpenFolder);

    auto* layout = new QVBoxLayout(central);
    layout->addWidget(frameTarget_);
    layout->addWidget(splitter, 1);
    layout->addLayout(bottom);

    // Progress of a run and the passing status text, beside the counts.
    prgVerification_ = new QProgressBar(frameSummary_);
    prgVerification_->setObjectName(QStringLiteral("prgVerification"));
    prgVerification_->setRange(0, 1);
    prgVerification_->setValue(0);
    prgVerification_->setFormat(kProgressFormat);
    prgVerification_->setAccessibleName(QStringLiteral("Verification progress"));
    lblStatus_ = new QLabel(frameSummary_);
    lblStatus_->setObjectName(QStringLiteral("lblStatus"));
    // A long file name must not widen the window: the text is cut to the space there is.
    lblStatus_->setSizePolicy(QSizePolicy::Ignored, QSizePolicy::Preferred);
    summaryLayout->addWidget(prgVerification_, 0, 4);
    summaryLayout->addWidget(lblStatus_, 1, 4);

    setAcceptDrops(true);
    resize(1040, 740);
    ShowSelectedResult();
    SetTabOrder();
}

void frmVerifier::SetTabOrder() {
    // Top to bottom, as the window reads: the target, what to find, the lists, the result
    // on view, the commands.
    // (The tabs lead on to the page on view, as they do of themselves.)
    QList<QWidget*> order{optTargetSequence_, txtTargetSequence_, cmdTargetSequence_,
                          optTargetShow_,     txtTargetShow_,     cmdTargetShow_,
                          optTargetSchedule_, txtFilter_,         chkShowErrors_,
                          chkShowWarnings_,   chkShowInfo_,       chkErrorsFirst_,
                          cboGroupBy_,        sstDetails_};
    order += fraResultDetails_->TabOrder();
    order += {cmdHelp_, cmdSave_, cmdCancel_, cmdVerify_};
    for (qsizetype i = 1; i < order.size(); ++i)
        setTabOrder(order[i - 1], order[i]);
}

ResultsView* frmVerifier::BuildResultList(const QString& name, Listing listing) {
    auto* model = new ResultsModel(
        grouping_, listing,
        [this](Severity severity) {
            return imlSeverity_->Image(FromSuiteText(SeverityText(severity)));
        },
        this);
    auto* list = new ResultsView(model, sstDetails_);
    list->setObjectName(name);
    connect(list, &ResultsView::PopupRequested, this,
            [this, list](const QModelIndex& index, const QPoint& at) {
                ShowResultPopup(list, index, at);
            });
    connect(list, &QTreeView::doubleClicked, this, [this](const QModelIndex& index) {
        // A group's row opens and closes; a result's opens its help.
        if (const ResultPtr result = ResultOf(index))
            OpenResult(result);
    });
    connect(list->selectionModel(), &QItemSelectionModel::currentChanged, this,
            [this] { ShowSelectedResult(); });
    connect(list->selectionModel(), &QItemSelectionModel::selectionChanged, this,
            [this] { ShowSelectedResult(); });
    // Clicking a column's header sorts by it, in place of errors first.
    connect(list->header(), &QHeaderView::sortIndicatorChanged, this, [this](int column) {
        if (column >= 0 && chkErrorsFirst_->isChecked())
            chkErrorsFirst_->setChecked(false);
    });
    auto* copy = new QShortcut(QKeySequence::Copy, list, nullptr, nullptr, Qt::WidgetShortcut);
    connect(copy, &QShortcut::activated, this, [this, list] { CopyResult(SelectedResult(list)); });
    auto* open =
        new QShortcut(QKeySequence(Qt::Key_Return), list, nullptr, nullptr, Qt::WidgetShortcut);
    auto* openEnter =
        new QShortcut(QKeySequence(Qt::Key_Enter), list, nullptr, nullptr, Qt::WidgetShortcut);
    for (QShortcut* shortcut : {open, openEnter}) {
        connect(shortcut, &QShortcut::activated, this, [this, list] {
            const QModelIndex current = list->currentIndex();
            if (list->Model()->GroupAt(current) != nullptr) {
                list->setExpanded(current, !list->isExpanded(current));
            } else {
                OpenResult(SelectedResult(list));
            }
        });
    }
    // Delete ignores a result of the Results list, and stops ignoring one of the Ignored
    // Results list; with Shift, all results with its message number.
    const bool ignoredList = listing == Listing::Ignored;
    auto* ignore = new QShortcut(QKeySequence::Delete, list, nullptr, nullptr, Qt::WidgetShortcut);
    connect(ignore, &QShortcut::activated, this, [this, list, ignoredList] {
        if (ignoredList) {
            StopIgnoringResult(SelectedResult(list));
        } else {
            IgnoreResult(SelectedResult(list));
        }
    });
    auto* ignoreNumber = new QShortcut(QKeySequence(Qt::SHIFT | Qt::Key_Delete), list, nullptr,
                                       nullptr, Qt::WidgetShortcut);
    connect(ignoreNumber, &QShortcut::activated, this, [this, list, ignoredList] {
        if (ignoredList) {
            StopIgnoringMessageNumber(SelectedResult(list));
        } else {
            IgnoreMessageNumber(SelectedResult(list));
        }
    });
    return list;
}

QWidget* frmVerifier::BuildFindBar(QWidget* parent) {
    auto* bar = new QWidget(parent);
    bar->setObjectName(QStringLiteral("frameFind"));
    auto* filterLabel = new QLabel(QStringLiteral("&Filter:"), bar);
    txtFilter_ = new QLineEdit(bar);
    txtFilter_->setObjectName(QStringLiteral("txtFilter"));
    txtFilter_->setPlaceholderText(QStringLiteral("Text in the description or details (Ctrl+F)"));
    txtFilter_->setClearButtonEnabled(true);
    filterLabel->setBuddy(txtFilter_);
    // Typing is followed once it pauses; Enter applies at once.
    filterTimer_ = new QTimer(this);
    filterTimer_->setSingleShot(true);
    filterTimer_->setInterval(150);
    connect(txtFilter_, &QLineEdit::textChanged, filterTimer_, qOverload<>(&QTimer::start));
    connect(txtFilter_, &QLineEdit::returnPressed, this, &frmVerifier::ApplyQuery);
    connect(filterTimer_, &QTimer::timeout, this, &frmVerifier::ApplyQuery);

    auto toggle = [&](const char* name, const QString& text, const QString& tip) {
        auto* button = new QToolButton(bar);
        button->setObjectName(QString::fromLatin1(name));
        button->setText(text);
        button->setToolTip(tip);
        button->setCheckable(true);
        button->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
        return button;
    };
    chkShowErrors_ =
        toggle("chkShowErrors", QStringLiteral("Errors"), QStringLiteral("Show the errors"));
    chkShowWarnings_ =
        toggle("chkShowWarnings", QStringLiteral("Warnings"), QStringLiteral("Show the warnings"));
    chkShowInfo_ = toggle("chkShowInfo", QStringLiteral("Info"),
                          QStringLiteral("Show the information results"));
    chkShowErrors_->setIcon(imlSeverity_->Image(QStringLiteral("Error")));
    chkShowWarnings_->setIcon(imlSeverity_->Image(QStringLiteral("Warning")));
    chkShowInfo_->setIcon(imlSeverity_->Image(QStringLiteral("Info")));
    for (QToolButton* button : {chkShowErrors_, chkShowWarnings_, chkShowInfo_}) {
        button->setChecked(true);
        connect(button, &QToolButton::toggled, this, &frmVerifier::ApplyQuery);
    }
    chkErrorsFirst_ = toggle("chkErrorsFirst", QStringLiteral("Errors first"),
                             QStringLiteral("Errors first, then warnings, then information; "
                                            "otherwise in the order found (Ctrl+E)"));
    chkErrorsFirst_->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_E));
    connect(chkErrorsFirst_, &QToolButton::toggled, this, [this](bool errorsFirst) {
        // One order at a time: errors first, or a column's, or the order found.
        if (errorsFirst) {
            for (ResultsView* list : lvResults_)
                list->header()->setSortIndicator(-1, Qt::AscendingOrder);
        }
        ApplyQuery();
    });

    auto* groupLabel = new QLabel(QStringLiteral("&Group by:"), bar);
    cboGroupBy_ = new QComboBox(bar);
    cboGroupBy_->setObjectName(QStringLiteral("cboGroupBy"));
    cboGroupBy_->addItem(QStringLiteral("None"), static_cast<int>(GroupBy::None));
    cboGroupBy_->addItem(QStringLiteral("Message"), static_cast<int>(GroupBy::Message));
    cboGroupBy_->addItem(QStringLiteral("Show"), static_cast<int>(GroupBy::Show));
    cboGroupBy_->addItem(QStringLiteral("Sequence"), static_cast<int>(GroupBy::Sequence));
    cboGroupBy_->addItem(QStringLiteral("Sequence pair"), static_cast<int>(GroupBy::SequencePair));
    cboGroupBy_->setToolTip(
        QStringLiteral("Gather the results under their message, show, "
                       "sequence, or the two sequences that conflict"));
    groupLabel->setBuddy(cboGroupBy_);
    connect(cboGroupBy_, &QComboBox::currentIndexChanged, this, &frmVerifier::ApplyQuery);

    lblShown_ = new QLabel(bar);
    lblShown_->setObjectName(QStringLiteral("lblShown"));

    auto* layout = new QHBoxLayout(bar);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(filterLabel);
    layout->addWidget(txtFilter_, 1);
    layout->addWidget(chkShowErrors_);
    layout->addWidget(chkShowWarnings_);
    layout->addWidget(chkShowInfo_);
    layout->addSpacing(8);
    layout->addWidget(chkErrorsFirst_);
    layout->addSpacing(8);
    layout->addWidget(groupLabel);
    layout->addWidget(cboGroupBy_);
    layout->addSpacing(8);
    layout->addWidget(lblShown_);

    auto* find = new QShortcut(QKeySequence::Find, this);
    connect(find, &QShortcut::activated, this, [this] {
        txtFilter_->setFocus(Qt::ShortcutFocusReason);
        txtFilter_->selectAll();
    });
    return bar;
}

ResultQuery frmVerifier::ChosenQuery() const {
    ResultQuery query;
    query.filter.text = ToSuiteText(txtFilter_->text().trimmed());
    query.filter.errors = chkShowErrors_->isChecked();
    query.filter.warnings = chkShowWarnings_->isChecked();
    query.filter.info = chkShowInfo_->isChecked();
    query.order = chkErrorsFirst_->isChecked() ? ResultOrder::ErrorsFirst : ResultOrder::RunOrder;
    query.groupBy = static_cast<GroupBy>(cboGroupBy_->currentData().toInt());
    return query;
}

void frmVerifier::ApplyQuery() {
    filterTimer_->stop();
    const ResultQuery query = ChosenQuery();
    for (ResultsView* list : lvResults_) {
        if (SameView(list->Model()->Query(), query))
            continue;
        list->Model()->SetQuery(query);
        // The selected result stays in view.
        if (list->currentIndex().isValid())
            list->scrollTo(list->currentIndex());
    }
    // What is being looked for is in the lists, not in the log.
    if (sstDetails_->currentIndex() == OutputLogTab)
        sstDetails_->setCurrentIndex(ResultsTab);
    ShowCounts();
}

void frmVerifier::ShowCounts() {
    const ResultsView* list = lvResults_[sstDetails_->currentIndex() == IgnoredResultsTab ? 1 : 0];
    const ResultsModel* model = list->Model();
    const std::size_t shown = model->ShownCount();
    lblShown_->setText(
        QStringLiteral("%1 of %2 shown")
            .arg(FromSuiteText(FormatCount(static_cast<int64_t>(shown))))
            .arg(FromSuiteText(FormatCount(static_cast<int64_t>(shown + model->HiddenCount())))));
}

void frmVerifier::BuildMenus() {
    // The Results list's pop-up menu.
    mnuResultPopup_ = new QMenu(this);
    mnuResultPopup_->setObjectName(QStringLiteral("mnuResultPopup"));
    mnuHelpOnResult_ = mnuResultPopup_->addAction(QStringLiteral("Help on this result"));
    mnuHelpOnResult_->setObjectName(QStringLiteral("mnuHelpOnResult"));
    mnuHelpOnResult_->setShortcut(QKeySequence(Qt::Key_F1));
    mnuResultPopup_->addSeparator();
    mnuIgnoreResult_ = mnuResultPopup_->addAction(QStringLiteral("Ignore this result"));
    mnuIgnoreResult_->setObjectName(QStringLiteral("mnuIgnoreResult"));
    mnuIgnoreResult_->setShortcut(QKeySequence::Delete);
    mnuIgnoreMessageNumber_ =
        mnuResultPopup_->addAction(QStringLiteral("Ignore all results with this message number"));
    mnuIgnoreMessageNumber_->setObjectName(QStringLiteral("mnuIgnoreMessageNumber"));
    mnuIgnoreMessageNumber_->setShortcut(QKeySequence(Qt::SHIFT | Qt::Key_Delete));
    connect(mnuHelpOnResult_, &QAction::triggered, this, [this] { HelpOnResult(popupResult_); });
    connect(mnuIgnoreResult_, &QAction::triggered, this, [this] { IgnoreResult(popupResult_); });
    connect(mnuIgnoreMessageNumber_, &QAction::triggered, this,
            [this] { IgnoreMessageNumber(popupResult_); });

    // The Ignored Results list's: the way back.
    mnuIgnoredPopup_ = new QMenu(this);
    mnuIgnoredPopup_->setObjectName(QStringLiteral("mnuIgnoredPopup"));
    QAction* help = mnuIgnoredPopup_->addAction(QStringLiteral("Help on this result"));
    help->setShortcut(QKeySequence(Qt::Key_F1));
    mnuIgnoredPopup_->addSeparator();
    mnuStopIgnoringResult_ =
        mnuIgnoredPopup_->addAction(QStringLiteral("Stop ignoring this result"));
    mnuStopIgnoringResult_->setObjectName(QStringLiteral("mnuStopIgnoringResult"));
    mnuStopIgnoringResult_->setShortcut(QKeySequence::Delete);
    mnuStopIgnoringMessageNumber_ = mnuIgnoredPopup_->addAction(
        QStringLiteral("Stop ignoring all results with this message number"));
    mnuStopIgnoringMessageNumber_->setObjectName(QStringLiteral("mnuStopIgnoringMessageNumber"));
    mnuStopIgnoringMessageNumber_->setShortcut(QKeySequence(Qt::SHIFT | Qt::Key_Delete));
    connect(help, &QAction::triggered, this, [this] { HelpOnResult(popupResult_); });
    connect(mnuStopIgnoringResult_, &QAction::triggered, this,
            [this] { StopIgnoringResult(popupResult_); });
    connect(mnuStopIgnoringMessageNumber_, &QAction::triggered, this,
            [this] { StopIgnoringMessageNumber(popupResult_); });

    // Both: the result as text.
    for (QMenu* menu : {mnuResultPopup_, mnuIgnoredPopup_}) {
        menu->addSeparator();
        QAction* copy = menu->addAction(QStringLiteral("Copy"));
        copy->setShortcut(QKeySequence::Copy);
        connect(copy, &QAction::triggered, this, [this] { CopyResult(popupResult_); });
    }

    // Keyboard access to the commands beyond the buttons' own letters.
    auto addShortcut = [this](const QKeySequence& keys, auto&& command) {
        auto* shortcut = new QShortcut(keys, this);
        connect(shortcut, &QShortcut::activated, this, command);
    };
    addShortcut(QKeySequence(Qt::Key_F1), [this] {
        if (cmdHelp_->isEnabled())
            Help();
    });
    addShortcut(QKeySequence(Qt::Key_F5), [this] {
        if (cmdVerify_->isEnabled())
            Verify();
    });
    addShortcut(QKeySequence(Qt::Key_Escape), [this] {
        if (cmdCancel_->isEnabled())
            Cancel();
    });
    addShortcut(QKeySequence::Save, [this] {
        if (cmdSave_->isEnabled())
            Save();
    });
    addShortcut(QKeySequence::Open, [this] {
        if (running_)
            return;
        if (optTargetSequence_->isChecked()) {
            ChooseTargetSequence();
        } else if (optTargetShow_->isChecked()) {
            ChooseTargetShow();
        }
    });
}

// --- Placement -----------------------------------------------------------------------------

void frmVerifier::LoadPlacement() {
    const QSettings settings(settingsFile_, QSettings::IniFormat);
    const QByteArray geometry = settings.value(kGeometryKey).toByteArray();
    if (!geometry.isEmpty())
        restoreGeometry(geometry);
    txtTargetSequence_->setText(AbsoluteTarget(settings.value(kTargetSequenceKey).toString()));
    txtTargetShow_->setText(AbsoluteTarget(settings.value(kTargetShowKey).toString()));
    const QString kind = settings.value(kTargetKindKey).toString();
    if (kind == QLatin1String("sequence")) {
        optTargetSequence_->setChecked(true);
    } else if (kind == QLatin1String("show")) {
        optTargetShow_->setChecked(true);
    } else {
        optTargetSchedule_->setChecked(true);
    }
}

void frmVerifier::SavePlacement() const {
    QSettings settings(settingsFile_, QSettings::IniFormat);
    settings.setValue(kGeometryKey, saveGeometry());
    settings.setValue(kTargetSequenceKey, AbsoluteTarget(txtTargetSequence_->text()));
    settings.setValue(kTargetShowKey, AbsoluteTarget(txtTargetShow_->text()));
    settings.setValue(kTargetKindKey, optTargetSequence_->isChecked() ? QStringLiteral("sequence")
                                      : optTargetShow_->isChecked()   ? QStringLiteral("show")
                                                                      : QStringLiteral("schedule"));
    settings.sync();
}

void frmVerifier::closeEvent(QCloseEvent* event) {
    if (running_) {
        // The run is on the stack below us: stop it, and close once it has ended.
        closeWhenFinished_ = true;
        Cancel();
        event->ignore();
        return;
    }
    SavePlacement();
    QMainWindow::closeEvent(event);
}

// --- Dropping a file -----------------------------------------------------------------------

namespace {

QString DroppedFile(const QMimeData* data) {
    if (data == nullptr || !data->hasUrls() || data->urls().size() != 1)
        return {};
    const QUrl url = data->urls().constFirst();
    if (!url.isLocalFile())
        return {};
    const QString path = QDir::toNativeSeparators(url.toLocalFile());
    return KindOfFile(path) == TargetKind::None ? QString() : path;
}

}  // namespace

void frmVerifier::dragEnterEvent(QDragEnterEvent* event) {
    if (!running_ && !DroppedFile(event->mimeData()).isEmpty())
        event->acceptProposedAction();
}

void frmVerifier::dropEvent(QDropEvent* event) {
    const QString path = DroppedFile(event->mimeData());
    if (!path.isEmpty() && SetTargetFile(path))
        event->acceptProposedAction();
}

bool frmVerifier::SetTargetFile(const QString& file) {
    if (running_)
        return false;
    const QString path = AbsoluteTarget(file);
    switch (KindOfFile(path)) {
        case TargetKind::Sequence:
            txtTargetSequence_->setText(path);
            optTargetSequence_->setChecked(true);
            return true;
        case TargetKind::Show:
            txtTargetShow_->setText(path);
            optTargetShow_->setChecked(true);
            return true;
        case TargetKind::None:
            break;
    }
    return false;
}

// --- States and the summary ----------------------------------------------------------------

void frmVerifier::SetRunning(bool running) {
    running_ = running;
    if (!running) {
        FlushLog();
        TakeNewResults(true);
        repaintClock_.invalidate();
        logClock_.invalidate();
        lblStatus_->setText(statusText_);
    }
    cmdCancel_->setEnabled(running);
    cmdVerify_->setEnabled(!running);
    cmdSave_->setEnabled(!running);
    cmdHelp_->setEnabled(!running);
    frameTarget_->setEnabled(!running);
}

void frmVerifier::ResetSummary() {
    for (QLabel* count :
         {lblChecksPerformedCount_, lblChecksRemainingCount_, lblErrorsCount_, lblWarningsCount_})
        count->setText(QStringLiteral("0"));
    prgVerification_->setRange(0, 1);
    prgVerification_->setValue(0);
    runCancelled_ = false;
    checksDropped_ = 0;
}

void frmVerifier::SummaryChanged() {
    if (running_) {
        summaryPending_ = true;
    } else {
        RefreshSummary();
    }
}

void frmVerifier::SetStatus(const QString& text) {
    statusText_ = text;
    if (!running_)
        lblStatus_->setText(text);
}

void frmVerifier::RefreshSummary() {
    summaryPending_ = false;
    const int32_t performed = LibVerify::ChecksPerformedCount();
    const int32_t remaining = LibVerify::ChecksRemainingCount();
    lblChecksPerformedCount_->setText(QString::number(performed));
    lblChecksRemainingCount_->setText(QString::number(remaining));
    // The errors and warnings of the Results list (whatever its filter hides): as the
    // driver counts them until the user ignores or stops ignoring a result.
    lblErrorsCount_->setText(QString::number(listedCounts_.errors));
    lblWarningsCount_->setText(QString::number(listedCounts_.warnings));
    // A cancelled run stops short of the checks it dropped, and says so.
    const int total = std::max(1, performed + remaining + (runCancelled_ ? checksDropped_ : 0));
    prgVerification_->setRange(0, total);
    prgVerification_->setValue(std::min(performed, total));
    prgVerification_->setFormat(runCancelled_ ? QStringLiteral("Cancelled") : kProgressFormat);
}

// --- The output log ------------------------------------------------------------------------

namespace {

QColor ToQColor(const OutputLog::Colour& colour) {
    return QColor(colour.red, colour.green, colour.blue);
}

// Each line of the log carries what its colour stands for, so that it can be coloured again
// when the palette changes: a severity's number, or kPlainLine.
constexpr int kLogLineKind = QTextFormat::UserProperty + 1;
constexpr int kPlainLine = -1;

bool IsDarkPage(const QPalette& palette) {
    return palette.color(QPalette::Base).lightness() < 128;
}

}  // namespace

QColor frmVerifier::LogColour(int kind, const QPalette& palette) {
    const bool dark = IsDarkPage(palette);
    if (kind == kPlainLine)
        return dark ? palette.color(QPalette::Text) : ToQColor(OutputLog::kBlack);
    const auto severity = static_cast<Severity>(kind);
    if (!dark)
        return ToQColor(OutputLog::ResultColour(severity));
    // On a dark page the same hues, lighter, so that they stand out as well as on a light one.
    switch (severity) {
        case Severity::Info:
            return QColor(110, 160, 255);
        case Severity::Warning:
            return QColor(255, 170, 70);
        case Severity::Error:
            return QColor(255, 110, 110);
    }
    return palette.color(QPalette::Text);
}

void frmVerifier::WriteLog(const QString& text, int kind) {
    // The time stamp is taken now, whenever the line reaches the screen.
    pendingLog_.append({FromSuiteText(OutputLog::FormatLine(ToSuiteText(text))), kind});
    if (!running_)
        FlushLog();
}

void frmVerifier::FlushLog() {
    if (pendingLog_.isEmpty())
        return;
    const QPalette palette = rtxOutputLog_->palette();
    QTextCursor cursor(rtxOutputLog_->document());
    cursor.movePosition(QTextCursor::End);
    cursor.beginEditBlock();
    for (const LogLine& line : std::as_const(pendingLog_)) {
        QTextCharFormat format;
        format.setForeground(LogColour(line.kind, palette));
        format.setProperty(kLogLineKind, line.kind);
        // Every line ends with a line break, so the document ends with an empty block.
        cursor.insertText(line.text + QLatin1Char('\n'), format);
    }
    cursor.endEditBlock();
    pendingLog_.clear();
    // Keep the end in view.
    QScrollBar* scrollBar = rtxOutputLog_->verticalScrollBar();
    scrollBar->setValue(scrollBar->maximum());
}

void frmVerifier::RecolourLog() {
    const QPalette palette = rtxOutputLog_->palette();
    QTextDocument* document = rtxOutputLog_->document();
    QTextCursor cursor(document);
    cursor.beginEditBlock();
    for (QTextBlock block = document->begin(); block.isValid(); block = block.next()) {
        for (auto fragment = block.begin(); !fragment.atEnd(); ++fragment) {
            const QTextFragment piece = fragment.fragment();
            QTextCharFormat format = piece.charFormat();
            if (!format.hasProperty(kLogLineKind))
                continue;
            format.setForeground(LogColour(format.intProperty(kLogLineKind), palette));
            cursor.setPosition(piece.position());
            cursor.setPosition(piece.position() + piece.length(), QTextCursor::KeepAnchor);
            cursor.setCharFormat(format);
        }
    }
    cursor.endEditBlock();
}

bool frmVerifier::eventFilter(QObject* watched, QEvent* event) {
    if (watched == rtxOutputLog_ && event->type() == QEvent::PaletteChange)
        RecolourLog();
    return QMainWindow::eventFilter(watched, event);
}

// --- Notification handlers -----------------------------------------------------------------

void frmVerifier::CheckAdded(ICheck& check) {
    WriteLog(FromSuiteText(OutputLog::CheckAddedText(check)), kPlainLine);
    SummaryChanged();
}

void frmVerifier::CheckCompleted(ICheck&) {
    SummaryChanged();
}

void frmVerifier::Checking(ICheck& check) {
    const QString text = FromSuiteText(OutputLog::CheckingText(check));
    WriteLog(text, kPlainLine);
    SetStatus(text);
}

void frmVerifier::ChecksCompleted(bool cancelled) {
    WriteLog(FromSuiteText(OutputLog::ChecksCompletedText(cancelled)), kPlainLine);
    runCancelled_ = cancelled;
    SetStatus(cancelled ? QStringLiteral("Cancelled: %1 of %2 checks performed")
                              .arg(LibVerify::ChecksPerformedCount())
                              .arg(LibVerify::ChecksPerformedCount() + checksDropped_)
                        : QString());
    SetRunning(false);
    RefreshSummary();
    sstDetails_->setCurrentIndex(ResultsTab);
}

void frmVerifier::Initializing() {
    pendingLog_.clear();
    rtxOutputLog_->clear();
    grouping_.Clear();
    listedCounts_ = SeverityCounts();
    for (ResultsView* list : lvResults_)
        list->Model()->Clear();
    popupResult_.reset();
    fraResultDetails_->ShowResult(nullptr);
    ShowCounts();
    SetStatus(QString());
    sstDetails_->setCurrentIndex(OutputLogTab);
}

void frmVerifier::ResultAdded(const ResultPtr& result) {
    const bool ignored = result->Ignorable();
    grouping_.Add(result, ignored);
    if (!ignored)
        listedCounts_.Add(result->Severity());
    // While a run goes, the lists take new results when the window is drawn.
    if (!running_)
        TakeNewResults(true);
    SummaryChanged();
    WriteLog(FromSuiteText(OutputLog::ResultText(*result)), static_cast<int>(result->Severity()));
    LibVerify::ProcessPendingEvents();
}

void frmVerifier::TransientMessage(const std::string& message) {
    const QString text = FromSuiteText(message);
    WriteLog(text, kPlainLine);
    SetStatus(text);
}

void frmVerifier::VerificationCancelled() {
    SummaryChanged();
}

// --- The result lists ----------------------------------------------------------------------

ResultPtr frmVerifier::ResultOf(const QModelIndex& index) {
    const auto* model = qobject_cast<const ResultsModel*>(index.model());
    return model != nullptr ? model->ResultAt(index) : nullptr;
}

void frmVerifier::TakeNewResults(bool now) {
    // A list that is not on view and simply appends takes its new rows every time: that is
    // cheap. A list on view lays all its rows out again whenever it gains some, and one that
    // is grouped, ordered or sorted is rebuilt: while a run goes, those take new results at
    // most every kRelayoutIntervalMs.
    const bool due =
        now || !relayoutClock_.isValid() || relayoutClock_.hasExpired(kRelayoutIntervalMs);
    bool changed = false;
    for (ResultsView* list : lvResults_) {
        ResultsModel* model = list->Model();
        if (due || (model->Appends() && !list->isVisible()))
            changed = model->TakeNewResults() || changed;
    }
    if (due)
        relayoutClock_.restart();
    if (changed)
        ShowCounts();
}

void frmVerifier::RelayoutLists() {
    for (ResultsView* list : lvResults_) {
        // A result that leaves the list (ignored, say) hands the selection to the row that
        // takes its place, so that the next one can be dealt with at once.
        const QModelIndex current = list->currentIndex();
        const int row = current.row();
        const QPersistentModelIndex parent = current.parent();
        list->Model()->Relayout();
        if (current.isValid() && !list->currentIndex().isValid()) {
            ResultsModel* model = list->Model();
            const QModelIndex within = parent.isValid() ? QModelIndex(parent) : QModelIndex();
            const int rows = model->rowCount(within);
            if (rows > 0) {
                const QModelIndex next = model->index(std::min(row, rows - 1), 0, within);
                list->setCurrentIndex(next);
            }
        }
    }
    ShowCounts();
}

void frmVerifier::RefreshIgnoredResults() {
    TakeNewResults(true);
    bool moved = false;
    for (std::size_t i = 0; i < grouping_.Size(); ++i) {
        const bool ignored = grouping_.At(i)->Ignorable();
        if (ignored != grouping_.Ignored(i)) {
            grouping_.SetIgnored(i, ignored);
            moved = true;
        }
    }
    if (!moved)
        return;
    listedCounts_ = grouping_.Counts(Listing::NotIgnored);
    RelayoutLists();
    SummaryChanged();
}

ResultPtr frmVerifier::SelectedResult(const ResultsView* list) const {
    const QModelIndex current = list->currentIndex();
    if (!current.isValid() || !list->selectionModel()->isSelected(current))
        return nullptr;
    return ResultOf(current);
}

void frmVerifier::ShowResultPopup(ResultsView* list, const QModelIndex& index,
                                  const QPoint& globalPosition) {
    popupResult_ = ResultOf(index);
    if (!popupResult_)
        return;
    list->setCurrentIndex(index);
    QMenu* menu = mnuResultPopup_;
    if (list == lvResults_[1]) {
        // An ignored result is listed for its own key, its message number, or both: each
        // entry offers to take away what is there.
        mnuStopIgnoringResult_->setEnabled(
            IgnoreLists::IsIgnoreKeyIgnored(popupResult_->IgnoreKey()));
        mnuStopIgnoringMessageNumber_->setEnabled(
            IgnoreLists::IsMessageNumberIgnored(std::to_string(popupResult_->MessageNumber())));
        menu = mnuIgnoredPopup_;
    }
    menu->popup(globalPosition);
}

// --- Commands ------------------------------------------------------------------------------

template <typename Command>
void frmVerifier::Guarded(const QString& title, Command&& command) {
    QString failure;
    try {
        command();
        return;
    } catch (...) {
        failure = FromSuiteText(DescribeException(std::current_exception(), "Unexpected error"));
    }
    ShowError(title, failure);
}

void frmVerifier::ShowError(const QString& title, const QString& text) {
    dialogs_->ShowError(this, title, text);
}

void frmVerifier::ApplyTarget() {
    if (optTargetShow_->isChecked()) {
        const QString show = AbsoluteTarget(txtTargetShow_->text());
        if (show.isEmpty())
            Raise(ErrorNumbers::UserMessage, kSource, "Please specify the show file to verify");
        txtTargetShow_->setText(show);
        LibVerify::VerifyShowFile(ToSuiteText(show));
    } else if (optTargetSequence_->isChecked()) {
        const QString sequence = AbsoluteTarget(txtTargetSequence_->text());
        if (sequence.isEmpty())
            Raise(ErrorNumbers::UserMessage, kSource, "Please specify the sequence file to verify");
        txtTargetSequence_->setText(sequence);
        LibVerify::VerifySequenceFile(ToSuiteText(sequence));
    } else {
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
    }
}

void frmVerifier::Verify() {
    if (running_)
        return;
    bool started = false;
    Guarded(kVerifierError, [&] {
        ScopedMousePointer pointer;
        pointer.SetPointer(MousePointer::Hourglass);
        ApplyTarget();
        SetRunning(true);
        started = true;
        ResetSummary();
        LibVerify::RunVerification();
    });
    if (!started)
        return;
    // ChecksCompleted has put the window back to idle; should the run have failed before
    // it got there, do so here.
    if (running_)
        SetRunning(false);
    emit VerificationFinished(LibVerify::IsCancelled());
    if (closeWhenFinished_)
        QTimer::singleShot(0, this, &QWidget::close);
}

void frmVerifier::Cancel() {
    Guarded(kVerifierError, [this] {
        // The queue is emptied: the progress bar keeps room for what it held.
        if (running_ && !LibVerify::IsCancelled())
            checksDropped_ = LibVerify::ChecksRemainingCount();
        LibVerify::CancelVerification();
    });
}

std::string frmVerifier::ChooseResultsReportFile() {
    const ResultsReport::DialogSettings settings = ResultsReport::ChooseResultsReportFileSettings();
    FileDialogRequest request;
    request.kind = FileDialogRequest::Kind::Save;
    request.title = FromSuiteText(settings.title);
    request.initialFolder = FromSuiteText(settings.initialFolder);
    request.fileName = FromSuiteText(settings.fileName);
    request.defaultExtension = FromSuiteText(settings.defaultExtension);
    request.filters = ParseFilterList(FromSuiteText(settings.filter));
    // Beside the text report, the HTML report to read in a browser or send to someone.
    request.filters.append(FileFilter{QStringLiteral("HTML report"), {QStringLiteral("*.html")}});
    request.filterIndex = settings.filterIndex;
    request.promptToOverwrite = settings.promptToOverwrite;
    request.hideReadOnlyBox = settings.hideReadOnlyBox;
    request.pathMustExist = settings.pathMustExist;
    request.refuseReadOnlyFile = settings.refuseReadOnlyFile;
    const std::optional<QString> chosen = dialogs_->ChooseFile(this, request);
    return chosen ? ToSuiteText(*chosen) : std::string();
}

void frmVerifier::SaveResultsReport(const std::string& fileName) {
    if (QFileInfo(FromSuiteText(fileName))
            .suffix()
            .compare(QStringLiteral("html"), Qt::CaseInsensitive) == 0) {
        report::RunReport run = report::LastRunReport();
        run.program = "vantori-verifier";
        report::HtmlReport::Save(fileName, run);
        return;
    }
    ResultsReport::SaveResultsReport(fileName);
}

void frmVerifier::Save() {
    Guarded(kErrorSavingMessages, [&] {
        const std::string fileName = ChooseResultsReportFile();
        if (!fileName.empty())
            SaveResultsReport(fileName);
    });
}

void frmVerifier::Help() {
    Guarded(kHelpFileError, [&] {
        const int tab = sstDetails_->currentIndex();
        ResultPtr result;
        if (tab == ResultsTab) {
            result = SelectedResult(lvResults_[0]);
        } else if (tab == IgnoredResultsTab) {
            result = SelectedResult(lvResults_[1]);
        }
        if (result) {
            help_->ShowContext(result->HelpContextID());
        } else {
            help_->ShowPage(HelpProvider::kVerifierPage);
        }
    });
}

void frmVerifier::HelpOnResult(const ResultPtr& result) {
    if (!result)
        return;
    Guarded(kHelpContextError, [&] { help_->ShowContext(result->HelpContextID()); });
}

void frmVerifier::OpenResult(const ResultPtr& result) {
    if (!result)
        return;
    Guarded(kDoubleClickError, [&] { help_->ShowContext(result->HelpContextID()); });
}

void frmVerifier::IgnoreResult(const ResultPtr& result) {
    ChangeIgnoreLists(result, [&] { IgnoreLists::IgnoreResult(*result); });
}

void frmVerifier::IgnoreMessageNumber(const ResultPtr& result) {
    ChangeIgnoreLists(result, [&] { IgnoreLists::IgnoreMessageNumber(result->MessageNumber()); });
}

void frmVerifier::StopIgnoringResult(const ResultPtr& result) {
    ChangeIgnoreLists(result, [&] { IgnoreLists::UnignoreResult(*result); });
}

void frmVerifier::StopIgnoringMessageNumber(const ResultPtr& result) {
    ChangeIgnoreLists(result, [&] { IgnoreLists::UnignoreMessageNumber(result->MessageNumber()); });
}

template <typename Change>
void frmVerifier::ChangeIgnoreLists(const ResultPtr& result, Change&& change) {
    if (!result)
        return;
    Guarded(kIgnoreListError, [&] {
        change();
        RefreshIgnoredResults();
    });
    // What the result is ignored by may have changed, whether or not it moved.
    ShowSelectedResult();
}

void frmVerifier::CopyResult(const ResultPtr& result) {
    if (result)
        QApplication::clipboard()->setText(ResultDetailsPane::ResultText(*result));
}

void frmVerifier::OpenFolder(const QString& folder) {
    if (!dialogs_->OpenFolder(this, folder))
        ShowError(kOpenFolderError, QStringLiteral("Cannot open the folder %1").arg(folder));
}

void frmVerifier::ShowSelectedResult() {
    const int tab = sstDetails_->currentIndex();
    fraResultDetails_->setVisible(tab != OutputLogTab);
    if (tab == OutputLogTab)
        return;
    const bool ignoredList = tab == IgnoredResultsTab;
    const ResultsView* list = lvResults_[ignoredList ? 1 : 0];
    const ResultPtr result = SelectedResult(list);
    if (!result) {
        const QModelIndex current = list->currentIndex();
        const ResultGroup* group = list->Model()->GroupAt(current);
        if (group != nullptr && list->selectionModel()->isSelected(current)) {
            fraResultDetails_->ShowGroup(
                FromSuiteText(group->title),
                imlSeverity_->Image(FromSuiteText(SeverityText(group->worst))),
                ResultsModel::CountsText(group->counts));
        } else {
            fraResultDetails_->ShowResult(nullptr);
        }
        return;
    }
    QString ignoredBy;
    if (ignoredList) {
        const bool byKey = IgnoreLists::IsIgnoreKeyIgnored(result->IgnoreKey());
        const bool byNumber =
            IgnoreLists::IsMessageNumberIgnored(std::to_string(result->MessageNumber()));
        const QString number =
            QStringLiteral("all results with message number %1").arg(result->MessageNumber());
        ignoredBy = byKey && byNumber ? QStringLiteral("this result, and ") + number
                    : byKey           ? QStringLiteral("this result")
                                      : number;
    }
    fraResultDetails_->ShowResult(
        result, imlSeverity_->Image(FromSuiteText(result->SeverityText())), ignoredBy);
}

void frmVerifier::ChooseTargetSequence() {
    ChooseTarget(true);
}

void frmVerifier::ChooseTargetShow() {
    ChooseTarget(false);
}

void frmVerifier::ChooseTarget(bool sequence) {
    QLineEdit* box = sequence ? txtTargetSequence_ : txtTargetShow_;
    QRadioButton* option = sequence ? optTargetSequence_ : optTargetShow_;
    Guarded(sequence ? kErrorSelectingSequence : kErrorSelectingShow, [&] {
        FileDialogRequest request;
        request.kind = FileDialogRequest::Kind::Open;
        request.title = sequence ? QStringLiteral("Choose Target Sequence")
                                 : QStringLiteral("Choose Target Show");
        if (sequence) {
            request.filters = {{QStringLiteral("Vantori Sequence Files"),
                                {QStringLiteral("*.las"), QStringLiteral("*.lms")}},
                               {QStringLiteral("- Animation Sequences"), {QStringLiteral("*.las")}},
                               {QStringLiteral("- Musical Sequences"), {QStringLiteral("*.lms")}}};
        } else {
            request.filters = {{QStringLiteral("Vantori Show Files"), {QStringLiteral("*.lss")}}};
        }
        request.filterIndex = 1;
        request.fileMustExist = true;
        request.pathMustExist = true;
        request.hideReadOnlyBox = true;
        request.refuseReadOnlyFile = true;
        // Start where the current file is, else in the user-data folder.
        const QFileInfo current(box->text().trimmed());
        if (!box->text().trimmed().isEmpty() && current.absoluteDir().exists()) {
            request.initialFolder = QDir::toNativeSeparators(current.absolutePath());
        } else {
            request.initialFolder = FromSuiteText(VTRCommon::GetUserDataPath());
        }
        const std::optional<QString> chosen = dialogs_->ChooseFile(this, request);
        if (chosen) {
            box->setText(*chosen);
            option->setChecked(true);
        }
    });
}

}  // namespace vtr
