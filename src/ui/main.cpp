// vantori-verifier: the Verifier's window.
//
//   vantori-verifier [--registry FILE] [TARGET]
//
// --registry names the settings store to use (a registry-export file), as for the command
// line; TARGET, a show (.lss) or sequence (.las, .lms) file, is filled in as the target.
#include <QApplication>
#include <QCommandLineOption>
#include <QCommandLineParser>
#include <QMessageBox>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <optional>

#ifdef _WIN32
#ifndef NOMINMAX
#define NOMINMAX
#endif
#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#include <io.h>
#include <windows.h>
#endif

#include "UiText.h"
#include "VtrVersion.h"
#include "engine/AllocatorSettings.h"
#include "engine/VtrError.h"
#include "environment/RegistryStore.h"
#include "frmVerifier.h"

namespace {

// The program's options and arguments, the same for both readings of the command line.
struct CommandLine {
    QCommandLineParser parser;
    QCommandLineOption help;
    QCommandLineOption version;
    QCommandLineOption registry{
        QStringList{QStringLiteral("registry")},
        QStringLiteral("The settings store to use: a registry-export file."),
        QStringLiteral("FILE")};

    CommandLine() : help(parser.addHelpOption()), version(parser.addVersionOption()) {
        parser.setApplicationDescription(
            QStringLiteral("Verifies a Vantori show-lighting installation before the show runs."));
        parser.addOption(registry);
        parser.addPositionalArgument(QStringLiteral("target"),
                                     QStringLiteral("A show (.lss) or sequence (.las, .lms) file "
                                                    "to verify."),
                                     QStringLiteral("[TARGET]"));
    }
};

void SetApplicationNames() {
    QCoreApplication::setOrganizationName(QStringLiteral("Vantori"));
    QCoreApplication::setApplicationName(QStringLiteral("vantori-verifier"));
    QCoreApplication::setApplicationVersion(QString::fromLatin1(vtr::kVersionText));
}

#ifdef _WIN32
// Whether a standard stream already goes somewhere that shows or keeps what is written: a
// file or a pipe it was redirected to, or a console the program has (under Wine, started
// from a terminal).
bool GoesSomewhere(FILE* stream) {
    const int descriptor = _fileno(stream);
    if (descriptor < 0)
        return false;
    const auto handle = reinterpret_cast<HANDLE>(_get_osfhandle(descriptor));
    if (handle == nullptr || handle == INVALID_HANDLE_VALUE)
        return false;
    const DWORD type = GetFileType(handle);
    return type == FILE_TYPE_DISK || type == FILE_TYPE_PIPE || type == FILE_TYPE_CHAR;
}
#endif

// Whether the answers to --help and --version can be printed where the user sees them. The
// window is a Windows GUI program, which has no console of its own: its answers go to the
// file or pipe its output was redirected to, else to the console of the command prompt it
// was started from (the standard streams that go nowhere are reopened on it).
// Started from neither (from the Start menu, say), they cannot.
bool CanPrintAnswers() {
#ifdef _WIN32
    const bool output = GoesSomewhere(stdout);
    const bool errors = GoesSomewhere(stderr);
    bool printable = output;
    if (!(output && errors) && AttachConsole(ATTACH_PARENT_PROCESS)) {
        if (!output)
            printable = std::freopen("CONOUT$", "w", stdout) != nullptr;
        if (!errors)
            static_cast<void>(std::freopen("CONOUT$", "w", stderr));
    }
    return printable;
#else
    return true;
#endif
}

// --help and --version are answered without a window system, so that they work where there
// is no display (a terminal on a server, a build machine): the first reading happens before
// the window's application exists, and ends the program when either is asked for. Where
// nothing can be printed, Qt shows the answer in a message box.
void AnswerHelpAndVersion(int argc, char** argv) {
    QCoreApplication application(argc, argv);
    CommandLine commandLine;
    // Errors (and the window system's own options) are left to the second reading.
    commandLine.parser.parse(QCoreApplication::arguments());
    const bool help = commandLine.parser.isSet(commandLine.help);
    const bool version = commandLine.parser.isSet(commandLine.version);
    if (!help && !version)
        return;
    if (!CanPrintAnswers()) {
        if (help)
            commandLine.parser.showHelp(0);
        commandLine.parser.showVersion();
    }
    const QString answer = help ? commandLine.parser.helpText()
                                : QCoreApplication::applicationName() + QLatin1Char(' ') +
                                      QCoreApplication::applicationVersion() + QLatin1Char('\n');
    std::fputs(answer.toLocal8Bit().constData(), stdout);
    std::fflush(stdout);
    std::exit(0);
}

// Where the window would open on X11 or Wayland, with neither a display named nor another
// platform chosen, the window system cannot start: say so and how to verify without a
// window, instead of the window system's own abort. Elsewhere (Windows, macOS) there is
// always a desktop.
bool NoDisplayToOpenOn(int argc, char** argv) {
#if defined(Q_OS_UNIX) && !defined(Q_OS_MACOS)
    for (const char* name : {"QT_QPA_PLATFORM", "DISPLAY", "WAYLAND_DISPLAY"}) {
        if (!qEnvironmentVariableIsEmpty(name))
            return false;
    }
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "-platform") == 0 || std::strcmp(argv[i], "--platform") == 0)
            return false;
    }
    return true;
#else
    Q_UNUSED(argc);
    Q_UNUSED(argv);
    return false;
#endif
}

}  // namespace

int main(int argc, char** argv) {
    vtr::SettleAllocator();
    SetApplicationNames();
    AnswerHelpAndVersion(argc, argv);
    if (NoDisplayToOpenOn(argc, argv)) {
        std::fputs(
            "vantori-verifier: there is no display to open the window on (neither DISPLAY "
            "nor WAYLAND_DISPLAY is set).\nOn a terminal, vantori-verify verifies the "
            "same installation without a window.\n",
            stderr);
        return 3;
    }

    QApplication application(argc, argv);
    QApplication::setApplicationDisplayName(QStringLiteral("Vantori Verifier"));
    CommandLine commandLine;
    commandLine.parser.process(application);
    const QCommandLineParser& parser = commandLine.parser;

    try {
        // The store is chosen before anything reads a setting.
        std::optional<std::string> store;
        if (parser.isSet(commandLine.registry))
            store = vtr::ToSuiteText(parser.value(commandLine.registry));
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
    } catch (...) {
        QMessageBox::critical(nullptr, QStringLiteral("Verifier Error"),
                              vtr::FromSuiteText(vtr::DescribeException(std::current_exception())));
    }
    return 1;
}
