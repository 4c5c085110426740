#include "ResultDetailsPane.h"

#include <QApplication>
#include <QBoxLayout>
#include <QClipboard>
#include <QDir>
#include <QFileInfo>
#include <QLabel>
#include <QPushButton>
#include <QRegularExpression>
#include <QTextBrowser>
#include <QUrl>

#include "UiText.h"
#include "engine/ResultsReport.h"

namespace vtr {
namespace {

const QString kFolderLink = QStringLiteral("folder");
const QString kHelpLink = QStringLiteral("help");

// The label a detail line starts with: "[SEQUENCE]: ", "[SHOW] ".
const QRegularExpression& DetailLabel() {
    static const QRegularExpression label(QStringLiteral("^\\[[^\\]]*\\]:?\\s*"));
    return label;
}

}  // namespace

ResultDetailsPane::ResultDetailsPane(QWidget* parent) : QFrame(parent) {
    setObjectName(QStringLiteral("frameResultDetails"));
    setFrameShape(QFrame::StyledPanel);

    icon_ = new QLabel(this);
    icon_->setFixedSize(20, 20);
    summary_ = new QLabel(this);
    summary_->setObjectName(QStringLiteral("lblResultSummary"));
    summary_->setTextInteractionFlags(Qt::TextSelectableByMouse | Qt::TextSelectableByKeyboard);
    QFont bold = summary_->font();
    bold.setBold(true);
    summary_->setFont(bold);
    kind_ = new QLabel(this);
    kind_->setObjectName(QStringLiteral("lblResultKind"));
    kind_->setTextInteractionFlags(Qt::TextSelectableByMouse);
    help_ = new QLabel(this);
    help_->setObjectName(QStringLiteral("lblResultHelp"));
    help_->setTextFormat(Qt::RichText);
    // From the keyboard, F1 gives the same help.
    help_->setTextInteractionFlags(Qt::LinksAccessibleByMouse);
    help_->setText(QStringLiteral("<a href=\"%1\">Help on this result</a>").arg(kHelpLink));
    copy_ = new QPushButton(QStringLiteral("Copy"), this);
    copy_->setObjectName(QStringLiteral("cmdCopyResult"));
    copy_->setToolTip(QStringLiteral("Copy the whole result to the clipboard as text (Ctrl+C)"));
    details_ = new QTextBrowser(this);
    details_->setObjectName(QStringLiteral("txtResultDetails"));
    details_->setAccessibleName(QStringLiteral("Result details"));
    details_->setOpenLinks(false);
    details_->setOpenExternalLinks(false);
    // Paths have no blanks to break at: they wrap anywhere rather than run off the pane.
    details_->setWordWrapMode(QTextOption::WrapAtWordBoundaryOrAnywhere);
    details_->setTextInteractionFlags(Qt::TextSelectableByMouse | Qt::TextSelectableByKeyboard |
                                      Qt::LinksAccessibleByMouse | Qt::LinksAccessibleByKeyboard);

    // One line for what the result is, then its details.
    auto* heading = new QHBoxLayout;
    heading->addWidget(icon_);
    heading->addWidget(summary_);
    heading->addSpacing(12);
    heading->addWidget(kind_);
    heading->addSpacing(12);
    heading->addWidget(help_);
    heading->addStretch(1);
    heading->addWidget(copy_);
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(6, 4, 6, 6);
    layout->setSpacing(4);
    layout->addLayout(heading);
    layout->addWidget(details_, 1);
    // Room for a few detail lines, however the splitter is moved.
    setMinimumHeight(fontMetrics().height() * 7);

    connect(copy_, &QPushButton::clicked, this, &ResultDetailsPane::CopyResult);
    connect(help_, &QLabel::linkActivated, this,
            [this](const QString& link) { LinkActivated(QUrl(link)); });
    connect(details_, &QTextBrowser::anchorClicked, this, &ResultDetailsPane::LinkActivated);
    ShowResult(nullptr);
}

void ResultDetailsPane::ShowResult(const ResultPtr& result, const QIcon& icon,
                                   const QString& ignoredBy) {
    result_ = result;
    folders_.clear();
    const bool shown = result != nullptr;
    copy_->setEnabled(shown);
    help_->setVisible(shown);
    icon_->setPixmap(shown && !icon.isNull() ? icon.pixmap(16, 16) : QPixmap());
    if (!shown) {
        summary_->setText(QString());
        kind_->setText(QStringLiteral("Select a result to see it whole here."));
        details_->clear();
        return;
    }
    summary_->setText(FromSuiteText(result->Summary()));
    QString kind = QStringLiteral("%1, message number %2")
                       .arg(FromSuiteText(result->SeverityText()))
                       .arg(result->MessageNumber());
    if (!ignoredBy.isEmpty())
        kind += QStringLiteral(" (ignored: %1)").arg(ignoredBy);
    kind_->setText(kind);

    QString html;
    const std::vector<std::string>& details = result->Details();
    for (std::size_t i = 0; i < details.size(); ++i) {
        const QString detail = FromSuiteText(details[i]);
        const QString folder = ContainingFolder(detail);
        folders_.append(folder);
        html += QStringLiteral("<p style=\"margin:0 0 2px 0\">") + detail.toHtmlEscaped();
        if (!folder.isEmpty()) {
            html += QStringLiteral("&nbsp;&nbsp; <a href=\"%1:%2\">Open containing folder</a>")
                        .arg(kFolderLink)
                        .arg(i);
        }
        html += QStringLiteral("</p>");
    }
    if (details.empty())
        html = QStringLiteral("<p><i>This result has no details.</i></p>");
    details_->setHtml(html);
}

QList<QWidget*> ResultDetailsPane::TabOrder() const {
    return {copy_, details_};
}

void ResultDetailsPane::ShowGroup(const QString& title, const QIcon& icon, const QString& counts) {
    ShowResult(nullptr);
    icon_->setPixmap(icon.isNull() ? QPixmap() : icon.pixmap(16, 16));
    summary_->setText(title);
    kind_->setText(counts);
    details_->setHtml(QStringLiteral("<p><i>Open the group to see its results.</i></p>"));
}

void ResultDetailsPane::CopyResult() const {
    if (result_)
        QApplication::clipboard()->setText(ResultText(*result_));
}

QString ResultDetailsPane::ResultText(const Result& result) {
    return FromSuiteText(ResultsReport::ResultText(result, "\n"));
}

QString ResultDetailsPane::ContainingFolder(const QString& detail) {
    QString path = detail;
    path.remove(DetailLabel());
    path = QDir::fromNativeSeparators(path.trimmed());
    if (path.isEmpty() || !QDir::isAbsolutePath(path))
        return {};
    const QFileInfo named(path);
    const QString folder = named.isDir() ? named.absoluteFilePath() : named.absolutePath();
    if (!QFileInfo(folder).isDir())
        return {};
    return QDir::toNativeSeparators(QDir::cleanPath(folder));
}

void ResultDetailsPane::LinkActivated(const QUrl& link) {
    if (!result_)
        return;
    if (link.toString() == kHelpLink) {
        emit HelpRequested(result_);
        return;
    }
    if (link.scheme() == kFolderLink) {
        bool ok = false;
        const int line = link.path().toInt(&ok);
        if (ok && line >= 0 && line < folders_.size() && !folders_[line].isEmpty())
            emit OpenFolderRequested(folders_[line]);
    }
}

}  // namespace vtr
