// SPDX-License-Identifier: MIT
#include "addin/envutils.h"

#include "addin/commandtable.h"
#include "addin/pictures.h"
#include "addin/texts.h"
#include "common/errors.h"
#include "common/strings.h"

#include <QStringList>

namespace addin {

OwnedControl& OwnedControl::operator=(OwnedControl&& other) noexcept {
  if (this != &other) {
    release();
    m_control = std::move(other.m_control);
  }
  return *this;
}

void OwnedControl::release() noexcept {
  auto control = std::move(m_control);
  m_control.reset();
  if (!control) return;
  try {
    control->Delete();
  } catch (const std::exception& failure) {
    // Gone already (with its bar, or removed by someone else).
    common::logFailure(failure, QStringLiteral("OwnedControl"), QStringLiteral("release"), __LINE__);
  }
}

OwnedBar& OwnedBar::operator=(OwnedBar&& other) noexcept {
  if (this != &other) {
    release();
    m_bar = std::move(other.m_bar);
  }
  return *this;
}

void OwnedBar::release() noexcept {
  auto bar = std::move(m_bar);
  m_bar.reset();
  if (!bar) return;
  try {
    bar->Delete();
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("OwnedBar"), QStringLiteral("release"), __LINE__);
  }
}

// ---------------------------------------------------------------------------------------------------

QString CEnvUtils::GetSelectedText() {
  auto pane = m_vbe.ActiveCodePane();
  if (!pane) return {};
  int startLine = 0, startColumn = 0, endLine = 0, endColumn = 0;
  pane->GetSelection(startLine, startColumn, endLine, endColumn);
  if (startLine == endLine && startColumn == endColumn) return {};
  auto module = pane->CodeModule();
  if (startLine == endLine)
    return module->Lines(startLine, 1).mid(startColumn - 1, std::max(endColumn - startColumn, 0));
  QStringList parts;
  parts << module->Lines(startLine, 1).mid(startColumn - 1);
  for (int line = startLine + 1; line < endLine; ++line)
    parts << module->Lines(line, 1);
  parts << module->Lines(endLine, 1).left(std::max(endColumn - 1, 0));
  return parts.join(QStringLiteral("\r\n"));
}

ide::ProcKind CEnvUtils::GetPropertyType(const ide::Ref<ide::CodeModule>& codmod, const QString& procName,
                                         int line) {
  for (const ide::ProcKind kind : {ide::ProcKind::Get, ide::ProcKind::Let, ide::ProcKind::Set}) {
    try {
      const int start = codmod->ProcStartLine(procName, kind);
      const int count = codmod->ProcCountLines(procName, kind);
      if (line >= start && line < start + count) return kind;
    } catch (const ide::Error&) {
      // The property has no procedure of this kind.
    }
  }
  return ide::ProcKind::Proc;
}

OwnedControl CEnvUtils::AddMenuItem(const ide::Ref<ide::CommandBar>& menu, const QString& caption,
                                    int position, bool separator, int bitmap) {
  auto controls = menu->Controls();
  if (position == 0) position = controls->Count() + 1;
  OwnedControl item(controls->Add(ide::ControlType::Button, 1, {}, position, true));
  item->setCaption(caption);
  if (separator) item->setBeginGroup(true);
  if (bitmap > 0) {
    // The picture is handed over directly; the user's clipboard is none of the add-in's business.
    item->setStyle(ide::ButtonStyle::IconAndCaption);
    item->setFace(pictureData(bitmap));
  }
  return item;
}

OwnedBar CEnvUtils::AddToolBar() {
  auto bars = m_vbe.CommandBars();
  const QString name = QString::fromLatin1(kToolBarName);
  // The toolbar is not temporary: one left behind by a connection that could not remove it would make
  // every later start-up fail on the name.
  ide::Ref<ide::CommandBar> leftover;
  try {
    leftover = bars->Item(name);
  } catch (const ide::Error& error) {
    if (error.number() != ide::err::InvalidProcedureCall) throw;  // else there is none, as usual
  }
  if (leftover) leftover->Delete();
  OwnedBar bar(bars->Add(name, ide::BarPosition::Top, false, false));
  auto controls = bar->Controls();
  for (const CommandEntry& command : commandTable()) {
    if (!(command.placement & OnToolBar)) continue;
    auto button = controls->Add(ide::ControlType::Button, 1, {}, 0, true);
    button->setFace(pictureData(command.picture));
    button->setVisible(true);
    button->setTag(QString::fromLatin1(command.tag));
    button->setTooltipText(common::LoadResString(command.captionResource()));
  }
  bar->setVisible(true);
  return bar;
}

bool CEnvUtils::isStandardControlEnabled(const QString& caption, ide::Ref<ide::CommandBarControl>& cached) {
  try {
    // A control that left its bar has no index any more.
    if (!cached || cached->Index() == 0)
      cached = m_vbe.CommandBars()->Item(QStringLiteral("Standard"))->Controls()->Item(caption);
    return cached->Enabled();
  } catch (const std::exception& failure) {
    cached.reset();
    throw common::recordError(failure, QStringLiteral("CEnvUtils"),
                              QStringLiteral("IsStandardControlEnabled"), __LINE__);
  }
}

ide::IdeMode CEnvUtils::IdeMode() {
  try {
    if (isStandardControlEnabled(QStringLiteral("CONTINUE"), m_continueControl)) return ide::IdeMode::Break;
    if (isStandardControlEnabled(QStringLiteral("end"), m_endControl)) return ide::IdeMode::Run;
    return ide::IdeMode::Design;
  } catch (const std::exception& failure) {
    throw common::recordError(failure, QStringLiteral("CEnvUtils"), QStringLiteral("IdeMode"), __LINE__);
  }
}

}  // namespace addin
