#pragma once

#include <QTextBrowser>
#include <QUrl>
#include <QWidget>
#include <memory>
#include <string>

#include "ChmHelpFile.h"

class QAction;

namespace vtr {

// A text browser whose pages, pictures and style sheets all come from one compiled help
// file. Pages are addressed as "vtrhelp:/path/page.htm"; relative links resolve against
// the page that holds them. Nothing is read from the disk or the network.
class HelpBrowser : public QTextBrowser {
    Q_OBJECT
  public:
    static constexpr const char* kScheme = "vtrhelp";

    explicit HelpBrowser(QWidget* parent = nullptr);

    void SetHelpFile(std::shared_ptr<const ChmHelpFile> file);
    const std::shared_ptr<const ChmHelpFile>& HelpFile() const { return file_; }

    // The address of a page given by its archive path ("/a/b.htm#part").
    static QUrl PageUrl(const std::string& archivePath);
    // Page bytes as text: the encoding the page declares, else UTF-8 when the bytes are
    // valid UTF-8, else Latin-1.
    static QString DecodePage(const QByteArray& bytes);

    QVariant loadResource(int type, const QUrl& name) override;

  private:
    void FollowLink(const QUrl& link);

    std::shared_ptr<const ChmHelpFile> file_;
};

// The program's own help window: the help file's pages with back, forward and home. One
// window serves every request of its owner and is brought to the front for each.
class HelpViewer : public QWidget {
    Q_OBJECT
  public:
    explicit HelpViewer(QWidget* parent = nullptr);

    // Shows a page of the file (an archive path, "#anchor" allowed).
    void ShowPage(std::shared_ptr<const ChmHelpFile> file, const std::string& page);

    HelpBrowser* Browser() const { return browser_; }
    // The archive path of the page shown, without its anchor.
    QString CurrentPage() const;

  private:
    void GoHome();

    HelpBrowser* browser_;
    QAction* back_;
    QAction* forward_;
    QAction* home_;
};

}  // namespace vtr
