// The help file reader, the help viewer and the help of the window away from Windows.
#include <QBuffer>
#include <QImage>
#include <QPixmap>
#include <QProcess>
#include <QStandardPaths>
#include <QTextBlock>
#include <QTextDocument>
#include <QtTest>
#include <filesystem>
#include <fstream>

#include "ChmHelpFile.h"
#include "ChmWriter.h"
#include "HelpProvider.h"
#include "HelpViewer.h"
#include "UiTestMain.h"
#include "engine/VtrError.h"
#include "support/TempStore.h"

using vtr::ChmHelpFile;
using vtr::HelpBrowser;
using vtr::HelpViewer;
using vtr::VtrError;
using vtr::testsupport::ChmContent;
using vtr::testsupport::TempFolder;
using vtr::testsupport::WriteChm;

namespace {

// A real picture, two by two pixels.
std::string Picture() {
    QImage image(2, 2, QImage::Format_RGB32);
    image.fill(Qt::blue);
    QByteArray bytes;
    QBuffer buffer(&bytes);
    buffer.open(QIODevice::WriteOnly);
    image.save(&buffer, "PNG");
    return bytes.toStdString();
}
const std::string kPicture = Picture();

// A small help file: the verifier's page, a message page, a page in a sub-folder that
// links back and shows a picture, and a context map with three ids.
ChmContent SampleHelp() {
    ChmContent content;
    content.title = "Vantori Verifier Help";
    content.defaultTopic = "Verifier.htm";
    content.files = {
        {"/Verifier.htm", "<html><body><h1>The Verifier</h1></body></html>"},
        {"/msg23.htm",
         "<html><head><link rel=\"stylesheet\" type=\"text/css\" href=\"pics/help.css\">"
         "</head><body><h1>Sequence file does not exist</h1></body></html>"},
        {"/pics/help.css", "h1 { color: #ff0000; }"},
        {"/msgs/msg49.htm",
         "<html><body><h1>Intensity file conflict</h1><a href=\"../msg23.htm\">see 23</a>"
         "<img src=\"../pics/dot.png\"></body></html>"},
        {"/pics/dot.png", kPicture},
    };
    content.contextMap = {{23, "msg23.htm"}, {49, "msgs\\msg49.htm#cause"}, {47, "gone.htm"}};
    return content;
}

std::string WriteSample(const TempFolder& folder, const ChmContent& content,
                        const std::string& name = "VTRHelp.chm") {
    const std::string path = folder.File(name);
    WriteChm(path, content);
    return path;
}

QString ErrorOf(const std::function<void()>& step) {
    try {
        step();
    } catch (const VtrError& error) {
        return QString::fromStdString(error.Description());
    }
    return QString();
}

}  // namespace

class ChmHelpTest : public QObject {
    Q_OBJECT

  private slots:
    void readsPagesAndSystemTable();
    void mapsContextIdsToPages();
    void mapEntriesWithACompilersProjectPathStillResolve();
    void malformedOrMissingMapsGiveNothing();
    void refusesFilesThatAreNotHelpFiles();
    void agreesWithTheFreePascalHelpCompiler();
    void browserServesOnlyTheHelpFile();
    void browserDecodesPagesByTheirDeclaredEncoding();
    void viewerFollowsRelativeLinksAndHistory();
    void providerOpensContextOrVerifierPage();
    void providerReportsWhatItCannotShow();
};

void ChmHelpTest::readsPagesAndSystemTable() {
    TempFolder folder;
    const ChmHelpFile file(WriteSample(folder, SampleHelp()));
    QCOMPARE(file.Title(), std::string("Vantori Verifier Help"));
    QCOMPARE(file.DefaultTopic(), std::string("Verifier.htm"));
    QCOMPARE(file.ReadPage("pics/dot.png").value(), kPicture);
    // Any spelling of the name: letter case, separators, a leading "./" or "/", an anchor.
    QCOMPARE(file.FindPage("VERIFIER.HTM").value(), std::string("/Verifier.htm"));
    QCOMPARE(file.FindPage("msgs\\msg49.htm").value(), std::string("/msgs/msg49.htm"));
    QCOMPARE(file.FindPage("./msg23.htm#top").value(), std::string("/msg23.htm"));
    QVERIFY(!file.FindPage("missing.htm"));
    QVERIFY(!file.FindPage(""));
    QVERIFY(!file.ReadPage("/"));
    // The pages only: no internal tables, no folders.
    std::vector<std::string> pages = file.Pages();
    std::sort(pages.begin(), pages.end());
    QCOMPARE(pages, (std::vector<std::string>{"/Verifier.htm", "/msg23.htm", "/msgs/msg49.htm",
                                              "/pics/dot.png", "/pics/help.css"}));
}

