// SPDX-License-Identifier: MIT
#include "host/platform/platform.h"

#include <QSysInfo>

#include <pwd.h>
#include <unistd.h>

namespace host {

PlatformImpl::PlatformImpl(std::unique_ptr<ide::EventLoop> loop, std::unique_ptr<ide::UserInterface> ui)
    : m_loop(std::move(loop)), m_ui(std::move(ui)), m_windows(*m_loop) {}

PlatformImpl::~PlatformImpl() = default;

QString PlatformImpl::computerName() {
  return QSysInfo::machineHostName();
}

QString PlatformImpl::userName() {
  // The account's name, not $USER, which any environment can set to anything.
  if (const passwd* entry = ::getpwuid(::geteuid()); entry && entry->pw_name)
    return QString::fromLocal8Bit(entry->pw_name);
  return qEnvironmentVariable("USER");
}

}  // namespace host
