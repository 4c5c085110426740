#include "DialogPresenter.h"

#include <QDesktopServices>
#include <QDir>
#include <QFileDialog>
#include <QFileInfo>
#include <QMessageBox>
#include <QUrl>

namespace vtr {

QString FilterText(const FileFilter& filter) {
    const QString patterns = filter.patterns.join(QLatin1Char(' '));
    if (patterns.isEmpty() ||
        filter.description.endsWith(QLatin1Char('(') + patterns + QLatin1Char(')')))
        return filter.description;
    return filter.description + QStringLiteral(" (") + patterns + QLatin1Char(')');
}

QList<FileFilter> ParseFilterList(const QString& notation) {
    QList<FileFilter> filters;
    const QStringList parts = notation.split(QLatin1Char('|'));
    for (qsizetype i = 0; i + 1 < parts.size(); i += 2) {
        FileFilter filter;
        filter.description = parts[i];
        for (const QString& pattern : parts[i + 1].split(QLatin1Char(';'), Qt::SkipEmptyParts))
            filter.patterns.append(pattern.trimmed());
        filters.append(filter);
    }
    return filters;
}

void QtDialogPresenter::ShowError(QWidget* parent, const QString& title, const QString& text) {
    QMessageBox::critical(parent, title, text);
}

bool QtDialogPresenter::OpenFolder(QWidget*, const QString& folder) {
    return QDesktopServices::openUrl(QUrl::fromLocalFile(folder));
}

namespace {

// Why a chosen file cannot be taken, or an empty text when it can.
QString RefusalReason(const FileDialogRequest& request, const QString& path) {
    const QFileInfo info(path);
    if (request.pathMustExist && !info.absoluteDir().exists())
        return QStringLiteral("The folder of %1 does not exist.")
            .arg(QDir::toNativeSeparators(path));
    if (request.fileMustExist && !info.isFile())
        return QStringLiteral("%1 does not exist.").arg(QDir::toNativeSeparators(path));
    if (request.refuseReadOnlyFile && info.exists() && !info.isWritable())
        return QStringLiteral("%1 is read-only.\nChoose another file.")
            .arg(QDir::toNativeSeparators(path));
    return {};
}

}  // namespace

std::optional<QString> QtDialogPresenter::ChooseFile(QWidget* parent,
                                                     const FileDialogRequest& request) {
    QStringList filters;
    for (const FileFilter& filter : request.filters)
        filters.append(FilterText(filter));
    QString folder = request.initialFolder;
    QString fileName = request.fileName;
    for (;;) {
        QFileDialog dialog(parent, request.title, folder);
        dialog.setNameFilters(filters);
        if (request.filterIndex >= 1 && request.filterIndex <= filters.size())
            dialog.selectNameFilter(filters[request.filterIndex - 1]);
        if (request.kind == FileDialogRequest::Kind::Save) {
            dialog.setAcceptMode(QFileDialog::AcceptSave);
            dialog.setFileMode(QFileDialog::AnyFile);
            dialog.setDefaultSuffix(request.defaultExtension);
            // A name typed without an extension gets the one of the type chosen.
            QObject::connect(
                &dialog, &QFileDialog::filterSelected, &dialog,
                [&dialog, &request](const QString& chosen) {
                    for (const FileFilter& filter : request.filters) {
                        if (FilterText(filter) == chosen && !filter.patterns.isEmpty() &&
                            filter.patterns.constFirst().startsWith(QStringLiteral("*.")))
                            dialog.setDefaultSuffix(filter.patterns.constFirst().mid(2));
                    }
                });
            dialog.setOption(QFileDialog::DontConfirmOverwrite, !request.promptToOverwrite);
        } else {
            dialog.setAcceptMode(QFileDialog::AcceptOpen);
            dialog.setFileMode(request.fileMustExist ? QFileDialog::ExistingFile
                                                     : QFileDialog::AnyFile);
        }
        if (!fileName.isEmpty())
            dialog.selectFile(fileName);
        if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
            return std::nullopt;
        const QString chosen = dialog.selectedFiles().constFirst();
        const QString refusal = RefusalReason(request, chosen);
        if (refusal.isEmpty())
            return QDir::toNativeSeparators(chosen);
        // As the system dialogs do: say why, and ask again where the user was.
        QMessageBox::warning(parent, request.title, refusal);
        folder = QFileInfo(chosen).absolutePath();
        fileName = QFileInfo(chosen).fileName();
    }
}

}  // namespace vtr