void ChmHelpTest::mapsContextIdsToPages() {
    TempFolder folder;
    const ChmHelpFile file(WriteSample(folder, SampleHelp()));
    QCOMPARE(file.PageForContext(23).value(), std::string("/msg23.htm"));
    // The anchor of the map entry is kept; backslashes are folder separators.
    QCOMPARE(file.PageForContext(49).value(), std::string("/msgs/msg49.htm#cause"));
    // An id whose page is not in the file, and an id that is not in the map.
    QVERIFY(!file.PageForContext(47));
    QVERIFY(!file.PageForContext(48));
    QVERIFY(!file.PageForContext(-1));
}

void ChmHelpTest::mapEntriesWithACompilersProjectPathStillResolve() {
    TempFolder folder;
    ChmContent content = SampleHelp();
    content.contextMap = {{23, "/home/writer/project/help/msg23.htm"},
                          {49, "C:\\Help Project\\msgs\\msg49.htm"},
                          {50, "VTRHelp.chm::/msg23.htm"},
                          {51, "/home/writer/project/nothing.htm"}};
    const ChmHelpFile file(WriteSample(folder, content));
    QCOMPARE(file.PageForContext(23).value(), std::string("/msg23.htm"));
    QCOMPARE(file.PageForContext(49).value(), std::string("/msgs/msg49.htm"));
    QCOMPARE(file.PageForContext(50).value(), std::string("/msg23.htm"));
    QVERIFY(!file.PageForContext(51));
}

void ChmHelpTest::malformedOrMissingMapsGiveNothing() {
    TempFolder folder;
    ChmContent noMap = SampleHelp();
    noMap.writeContextMap = false;
    QVERIFY(!ChmHelpFile(WriteSample(folder, noMap, "nomap.chm")).PageForContext(23));

    // A length field claiming more than the map holds: the pairs that are there count.
    ChmContent longClaim = SampleHelp();
    longClaim.declaredMapLength = 4000;
    const ChmHelpFile claimed(WriteSample(folder, longClaim, "claim.chm"));
    QCOMPARE(claimed.PageForContext(49).value(), std::string("/msgs/msg49.htm#cause"));

    // A length field claiming less: only the pairs inside it count.
    ChmContent shortClaim = SampleHelp();
    shortClaim.declaredMapLength = 12;  // the first pair and half of the second
    const ChmHelpFile cut(WriteSample(folder, shortClaim, "cut.chm"));
    QCOMPARE(cut.PageForContext(23).value(), std::string("/msg23.htm"));
    QVERIFY(!cut.PageForContext(49));

    // A map entry with an empty page name.
    ChmContent emptyName = SampleHelp();
    emptyName.contextMap = {{23, ""}};
    QVERIFY(!ChmHelpFile(WriteSample(folder, emptyName, "empty.chm")).PageForContext(23));
}

void ChmHelpTest::refusesFilesThatAreNotHelpFiles() {
    TempFolder folder;
    const std::string missing = folder.File("VTRHelp.chm");
    QCOMPARE(ErrorOf([&] { ChmHelpFile file(missing); }),
             QString::fromStdString("Cannot open the help file " + missing));
    const std::string text = folder.File("text.chm");
    std::ofstream(text) << "this is not a compiled help file, only some text in a file";
    QCOMPARE(ErrorOf([&] { ChmHelpFile file(text); }),
             QString::fromStdString("Cannot open the help file " + text));
}

