// vantori-verifier: the Verifier's window.
//
//   vantori-verifier [--registry FILE] [TARGET]
//
// --registry names the settings store to use (a registry-export file), as for the command
// line; TARGET, a show (.lss) or sequence (.las, .lms) file, is filled in as the target.
#include <QApplication>
#include <QCommandLineParser>
#include <QMessageBox>
#include <exception>
#include <optional>

#include "UiText.h"
#include "VtrVersion.h"
#include "engine/VtrError.h"
#include "environment/RegistryStore.h"
#include "frmVerifier.h"

int main(int argc, char** argv) {
    QApplication application(argc, argv);
    QApplication::setOrganizationName(QStringLiteral("Vantori"));
    QApplication::setApplicationName(QStringLiteral("vantori-verifier"));
    QApplication::setApplicationDisplayName(QStringLiteral("Vantori Verifier"));
    QApplication::setApplicationVersion(QString::fromLatin1(vtr::kVersionText));

    QCommandLineParser parser;
    parser.setApplicationDescription(
        QStringLiteral("Verifies a Vantori show-lighting installation before the show runs."));
    parser.addHelpOption();
    parser.addVersionOption();
    const QCommandLineOption registry(
        QStringList{QStringLiteral("registry")},
        QStringLiteral("The settings store to use: a registry-export file."),
        QStringLiteral("FILE"));
    parser.addOption(registry);
    parser.addPositionalArgument(QStringLiteral("target"),
                                 QStringLiteral("A show (.lss) or sequence (.las, .lms) file to "
                                                "verify."),
                                 QStringLiteral("[TARGET]"));
    parser.process(application);

    try {
        // The store is chosen before anything reads a setting.
        std::optional<std::string> store;
        if (parser.isSet(registry))
            store = vtr::ToSuiteText(parser.value(registry));
        vtr::RegistryStore::Select(store);

        vtr::frmVerifier window;
        const QStringList targets = parser.positionalArguments();
        if (!targets.isEmpty() && !window.SetTargetFile(targets.constFirst())) {
            QMessageBox::critical(&window, QStringLiteral("Verifier Error"),
                                  QStringLiteral("%1 is neither a show nor a sequence file.")
                                      .arg(targets.constFirst()));
        }
        window.show();
        return application.exec();
    } catch (const vtr::VtrError& error) {
        QMessageBox::critical(nullptr, QStringLiteral("Verifier Error"),
                              vtr::FromSuiteText(error.Description()));
    } catch (const std::exception& error) {
        QMessageBox::critical(nullptr, QStringLiteral("Verifier Error"),
                              vtr::FromSuiteText(error.what()));
    }
    return 1;
}
