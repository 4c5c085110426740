#pragma once

#include <QList>
#include <QString>
#include <QStringList>
#include <optional>

class QWidget;

namespace vtr {

// One entry of a file dialog's type list: its text and the patterns it selects.
struct FileFilter {
    QString description;   // "Vantori Sequence Files"
    QStringList patterns;  // "*.las", "*.lms"

    bool operator==(const FileFilter&) const = default;
};

// Everything a file dialog of the window shows and allows.
struct FileDialogRequest {
    enum class Kind { Open, Save };
    Kind kind = Kind::Open;
    QString title;
    QString initialFolder;     // empty: the dialog's own choice
    QString fileName;          // the initial file name, empty for none
    QString defaultExtension;  // added to a typed name without one (save dialogs)
    QList<FileFilter> filters;
    int filterIndex = 1;  // the entry selected first, counted from 1
    bool fileMustExist = false;
    bool pathMustExist = false;
    bool promptToOverwrite = false;
    bool hideReadOnlyBox = false;
    bool refuseReadOnlyFile = false;
};

// A filter in the dialog's own notation: "Text Files (*.txt)"; the patterns are added in
// parentheses unless the description already ends with them.
QString FilterText(const FileFilter& filter);
// Reads the "description|patterns|description|patterns" notation (patterns separated by
// ";"), as the report dialog's settings carry it.
QList<FileFilter> ParseFilterList(const QString& notation);

// What the window asks of the user outside its own controls: message boxes, file dialogs
// and the desktop's file manager. The window is given one; the program uses the Qt dialogs
// and the desktop's services, tests a recording one.
class DialogPresenter {
  public:
    virtual ~DialogPresenter() = default;
    // An error message box with that title and text and an OK button.
    virtual void ShowError(QWidget* parent, const QString& title, const QString& text) = 0;
    // A file dialog; the chosen path, or nothing when the user cancelled.
    virtual std::optional<QString> ChooseFile(QWidget* parent,
                                              const FileDialogRequest& request) = 0;
    // Shows a folder in the desktop's file manager; false when that cannot be done.
    virtual bool OpenFolder(QWidget* parent, const QString& folder) = 0;
};

// The real dialogs: QMessageBox and QFileDialog.
class QtDialogPresenter : public DialogPresenter {
  public:
    void ShowError(QWidget* parent, const QString& title, const QString& text) override;
    std::optional<QString> ChooseFile(QWidget* parent, const FileDialogRequest& request) override;
    bool OpenFolder(QWidget* parent, const QString& folder) override;
};

}  // namespace vtr
