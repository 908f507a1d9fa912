// SPDX-License-Identifier: MIT
#include "addin/help.h"

#include <QFileInfo>

namespace addin {
namespace {

const char* pageOfContext(int context) {
  switch (context) {
    case 0:
      return "index.html";
    case 4:
      return "macros.html";
    case 5:
      return "memorias.html";
    case 11:
      return "novo-procedimento.html";
    case 16:
      return "palavras-reservadas.html";
    default:
      return nullptr;
  }
}

bool open(ide::UserInterface& ui, const QString& path) {
  // Checked first: a browser handed a missing file would still report that it started.
  return !path.isEmpty() && QFileInfo(path).isFile() && ui.openDocument(path);
}

}  // namespace

QString helpPagePath(const QString& installDir, int context) {
  const char* page = pageOfContext(context);
  if (!page) return {};
  return installDir + QStringLiteral("help/") + QLatin1StringView(page);
}

bool showHelpContents(ide::UserInterface& ui, const QString& installDir) {
  return open(ui, helpPagePath(installDir));
}

bool showHelpTopic(ide::UserInterface& ui, const QString& installDir, int context) {
  return open(ui, helpPagePath(installDir, context));
}

}  // namespace addin
