// SPDX-License-Identifier: MIT
// quimbel-ide: the desktop IDE. Opens the files named on the command line, loads the Quimbel add-in (from
// beside the program, --addin or QUIMBEL_ADDIN), and with --script runs a script instead of waiting for a
// person.
#include "host/model/addins.h"
#include "host/model/vbe.h"
#include "idecommands.h"
#include "mainwindow.h"
#include "qtplatform.h"
#include "scriptrunner.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QDir>
#include <QFileInfo>
#include <QSettings>
#include <QStandardPaths>

#include <cstdio>
#include <string_view>

namespace {

QString configDirectory() {
  const QString overridden = qEnvironmentVariable("QUIMBEL_CONFIG_DIR");
  if (!overridden.isEmpty()) return overridden;
  return QStandardPaths::writableLocation(QStandardPaths::GenericConfigLocation) + QStringLiteral("/Quimbel");
}

/// The add-in of a build tree, in lib/ beside bin/.
QString builtAddInPath() {
  return QDir::cleanPath(QDir(QCoreApplication::applicationDirPath())
                             .absoluteFilePath(QStringLiteral("../lib/libquimbel-addin.so")));
}

QString defaultAddInPath() {
  const QString fromEnvironment = qEnvironmentVariable("QUIMBEL_ADDIN");
  if (!fromEnvironment.isEmpty()) return fromEnvironment;
  // Where the install put it, relative to the program so that the installation can be moved as a whole.
  const QString installed =
      QDir::cleanPath(QDir(QCoreApplication::applicationDirPath())
                          .absoluteFilePath(QStringLiteral(QUIMBEL_ADDIN_FROM_PROGRAM)));
  return QFileInfo::exists(installed) || !QFileInfo::exists(builtAddInPath()) ? installed : builtAddInPath();
}

/// A build tree has no machine-wide configuration installed; the add-in finds the build's own through the
/// variable it reads, unless the user set it.
void useBuildTreeConfiguration() {
  if (qEnvironmentVariableIsSet("QUIMBEL_MACHINE_CONFIG") || !QFileInfo::exists(builtAddInPath())) return;
  const QString config = QDir(QCoreApplication::applicationDirPath())
                             .absoluteFilePath(QStringLiteral("../etc/quimbel/quimbel.conf"));
  if (QFileInfo::exists(config)) qputenv("QUIMBEL_MACHINE_CONFIG", QDir::cleanPath(config).toLocal8Bit());
}

/// Window-system plugins without a window manager (offscreen, a bare X server) warn about every window hint
/// they cannot honour; those lines say nothing to the user of a scripted session and hide its output.
QtMessageHandler defaultMessageHandler = nullptr;
void filterPlatformNoise(QtMsgType type, const QMessageLogContext& context, const QString& message) {
  if (type == QtWarningMsg && message.startsWith(QLatin1StringView("This plugin does not support"))) return;
  defaultMessageHandler(type, context, message);
}

void setIdentity() {
  QCoreApplication::setApplicationName(QStringLiteral("Quimbel IDE"));
  QCoreApplication::setOrganizationName(QStringLiteral("Quimbel"));
  QCoreApplication::setApplicationVersion(QStringLiteral(QUIMBEL_VERSION));
}

struct CommandLine {
  QCommandLineParser parser;
  const QCommandLineOption script{
      QStringLiteral("script"),
      QStringLiteral("Run the session from a script, print every message box, and exit 0 when every "
                     "step passed."),
      QStringLiteral("file")};
  const QCommandLineOption addIn{
      QStringLiteral("addin"),
      QStringLiteral("The add-in library to load (default: $QUIMBEL_ADDIN, else the installed one)."),
      QStringLiteral("path")};
  const QCommandLineOption noAddIn{QStringLiteral("no-addin"), QStringLiteral("Start without the add-in.")};