// A help file made by a real help compiler, when one is installed: its pages are
// compressed and its context map names pages by the compiler's full project path.
void ChmHelpTest::agreesWithTheFreePascalHelpCompiler() {
    const QString compiler = QStandardPaths::findExecutable(QStringLiteral("chmcmd"));
    if (compiler.isEmpty())
        QSKIP("no help compiler (chmcmd) installed");
    TempFolder folder;
    const std::filesystem::path project(folder.Path());
    std::filesystem::create_directories(project / "msgs");
    std::ofstream(project / "Verifier.htm") << "<html><body><h1>The Verifier</h1></body></html>";
    std::ofstream(project / "msg23.htm") << "<html><body><h1>Message 23</h1></body></html>";
    std::ofstream(project / "msgs" / "msg49.htm")
        << "<html><body><h1>Message 49</h1></body></html>";
    std::ofstream(project / "help.hhp") << "[OPTIONS]\nCompiled file=VTRHelp.chm\n"
                                           "Default topic=Verifier.htm\nTitle=Compiled Help\n\n"
                                           "[FILES]\nVerifier.htm\nmsg23.htm\nmsgs/msg49.htm\n\n"
                                           "[ALIAS]\nIDH_23=msg23.htm\nIDH_49=msgs/msg49.htm\n\n"
                                           "[MAP]\n#define IDH_23 23\n#define IDH_49 49\n";
    QProcess run;
    run.setWorkingDirectory(QString::fromStdString(folder.Path()));
    run.start(compiler, {QStringLiteral("help.hhp")});
    QVERIFY(run.waitForFinished(60000));
    const std::string path = (project / "VTRHelp.chm").string();
    QVERIFY2(std::filesystem::exists(path), run.readAllStandardOutput().constData());

    const ChmHelpFile file(path);
    QCOMPARE(file.Title(), std::string("Compiled Help"));
    QCOMPARE(file.PageForContext(23).value(), std::string("/msg23.htm"));
    QCOMPARE(file.PageForContext(49).value(), std::string("/msgs/msg49.htm"));
    QVERIFY(!file.PageForContext(24));
    QCOMPARE(file.ReadPage("msgs/msg49.htm").value(),
             std::string("<html><body><h1>Message 49</h1></body></html>"));
}

void ChmHelpTest::browserServesOnlyTheHelpFile() {
    TempFolder folder;
    auto file = std::make_shared<const ChmHelpFile>(WriteSample(folder, SampleHelp()));
    HelpBrowser browser;
    // Nothing at all before a help file is given.
    QVERIFY(
        !browser.loadResource(QTextDocument::HtmlResource, HelpBrowser::PageUrl("/Verifier.htm"))
             .isValid());
    browser.SetHelpFile(file);
    QCOMPARE(HelpBrowser::PageUrl("/msgs/msg49.htm#cause").toString(),
             QStringLiteral("vtrhelp:/msgs/msg49.htm#cause"));
    const QVariant page =
        browser.loadResource(QTextDocument::HtmlResource, HelpBrowser::PageUrl("/msg23.htm"));
    QCOMPARE(page.typeId(), QMetaType::QString);
    QVERIFY(page.toString().contains(QStringLiteral("Sequence file does not exist")));
    const QVariant picture =
        browser.loadResource(QTextDocument::ImageResource, HelpBrowser::PageUrl("/pics/dot.png"));
    QCOMPARE(picture.toByteArray(), QByteArray::fromStdString(kPicture));
    // A page that is not there, and anything outside the help file: no disk, no network.
    QVERIFY(!browser.loadResource(QTextDocument::HtmlResource, HelpBrowser::PageUrl("/no.htm"))
                 .isValid());
    const std::string outside = folder.File("outside.htm");
    std::ofstream(outside) << "<h1>outside</h1>";
    QVERIFY(!browser
                 .loadResource(QTextDocument::HtmlResource,
                               QUrl::fromLocalFile(QString::fromStdString(outside)))
                 .isValid());
    QVERIFY(
        !browser
             .loadResource(QTextDocument::HtmlResource, QUrl(QStringLiteral("https://x.invalid/")))
             .isValid());
}

void ChmHelpTest::browserDecodesPagesByTheirDeclaredEncoding() {
    // Declared Latin-1: the byte E9 is "é".
    QCOMPARE(HelpBrowser::DecodePage(QByteArray("<html><head><meta charset=\"ISO-8859-1\">"
                                                "</head><body>caf\xE9</body></html>")),
             QStringLiteral("<html><head><meta charset=\"ISO-8859-1\"></head><body>caf\u00e9"
                            "</body></html>"));
    // Undeclared, valid UTF-8.
    QCOMPARE(HelpBrowser::DecodePage(QByteArray("<p>caf\xC3\xA9</p>")),
             QStringLiteral("<p>caf\u00e9</p>"));
    // Declared in an encoding Qt does not know, or undeclared and not UTF-8: byte for byte.
    QCOMPARE(HelpBrowser::DecodePage(QByteArray("<meta charset=\"x-unknown\"><p>\xE9</p>")),
             QStringLiteral("<meta charset=\"x-unknown\"><p>\u00e9</p>"));
    QCOMPARE(HelpBrowser::DecodePage(QByteArray("<p>caf\xE9!</p>")),
             QStringLiteral("<p>caf\u00e9!</p>"));
}

