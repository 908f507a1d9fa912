// SPDX-License-Identifier: MIT
// A keyboard macro from the key press in a code window to its text in the module: the hotkey message,
// the macro's lookup, the expansion of its placeholders ({ModuleName}, {ProcedureName}), the replacement
// of the selection and the caret placed at {C}, in a module of 100,000 lines. Target: < 1 ms.
#include "addin/connect.h"
#include "appdata/appinfofile.h"
#include "benchaddin.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/manualloop.h"

#include <benchmark/benchmark.h>

#include <QStringList>
#include <QTemporaryDir>

#include <memory>

namespace {

constexpr int kProcedures = 1000;
constexpr int kLinesEach = 100;
constexpr char16_t kMacro[] = u"    Debug.Print \"{ModuleName}.{ProcedureName}\"{C}";

using bench::BenchAddIn;

/// The add-in connected to an IDE whose one module (100,000 lines) has the focus and the macro hotkeys.
struct Session {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<BenchAddIn> addIn = std::make_shared<BenchAddIn>(vbe);
  std::unique_ptr<addin::Connect> connection;  // made once the environment names the configuration
  ide::Ref<ide::CodePane> pane;
  ide::HWnd window = 0;

  Session() {
    bench::installAddInIn(dir.path());
    {
      appdata::CAppInfoFile db;
      db.OpenFile(dir.path());
      db.WriteMacroText(QStringLiteral("Ctrl+Alt+A"), QString::fromUtf16(kMacro));
    }

    QStringList lines{QStringLiteral("Option Explicit"), QStringLiteral("Private m As Long")};
    for (int p = 1; p <= kProcedures; ++p) {
      lines << QStringLiteral("Public Sub Proc%1(ByVal n As Long)").arg(p);
      for (int l = 0; l < kLinesEach - 2; ++l)
        lines << QStringLiteral("    m = m + n * %1 ' linha %2").arg(l).arg(p);
      lines << QStringLiteral("End Sub");
    }
    auto module = vbe->newProject()->Add(ide::ComponentType::StdModule);
    module->setName(QStringLiteral("modGrande"));
    module->CodeModule()->AddFromString(lines.join(QStringLiteral("\r\n")));

    QVariantList custom;
    connection = std::make_unique<addin::Connect>();
    connection->OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
    pane = module->CodeModule()->CodePane();
    pane->Show();
    vbe->manualLoop()->advance(100);  // the timer puts the hotkeys on the focused code window
    window = pane->Window()->hWnd();
  }
  ~Session() {
    QVariantList custom;
    connection->OnDisconnection(ide::DisconnectMode::UserClosed, custom);
  }
};

void BM_MacroHotKeyInALargeModule(benchmark::State& state) {
  Session s;
  auto module = s.pane->CodeModule();
  const int line = module->CountOfLines() / 2;
  for (auto _ : state) {
    state.PauseTiming();
    // The whole line, so that every press puts the same text in the same place.
    s.pane->SetSelection(line, 1, line, module->Lines(line, 1).size() + 1);
    state.ResumeTiming();
    if (!s.vbe->windowSystem().deliverHotKey(s.window, ide::mod::Control | ide::mod::Alt, 'A')) {
      state.SkipWithError("the macro's hotkey is not registered on the code window");
      break;
    }
  }
  const int procedure = (line - 3) / kLinesEach + 1;
  if (module->Lines(line, 1) != QStringLiteral("    Debug.Print \"modGrande.Proc%1\"").arg(procedure))
    state.SkipWithError("the macro's text did not arrive");
  state.counters["lines"] = module->CountOfLines();
}
BENCHMARK(BM_MacroHotKeyInALargeModule)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
