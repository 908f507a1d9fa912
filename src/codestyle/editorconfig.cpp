// SPDX-License-Identifier: MIT
#include "codestyle/editorconfig.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <editorconfig/editorconfig.h>

#include <memory>

namespace codestyle {
namespace {

/// The library's handle, destroyed with the scope.
struct Handle {
  editorconfig_handle handle = editorconfig_handle_init();
  ~Handle() {
    if (handle) editorconfig_handle_destroy(handle);
  }
  Handle() = default;
  Handle(const Handle&) = delete;
  Handle& operator=(const Handle&) = delete;
};

/// Parses for `path` with the configuration files named `configName` (empty: .editorconfig).
std::variant<EditorConfigValues, EditorConfigError> parse(const QString& path, const QByteArray& configName) {
  const Handle h;
  if (!h.handle) return EditorConfigError{{}, 0, QStringLiteral("out of memory")};
  if (!configName.isEmpty()) editorconfig_handle_set_conf_file_name(h.handle, configName.constData());
  const QByteArray file = QFile::encodeName(QFileInfo(path).absoluteFilePath());
  const int result = editorconfig_parse(file.constData(), h.handle);
  if (result != 0) {
    const char* errorFile = editorconfig_handle_get_err_file(h.handle);
    return EditorConfigError{errorFile ? QFile::decodeName(errorFile) : QString(), std::max(result, 0),
                             result > 0 ? QStringLiteral("not a valid .editorconfig line")
                                        : QString::fromUtf8(editorconfig_get_error_msg(result))};
  }
  EditorConfigValues values;
  for (int i = 0, count = editorconfig_handle_get_name_value_count(h.handle); i < count; ++i) {
    const char* name = nullptr;
    const char* value = nullptr;
    editorconfig_handle_get_name_value(h.handle, i, &name, &value);
    const QString text = QString::fromUtf8(value);
    if (text.compare(QLatin1StringView("unset"), Qt::CaseInsensitive) != 0)
      values.insert(QString::fromUtf8(name), text);
  }
  return values;
}

}  // namespace

std::variant<EditorConfigValues, EditorConfigError> readEditorConfig(const QString& path) {
  return parse(path, {});
}

QString editorConfigFileOf(const QString& path, const QString& name) {
  // The library reports the merged result only. Each file is read again on its own: copied into an empty
  // folder under a name no folder above it has, and asked about the same path below that folder.
  static constexpr char kAlone[] = ".editorconfig-read-alone";
  const QTemporaryDir alone;
  if (!alone.isValid()) return {};
  const QFileInfo target(path);
  for (QDir folder = target.absoluteDir();;) {
    const QString config = folder.filePath(QStringLiteral(".editorconfig"));
    QFile source(config);
    if (source.open(QIODevice::ReadOnly)) {
      QFile copy(alone.filePath(QLatin1StringView(kAlone)));
      if (!copy.open(QIODevice::WriteOnly | QIODevice::Truncate) || copy.write(source.readAll()) < 0)
        return {};
      copy.close();
      const auto own = parse(alone.filePath(folder.relativeFilePath(target.absoluteFilePath())), kAlone);
      if (const auto* values = std::get_if<EditorConfigValues>(&own); values && values->contains(name))
        return config;
    }
    if (!folder.cdUp()) return {};
  }
}

}  // namespace codestyle
