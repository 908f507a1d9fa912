// SPDX-License-Identifier: MIT
// Project (.vbp) and group (.vbg) files: each input is read as both. Invariants: an unchanged file is
// written back byte for byte, and every entry the readers list can be asked about without a failure.
#include "fuzzcommon.h"

#include "host/files/groupfile.h"
#include "host/files/projectfile.h"
#include "ide/error.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const QByteArray bytes = fuzz::bytesOf(data, size);
  try {
    const host::ProjectFile project = host::ProjectFile::parse(bytes, QStringLiteral("Fuzz.vbp"));
    fuzz::check(project.toBytes(QStringLiteral("Fuzz.vbp")) == bytes,
                "a project file is written back as read");
    (void)project.name();
    (void)project.references();
    for (const host::ProjectComponent& component : project.components())
      (void)host::resolveProjectPath(QStringLiteral("/nonexistent/fuzz"), component.path);
    for (const QString& section : project.sections())
      (void)project.sectionValue(section, u"Key");
  } catch (const ide::Error&) {
  }
  try {
    const host::GroupFile group = host::GroupFile::parse(bytes, QStringLiteral("Fuzz.vbg"));
    fuzz::check(group.toBytes(QStringLiteral("Fuzz.vbg")) == bytes, "a group file is written back as read");
    const int startup = group.startupProject();
    fuzz::check(startup >= -1 && startup < int(group.projects().size()),
                "the startup project is one of them");
  } catch (const ide::Error&) {
  }
  return 0;
}