  CommandLine() {
    parser.setApplicationDescription(
        QStringLiteral("The Quimbel desktop IDE for VB6 projects, with the Quimbel add-in loaded.\n"
                       "Settings: ~/.config/Quimbel ($QUIMBEL_CONFIG_DIR); the add-in's error log: "
                       "~/.local/share/Quimbel/errors.log ($QUIMBEL_DATA_DIR). See quimbel-ide(1)."));
    parser.addHelpOption();
    parser.addVersionOption();
    parser.addOptions({script, addIn, noAddIn});
    parser.addPositionalArgument(QStringLiteral("files"),
                                 QStringLiteral("Groups, projects or modules to open."),
                                 QStringLiteral("[files...]"));
  }
};

bool asksForHelpOrVersion(int argc, char** argv) {
  for (int i = 1; i < argc; ++i) {
    const std::string_view argument(argv[i]);
    if (argument == "--") break;
    for (const char* option : {"-h", "-?", "--help", "--help-all", "-v", "--version"})
      if (argument == option) return true;
  }
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  defaultMessageHandler = qInstallMessageHandler(filterPlatformNoise);
  // --help and --version answer without a window system, so that they work on a terminal with no display.
  if (asksForHelpOrVersion(argc, argv)) {
    QCoreApplication core(argc, argv);
    setIdentity();
    CommandLine line;
    line.parser.process(core);  // prints the answer and exits
  }
  QApplication app(argc, argv);
  setIdentity();
  // The desktop entry: window systems take the window's icon and name from it.
  QApplication::setDesktopFileName(QStringLiteral("quimbel-ide"));
  QApplication::setStyle(QStringLiteral("Fusion"));

  CommandLine line;
  QCommandLineParser& parser = line.parser;
  const QCommandLineOption &script = line.script, &addIn = line.addIn, &noAddIn = line.noAddIn;
  parser.process(app);
  const bool scripted = parser.isSet(script);

  auto ownedUi = std::make_unique<desktop::QtUserInterface>();
  desktop::QtUserInterface& ui = *ownedUi;
  ui.setOpenDocuments(!scripted);
  host::IdeOptions options;
  options.loop = std::make_unique<desktop::QtEventLoop>();
  options.ui = std::move(ownedUi);
  auto vbe = host::VbeImpl::create(std::move(options));

  int exitCode = 0;
  {
    desktop::MainWindowOptions windowOptions;
    // A script's session starts the same every time: it neither reads nor leaves remembered settings.
    if (!scripted) {
      QDir().mkpath(configDirectory());
      windowOptions.settingsPath = configDirectory() + QStringLiteral("/quimbel-ide.ini");
    } else {
      windowOptions.fitToScreen = false;
    }
    desktop::MainWindow window(vbe, ui, windowOptions);

    desktop::ScriptRunner runner(window, ui);
    if (scripted) {
      QString error;
      if (!runner.load(parser.value(script), &error)) {
        std::fprintf(stderr, "%s\n", qPrintable(error));
        return 2;
      }
    }

    useBuildTreeConfiguration();
    if (!parser.isSet(noAddIn)) {
      const QString path = parser.isSet(addIn) ? parser.value(addIn) : defaultAddInPath();
      if (!QFileInfo::exists(path)) {
        window.showStatus(QStringLiteral("The Quimbel add-in was not found at %1; the IDE runs without it.")
                              .arg(QDir::toNativeSeparators(QDir::cleanPath(path))));
      } else {
        try {
          auto registered = vbe->addIns().registerLibrary(path, true);
          if (QSettings* settings = window.settings())
            registered->setLoadOnStartup(
                settings->value(QStringLiteral("AddIns/") + registered->ProgId(), true).toBool());
        } catch (const ide::Error& error) {
          window.showStatus(QStringLiteral("The add-in was not loaded: %1").arg(error.description()));
        }
      }
    }

    for (const QString& file : parser.positionalArguments())
      window.commands().open(QFileInfo(file).absoluteFilePath(), false);

    window.show();
    window.activateWindow();
    window.raise();
    // A script runs from before the add-in starts: a message box it shows at start-up is the script's to
    // answer (or to fail on), like any other.
    if (scripted) {
      QObject::connect(&runner, &desktop::ScriptRunner::finished, &app,
                       [&exitCode](int code) { exitCode = code; });
      runner.setStarting(true);
      runner.start();
    }
    vbe->startup();
    runner.setStarting(false);
    window.restoreLayout();

    if (scripted) {
      if (!runner.isFinished()) app.exec();
      window.closeWithoutPrompt();
    } else {
      exitCode = app.exec();
    }
  }
  vbe.reset();
  return exitCode;
}
