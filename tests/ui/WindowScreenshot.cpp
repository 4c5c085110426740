// Renders the window after verifying an installation and saves the picture, for the
// documentation: vtr-window-screenshot --registry STORE OUTPUT.png [--tab log|results|help]
// ("help" pictures the help window opened on the first result).
// The window's own settings go to a temporary file; the store is only read.
#include <QApplication>
#include <QCommandLineParser>
#include <QPixmap>
#include <QTabWidget>
#include <QTemporaryDir>
#include <QTimer>
#include <QTreeWidget>
#include <cstdio>

#ifndef _WIN32
#include "HelpViewer.h"
#endif
#include "environment/RegistryStore.h"
#include "frmVerifier.h"

int main(int argc, char** argv) {
    QApplication application(argc, argv);
    QCommandLineParser parser;
    const QCommandLineOption registry(QStringLiteral("registry"), QStringLiteral("Settings store."),
                                      QStringLiteral("FILE"));
    const QCommandLineOption tab(QStringLiteral("tab"), QStringLiteral("log, results or help."),
                                 QStringLiteral("TAB"), QStringLiteral("results"));
    parser.addOption(registry);
    parser.addOption(tab);
    parser.addPositionalArgument(QStringLiteral("output"), QStringLiteral("The PNG to write."));
    parser.process(application);
    if (!parser.isSet(registry) || parser.positionalArguments().size() != 1) {
        std::fprintf(stderr, "usage: vtr-window-screenshot --registry STORE OUTPUT.png\n");
        return 64;
    }
    vtr::RegistryStore::Select(parser.value(registry).toStdString());

    QTemporaryDir settings;
    vtr::frmVerifier::Options options;
    options.settingsFile = settings.filePath(QStringLiteral("window.ini"));
    vtr::frmVerifier window(std::move(options));
    window.resize(1040, 700);
    window.show();
    int status = 1;
    QTimer::singleShot(200, &window, [&] {
        window.Verify();
        auto* tabs = window.findChild<QTabWidget*>(QStringLiteral("sstDetails"));
        if (parser.value(tab) == QLatin1String("log")) {
            tabs->setCurrentIndex(vtr::frmVerifier::OutputLogTab);
        } else {
            auto* results = window.findChild<QTreeWidget*>(QStringLiteral("lvResults1"));
            if (results->topLevelItemCount() > 0)
                results->setCurrentItem(results->topLevelItem(0));
            results->setFocus();
        }
        QWidget* shown = &window;
#ifndef _WIN32
        if (parser.value(tab) == QLatin1String("help")) {
            window.Help();
            if (auto* viewer = window.findChild<vtr::HelpViewer*>(QStringLiteral("HelpViewer"))) {
                viewer->resize(640, 420);
                shown = viewer;
            }
        }
#endif
        QTimer::singleShot(300, &window, [&, shown] {
            status = shown->grab().save(parser.positionalArguments().constFirst()) ? 0 : 1;
            application.quit();
        });
    });
    application.exec();
    return status;
}
