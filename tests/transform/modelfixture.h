// SPDX-License-Identifier: MIT
// Helpers of the walk, number-and-indent and dialog tests: a headless IDE holding modules written in the
// test, a loop that counts its runs, a progress bar that records what it was told, and two modules to work
// on.
#pragma once

#include "host/model/vbe.h"
#include "recordingbar.h"
#include "testproject.h"

#include <QStringList>

#include <functional>
#include <memory>
#include <vector>

namespace transform::test {

/// The lines of a code module.
inline QStringList linesOf(ide::CodeModule& module) {
  QStringList lines;
  for (int i = 1; i <= module.CountOfLines(); ++i)
    lines << module.Lines(i, 1);
  return lines;
}

/// Writes into `dir` and opens a project of a module (Sub A, "x = 1" on line 2) and a related document.
inline std::shared_ptr<host::ProjectImpl> openWithRelatedDocument(host::VbeImpl& vbe, const QString& dir) {
  host::test::writeBytes(dir + u"/Mod1.bas"_qs,
                         "Attribute VB_Name = \"Mod1\"\r\nSub A()\r\nx = 1\r\nEnd Sub\r\n");
  host::test::writeBytes(dir + u"/Leia-me.txt"_qs, "texto\r\n");
  host::test::writeBytes(dir + u"/P.vbp"_qs,
                         "Type=Exe\r\nModule=Mod1; Mod1.bas\r\nRelatedDoc=Leia-me.txt\r\nName=\"P\"\r\n");
  return vbe.open(dir + u"/P.vbp"_qs).front();
}

/// A headless IDE with one unsaved project; modules are added from lines.
struct Ide {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();

  /// A new standard module (or class) holding exactly `lines`.
  ide::Ref<ide::CodeModule> addModule(const QStringList& lines,
                                      ide::ComponentType type = ide::ComponentType::StdModule) {
    auto module = project->Add(type)->CodeModule();
    if (module->CountOfLines() > 0) module->DeleteLines(1, module->CountOfLines());
    module->AddFromString(lines.join(u"\r\n"_qs));
    return module;
  }

  /// Puts the caret of `module`'s code pane on `line` and makes the pane the active one.
  static void placeCaret(const ide::Ref<ide::CodeModule>& module, int line) {
    auto pane = module->CodePane();
    pane->Show();
    pane->SetSelection(line, 1, line, 1);
  }

  /// How many edits the module has had (each replaced line counts one).
  static quint64 edits(const ide::Ref<ide::CodeModule>& module) {
    return std::dynamic_pointer_cast<host::CodeModuleImpl>(module)->text().changeCount();
  }
};

/// Two modules of the active project: a procedure holding a block after the declarations, and a procedure of
/// one statement.
inline const QStringList kFirst = {
    u"Option Explicit"_qs, u"Sub Um()"_qs, u"If x Then"_qs, u"y = 1"_qs, u"End If"_qs, u"End Sub"_qs,
};
inline const QStringList kSecond = {u"Sub Dois()"_qs, u"z = 2"_qs, u"End Sub"_qs};

struct TwoModules {
  Ide ide;
  ide::Ref<ide::CodeModule> first = ide.addModule(kFirst);
  ide::Ref<ide::CodeModule> second = ide.addModule(kSecond);

  TwoModules() { ide.vbe->setActiveVBProject(ide.project); }
  void select(const ide::Ref<ide::CodeModule>& module) {
    ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(module->Parent()));
  }
};

/// A loop that counts how often it runs and runs queued work in order.
class CountingLoop final : public ide::EventLoop {
 public:
  int SetTimer(int, std::function<void()>) override { return 0; }
  bool KillTimer(int) override { return false; }
  void post(std::function<void()> work) override { m_posted.push_back(std::move(work)); }
  void DoEvents() override {
    ++runs;
    auto posted = std::exchange(m_posted, {});
    for (auto& work : posted)
      work();
    if (onRun) onRun(runs);
  }
  qint64 tickCount() override { return 0; }

  int runs = 0;
  /// Called after every run with the number of runs so far.
  std::function<void(int)> onRun;

 private:
  std::vector<std::function<void()>> m_posted;
};

}  // namespace transform::test
