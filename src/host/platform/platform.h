// SPDX-License-Identifier: MIT
// The IDE's platform services in one place: its loop, its windows and its user interface. The headless
// IDE uses a ManualEventLoop and a HeadlessUi; the desktop host passes Qt-driven ones.
#pragma once

#include "host/platform/windowsystem.h"
#include "ide/platform.h"

#include <memory>

namespace host {

class PlatformImpl final : public ide::Platform {
 public:
  PlatformImpl(std::unique_ptr<ide::EventLoop> loop, std::unique_ptr<ide::UserInterface> ui);
  ~PlatformImpl() override;

  ide::EventLoop& loop() override { return *m_loop; }
  ide::WindowSystem& windows() override { return m_windows; }
  ide::UserInterface& ui() override { return *m_ui; }
  QString computerName() override;
  QString userName() override;

  WindowSystemImpl& windowSystem() { return m_windows; }

 private:
  std::unique_ptr<ide::EventLoop> m_loop;
  std::unique_ptr<ide::UserInterface> m_ui;
  WindowSystemImpl m_windows;
};

}  // namespace host
