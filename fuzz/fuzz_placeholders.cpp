// SPDX-License-Identifier: MIT
// Placeholder expansion of macros, copy buffers and templates: the input's first byte picks the line the
// text lands on, the rest is the text (Windows-1252). Invariants: a text without "{" comes back as it is,
// and values that hold braces themselves are not expanded again.
#include "fuzzcommon.h"

#include "host/files/ansi.h"
#include "host/model/vbe.h"
#include "ide/error.h"
#include "textins/textinsertion.h"

namespace {

struct Model {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();
  ide::Ref<ide::VBComponent> component = project->Add(ide::ComponentType::StdModule);
  textins::TextInsertion insertion{*vbe, context()};

  Model() {
    component->CodeModule()->AddFromString(
        u"Option Explicit\r\nSub Main()\r\n    x = 1\r\nEnd Sub\r\nPrivate Sub cmdOk_Click()\r\nEnd Sub\r\n"
        u"Property Get Valor() As Long\r\nEnd Property"_qs);
  }

  static textins::InsertionContext context() {
    textins::InsertionContext context;
    context.ComputerName = u"{UserName}"_qs;
    context.UserName = u"{ComputerName}"_qs;
    context.LastWindowType = [] { return 0; };
    context.locale = QLocale::c();
    context.now = [] { return QDateTime(QDate(2026, 12, 7), QTime(9, 30)); };
    return context;
  }
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1 || size > 8192) return 0;
  fuzz::ensureApplication();
  static Model model;
  const int line = data[0] % 12;
  const QString text = host::decodeAnsi(fuzz::bytesOf(data + 1, size - 1));
  QString expanded;
  try {
    expanded = model.insertion.ExpandPlaceholders(text, model.component, line);
  } catch (const ide::Error&) {
    return 0;
  }
  if (!text.contains(u'{')) fuzz::check(expanded == text, "a text without placeholders is kept");
  if (text == u"{ComputerName}") fuzz::check(expanded == u"{UserName}", "a value is not expanded again");
  return 0;
}
