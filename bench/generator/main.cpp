// SPDX-License-Identifier: MIT
// quimbel-gen: writes synthetic VB6 projects for benchmarks and reports what it wrote.
#include "generator.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDirIterator>
#include <QElapsedTimer>
#include <QFileInfo>
#include <QTextStream>

#include <exception>
#include <limits>

namespace {

// Reads a whole-number option within [minimum, maximum]; false (with a message) when it is not one.
bool readNumber(const QCommandLineParser& parser, const QString& name, qint64 minimum, qint64 maximum,
                qint64& value) {
  if (!parser.isSet(name)) return true;
  bool ok = false;
  const qint64 number = parser.value(name).toLongLong(&ok);
  if (!ok || number < minimum || number > maximum) {
    QTextStream(stderr) << "quimbel-gen: --" << name << " needs a whole number from " << minimum << " to "
                        << maximum << ", not \"" << parser.value(name) << "\"\n";
    return false;
  }
  value = number;
  return true;
}

qint64 directoryBytes(const QString& path) {
  qint64 total = 0;
  QDirIterator it(path, QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext())
    total += QFileInfo(it.next()).size();
  return total;
}

}  // namespace

int main(int argc, char** argv) {
  QCoreApplication app(argc, argv);
  QCoreApplication::setApplicationName("quimbel-gen");

  QCommandLineParser parser;
  parser.setApplicationDescription(
      "Writes synthetic VB6 projects (Windows-1252, CRLF) of a chosen size into OUTDIR.");
  parser.addHelpOption();
  parser.addOption({"lines", "Code lines over all components (default 1000000).", "N"});
  parser.addOption({"components", "Components over all projects (default 200).", "N"});
  parser.addOption({"projects", "Projects; more than one also writes Grupo.vbg (default 1).", "N"});
  parser.addOption({"seed", "Seed; the same seed gives the same files (default 1).", "S"});
  parser.addPositionalArgument("OUTDIR", "Directory to write into (created when missing).");
  parser.process(app);

  const QStringList positional = parser.positionalArguments();
  if (positional.size() != 1) {
    QTextStream(stderr) << "quimbel-gen: expected one OUTDIR\n\n" << parser.helpText();
    return 2;
  }

  gen::GeneratorOptions options;
  qint64 lines = options.codeLines, components = options.components, projects = options.projects,
         seed = options.seed;
  constexpr qint64 kIntMax = std::numeric_limits<int>::max();
  if (!readNumber(parser, "lines", 0, std::numeric_limits<qint64>::max(), lines) ||
      !readNumber(parser, "components", 1, kIntMax, components) ||
      !readNumber(parser, "projects", 1, kIntMax, projects) ||
      !readNumber(parser, "seed", 0, std::numeric_limits<quint32>::max(), seed)) {
    return 2;
  }
  options.codeLines = lines;
  options.components = int(components);
  options.projects = int(projects);
  options.seed = quint32(seed);

  QTextStream out(stdout);
  QElapsedTimer timer;
  timer.start();
  try {
    const gen::GeneratedGroup group = gen::generateProjects(positional.first(), options);
    const double seconds = timer.elapsed() / 1000.0;
    const QString root = QFileInfo(positional.first()).absoluteFilePath();
    out << "Wrote " << group.components << " components and " << group.codeLines << " code lines in "
        << QString::number(seconds, 'f', 2) << " s (seed " << options.seed << "); " << root << " holds "
        << QString::number(directoryBytes(root) / 1048576.0, 'f', 1) << " MB\n";
    if (!group.groupFile.isEmpty()) out << "  group    " << group.groupFile << "\n";
    for (const QString& project : group.projectFiles)
      out << "  project  " << project << "\n";
  } catch (const std::invalid_argument& error) {
    QTextStream(stderr) << "quimbel-gen: " << error.what() << "\n";
    return 2;
  } catch (const std::exception& error) {
    QTextStream(stderr) << "quimbel-gen: " << error.what() << "\n";
    return 1;
  }
  return 0;
}
