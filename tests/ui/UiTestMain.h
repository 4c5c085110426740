#pragma once

#include <QApplication>
#include <QTemporaryDir>
#include <QtTest>

// The main of a window test program: before the application starts, Qt's per-user folders
// (configuration, cache, run time) point into a temporary folder of the test's own, so that
// nothing of the machine's user settings is read and nothing is left behind; the offscreen
// platform is used unless another is named.
#define VTR_UI_TEST_MAIN(TestClass)                                                     \
    int main(int argc, char** argv) {                                                   \
        QTemporaryDir home;                                                             \
        if (!home.isValid())                                                            \
            return 2;                                                                   \
        for (const char* name :                                                         \
             {"XDG_CONFIG_HOME", "XDG_CACHE_HOME", "XDG_DATA_HOME", "XDG_RUNTIME_DIR"}) \
            qputenv(name, home.filePath(QString::fromLatin1(name)).toLocal8Bit());      \
        QDir(home.path()).mkdir(QStringLiteral("XDG_RUNTIME_DIR"));                     \
        QFile::setPermissions(                                                          \
            home.filePath(QStringLiteral("XDG_RUNTIME_DIR")),                           \
            QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);  \
        if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))                             \
            qputenv("QT_QPA_PLATFORM", "offscreen");                                    \
        QApplication application(argc, argv);                                           \
        TestClass test;                                                                 \
        return QTest::qExec(&test, argc, argv);                                         \
    }
