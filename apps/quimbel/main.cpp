// SPDX-License-Identifier: MIT
// quimbel: the add-in's batch features from the command line.
#include "cli.h"
#include "ide/error.h"

#include <CLI/CLI.hpp>

#include <QCoreApplication>

#include <iostream>

namespace cli {

void printLine(const QString& text) {
  const QByteArray bytes = text.toLocal8Bit();
  std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stdout);
  std::fputc('\n', stdout);
}

void printError(const QString& text) {
  const QByteArray bytes = (QStringLiteral("quimbel: ") + text).toLocal8Bit();
  std::fwrite(bytes.constData(), 1, static_cast<size_t>(bytes.size()), stderr);
  std::fputc('\n', stderr);
}

namespace {

QStringList toQStrings(const std::vector<std::string>& values) {
  QStringList list;
  for (const std::string& value : values)
    list << QString::fromLocal8Bit(value);
  return list;
}

}  // namespace
}  // namespace cli

int main(int argc, char** argv) {
  QCoreApplication app(argc, argv);
  CLI::App parser{
      "quimbel: the Quimbel add-in's batch features for VB6 projects.\n\n"
      "Exit codes: 0 done, 1 --check found changes, 2 bad command line, 3 unreadable or invalid\n"
      "input, 4 a file could not be written (what was on disk is kept)."};
  parser.require_subcommand(1);

  std::vector<std::string> listFiles;
  bool tsv = false;
  CLI::App* list = parser.add_subcommand("list",
                                         "Show how the tool reads a group, project or module file: "
                                         "components, members and every procedure's extent.");
  list->add_option("files", listFiles, "Group (.vbg), project (.vbp) or module files")->required();
  list->add_flag("--tsv", tsv, "One tab-separated row per component and per procedure, for scripts");

  try {
    parser.parse(argc, argv);
  } catch (const CLI::CallForHelp&) {
    std::cout << parser.help();
    return cli::kSuccess;
  } catch (const CLI::ParseError& error) {
    std::cerr << "quimbel: " << error.what() << "\n"
              << "Run 'quimbel --help' for usage.\n";
    return cli::kUsageError;
  }

  try {
    if (list->parsed()) return cli::runList({cli::toQStrings(listFiles), tsv});
  } catch (const ide::Error& error) {
    cli::printError(error.description());
    return error.number() == 75 ? cli::kOutputError : cli::kInputError;
  }
  return cli::kUsageError;
}
