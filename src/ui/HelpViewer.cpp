#include "HelpViewer.h"

#include <QAction>
#include <QDesktopServices>
#include <QKeySequence>
#include <QStringConverter>
#include <QStringDecoder>
#include <QStyle>
#include <QTextDocument>
#include <QToolBar>
#include <QVBoxLayout>

#include "HelpProvider.h"

namespace vtr {

HelpBrowser::HelpBrowser(QWidget* parent) : QTextBrowser(parent) {
    setObjectName(QStringLiteral("helpBrowser"));
    // Links are followed here, so that only pages of the help file are ever loaded.
    setOpenLinks(false);
    setOpenExternalLinks(false);
    connect(this, &QTextBrowser::anchorClicked, this, &HelpBrowser::FollowLink);
}

void HelpBrowser::SetHelpFile(std::shared_ptr<const ChmHelpFile> file) {
    file_ = std::move(file);
}

QUrl HelpBrowser::PageUrl(const std::string& archivePath) {
    QString path = QString::fromStdString(archivePath);
    QString anchor;
    const qsizetype hash = path.indexOf(QLatin1Char('#'));
    if (hash >= 0) {
        anchor = path.mid(hash + 1);
        path.truncate(hash);
    }
    if (!path.startsWith(QLatin1Char('/')))
        path.prepend(QLatin1Char('/'));
    QUrl url;
    url.setScheme(QString::fromLatin1(kScheme));
    url.setPath(path);
    if (!anchor.isEmpty())
        url.setFragment(anchor);
    return url;
}

QString HelpBrowser::DecodePage(const QByteArray& bytes) {
    // Without a byte-order mark or a charset in the page, this answers UTF-8; a page that
    // names an encoding Qt does not know gives nothing.
    const std::optional<QStringConverter::Encoding> declared =
        QStringConverter::encodingForHtml(bytes);
    if (declared && *declared != QStringConverter::Utf8) {
        QStringDecoder decoder(*declared);
        return decoder.decode(bytes);
    }
    QStringDecoder utf8(QStringConverter::Utf8);
    QString text = utf8.decode(bytes);
    if (!utf8.hasError())
        return text;
    // Older help pages are in a single-byte code page.
    return QString::fromLatin1(bytes);
}

QVariant HelpBrowser::loadResource(int type, const QUrl& name) {
    if (!file_ || name.scheme() != QLatin1String(kScheme))
        return {};
    const std::optional<std::string> bytes = file_->ReadPage(name.path().toStdString());
    if (!bytes)
        return {};
    const QByteArray data(bytes->data(), static_cast<qsizetype>(bytes->size()));
    switch (type) {
        case QTextDocument::HtmlResource:
        case QTextDocument::StyleSheetResource:
            return DecodePage(data);
        default:
            return data;
    }
}

void HelpBrowser::FollowLink(const QUrl& link) {
    const QUrl target = source().resolved(link);
    if (target.scheme() == QLatin1String(kScheme)) {
        setSource(target);
    } else if (target.scheme() == QLatin1String("http") ||
               target.scheme() == QLatin1String("https") ||
               target.scheme() == QLatin1String("mailto")) {
        QDesktopServices::openUrl(target);
    }
}

HelpViewer::HelpViewer(QWidget* parent) : QWidget(parent, Qt::Window) {
    setObjectName(QStringLiteral("HelpViewer"));
    setWindowTitle(QStringLiteral("Vantori Verifier Help"));
    resize(720, 560);

    browser_ = new HelpBrowser(this);
    browser_->document()->setDocumentMargin(10);
    auto* toolBar = new QToolBar(this);
    toolBar->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    back_ =
        toolBar->addAction(style()->standardIcon(QStyle::SP_ArrowBack), QStringLiteral("&Back"));
    back_->setShortcut(QKeySequence::Back);
    back_->setEnabled(false);
    forward_ = toolBar->addAction(style()->standardIcon(QStyle::SP_ArrowForward),
                                  QStringLiteral("&Forward"));
    forward_->setShortcut(QKeySequence::Forward);
    forward_->setEnabled(false);
    home_ = toolBar->addAction(
        QIcon::fromTheme(QStringLiteral("go-home"), style()->standardIcon(QStyle::SP_DirHomeIcon)),
        QStringLiteral("&Home"));
    home_->setShortcut(QKeySequence(Qt::ALT | Qt::Key_Home));
    auto* close = new QAction(QStringLiteral("Close"), this);
    close->setShortcut(QKeySequence(Qt::Key_Escape));
    addAction(close);

    connect(back_, &QAction::triggered, browser_, &QTextBrowser::backward);
    connect(forward_, &QAction::triggered, browser_, &QTextBrowser::forward);
    connect(home_, &QAction::triggered, this, &HelpViewer::GoHome);
    connect(close, &QAction::triggered, this, &QWidget::close);
    connect(browser_, &QTextBrowser::backwardAvailable, back_, &QAction::setEnabled);
    connect(browser_, &QTextBrowser::forwardAvailable, forward_, &QAction::setEnabled);

    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    layout->addWidget(toolBar);
    layout->addWidget(browser_);
}

void HelpViewer::ShowPage(std::shared_ptr<const ChmHelpFile> file, const std::string& page) {
    const bool sameFile =
        browser_->HelpFile() && file && browser_->HelpFile()->Path() == file->Path();
    if (file && !file->Title().empty())
        setWindowTitle(QString::fromStdString(file->Title()));
    browser_->SetHelpFile(std::move(file));
    if (!sameFile)
        browser_->clearHistory();
    const QUrl url = HelpBrowser::PageUrl(page);
    if (url == browser_->source()) {
        browser_->reload();
    } else {
        browser_->setSource(url);
    }
    show();
    raise();
    activateWindow();
}

QString HelpViewer::CurrentPage() const {
    return browser_->source().path();
}

void HelpViewer::GoHome() {
    const std::shared_ptr<const ChmHelpFile>& file = browser_->HelpFile();
    if (!file)
        return;
    std::optional<std::string> page = file->FindPage(HelpProvider::kVerifierPage);
    if (!page && !file->DefaultTopic().empty())
        page = file->FindPage(file->DefaultTopic());
    if (page)
        browser_->setSource(HelpBrowser::PageUrl(*page));
}

}  // namespace vtr