void ChmHelpTest::viewerFollowsRelativeLinksAndHistory() {
    TempFolder folder;
    auto file = std::make_shared<const ChmHelpFile>(WriteSample(folder, SampleHelp()));
    HelpViewer viewer;
    viewer.ShowPage(file, "/msgs/msg49.htm#cause");
    QVERIFY(viewer.isVisible());
    QCOMPARE(viewer.windowTitle(), QStringLiteral("Vantori Verifier Help"));
    QCOMPARE(viewer.CurrentPage(), QStringLiteral("/msgs/msg49.htm"));
    QVERIFY(viewer.Browser()->toPlainText().contains(QStringLiteral("Intensity file conflict")));
    // The picture named relative to the page came from the help file.
    const QVariant picture = viewer.Browser()->document()->resource(
        QTextDocument::ImageResource, QUrl(QStringLiteral("vtrhelp:/pics/dot.png")));
    // The document keeps what it made of the bytes.
    QCOMPARE(picture.typeId(), QMetaType::QPixmap);
    const QImage image = picture.value<QPixmap>().toImage();
    QCOMPARE(image.size(), QSize(2, 2));
    QCOMPARE(image.pixelColor(1, 1), QColor(Qt::blue));

    // The link "../msg23.htm" leads to the page at the top of the file.
    emit viewer.Browser()->anchorClicked(QUrl(QStringLiteral("../msg23.htm")));
    QCOMPARE(viewer.CurrentPage(), QStringLiteral("/msg23.htm"));
    // Its style sheet came from the help file too.
    QCOMPARE(viewer.Browser()
                 ->document()
                 ->firstBlock()
                 .begin()
                 .fragment()
                 .charFormat()
                 .foreground()
                 .color(),
             QColor(255, 0, 0));
    QVERIFY(viewer.Browser()->isBackwardAvailable());
    viewer.Browser()->backward();
    QCOMPARE(viewer.CurrentPage(), QStringLiteral("/msgs/msg49.htm"));

    // A link outside the help file is not followed inside the viewer.
    emit viewer.Browser()->anchorClicked(QUrl(QStringLiteral("file:///etc/hostname")));
    QCOMPARE(viewer.CurrentPage(), QStringLiteral("/msgs/msg49.htm"));
}

void ChmHelpTest::providerOpensContextOrVerifierPage() {
    TempFolder folder;
    const std::string path = WriteSample(folder, SampleHelp());
    QWidget owner;
    std::unique_ptr<vtr::HelpProvider> help = vtr::CreateHelpProvider(&owner);
    help->Prepare(path);
    QCOMPARE(help->HelpFile(), path);

    help->ShowContext(23);
    auto* viewer = owner.findChild<HelpViewer*>(QStringLiteral("HelpViewer"));
    QVERIFY(viewer != nullptr);
    QVERIFY(viewer->isVisible());
    QCOMPARE(viewer->CurrentPage(), QStringLiteral("/msg23.htm"));
    // An id the file has no page for opens the verifier's own page, in the same window.
    help->ShowContext(7);
    QCOMPARE(viewer->CurrentPage(), QStringLiteral("/Verifier.htm"));
    help->ShowContext(47);
    QCOMPARE(viewer->CurrentPage(), QStringLiteral("/Verifier.htm"));
    help->ShowPage("msg23.htm");
    QCOMPARE(viewer->CurrentPage(), QStringLiteral("/msg23.htm"));
    QCOMPARE(owner.findChildren<HelpViewer*>().size(), 1);
}

void ChmHelpTest::providerReportsWhatItCannotShow() {
    TempFolder folder;
    QWidget owner;
    std::unique_ptr<vtr::HelpProvider> help = vtr::CreateHelpProvider(&owner);
    QCOMPARE(ErrorOf([&] { help->ShowContext(23); }),
             QStringLiteral("No help file has been prepared"));

    const std::string missing = folder.File("VTRHelp.chm");
    help->Prepare(missing);
    QCOMPARE(ErrorOf([&] { help->ShowContext(23); }),
             QString::fromStdString("Cannot open the help file " + missing));

    ChmContent withoutVerifierPage = SampleHelp();
    withoutVerifierPage.files.erase(withoutVerifierPage.files.begin());
    const std::string path = WriteSample(folder, withoutVerifierPage, "partial.chm");
    help->Prepare(path);
    help->ShowContext(23);  // still fine: the map has it
    QCOMPARE(ErrorOf([&] { help->ShowContext(7); }),
             QString::fromStdString("The help file " + path +
                                    " has no topic for help context 7 and no page Verifier.htm"));
    QCOMPARE(ErrorOf([&] { help->ShowPage("Verifier.htm"); }),
             QString::fromStdString("The help file " + path + " has no page Verifier.htm"));
}

VTR_UI_TEST_MAIN(ChmHelpTest)
#include "tst_ChmHelp.moc"
