// SPDX-License-Identifier: MIT
// Code modules and their members over the code-module engine.
#include "host/model/objects.h"
#include "host/model/vbe.h"

namespace host {
namespace {

/// One member, found again by name at every call, so that it follows the code as it is edited.
class MemberImpl final : public ide::Member {
 public:
  MemberImpl(std::shared_ptr<CodeModuleImpl> module, QString name)
      : m_module(std::move(module)), m_name(std::move(name)) {}

  QString Name() override { return info().name; }
  ide::MemberType Type() override { return info().type; }
  ide::Scope Scope() override { return info().scope; }
  bool Static() override { return info().isStatic; }
  int CodeLocation() override { return info().line; }

  std::optional<int> ProcedureId() override {
    const auto value = m_module->text().memberAttribute(m_name, idAttribute());
    if (!value) return std::nullopt;
    bool ok = false;
    const int id = value->trimmed().toInt(&ok);
    return ok ? std::optional(id) : std::nullopt;
  }

  void setProcedureId(std::optional<int> id) override {
    info();  // fails for a member that no longer exists
    m_module->text().setMemberAttribute(m_name, idAttribute(),
                                        id ? std::optional(QString::number(*id)) : std::nullopt);
  }

  QString Description() override {
    const auto value = m_module->text().memberAttribute(m_name, descriptionAttribute());
    return value ? unquoteVbString(value->trimmed()).value_or(*value) : QString();
  }

  void setDescription(const QString& text) override {
    info();
    m_module->text().setMemberAttribute(m_name, descriptionAttribute(),
                                        text.isEmpty() ? std::nullopt : std::optional(quoteVbString(text)));
  }

 private:
  MemberInfo info() {
    auto found = m_module->text().member(m_name);
    if (!found) ide::raise(ide::err::SubscriptOutOfRange);
    return *found;
  }
  bool isVariable() { return info().type == ide::MemberType::Variable; }
  QString idAttribute() {
    return isVariable() ? QStringLiteral("VB_VarUserMemId") : QStringLiteral("VB_UserMemId");
  }
  QString descriptionAttribute() {
    return isVariable() ? QStringLiteral("VB_VarDescription") : QStringLiteral("VB_Description");
  }

  std::shared_ptr<CodeModuleImpl> m_module;
  QString m_name;
};

class MembersImpl final : public ide::Members {
 public:
  explicit MembersImpl(std::shared_ptr<CodeModuleImpl> module) : m_module(std::move(module)) {}

  int Count() override { return static_cast<int>(m_module->text().members().size()); }
  ide::Ref<ide::Member> Item(int index) override {
    const auto& members = m_module->text().members();
    if (index < 1 || index > static_cast<int>(members.size())) ide::raise(ide::err::SubscriptOutOfRange);
    return std::make_shared<MemberImpl>(m_module, members[static_cast<size_t>(index - 1)].name);
  }
  ide::Ref<ide::Member> Item(const QString& name) override {
    const auto found = m_module->text().member(name);
    if (!found) ide::raise(ide::err::SubscriptOutOfRange);
    return std::make_shared<MemberImpl>(m_module, found->name);
  }
  ide::Ref<ide::CodeModule> Parent() override { return m_module; }

 private:
  std::shared_ptr<CodeModuleImpl> m_module;
};

}  // namespace

CodeModuleImpl::CodeModuleImpl(const std::shared_ptr<ComponentImpl>& component) : m_component(component) {
  m_text.addListener(this);
}

CodeModuleImpl::~CodeModuleImpl() {
  m_text.removeListener(this);
}

ide::Ref<ide::VBComponent> CodeModuleImpl::Parent() {
  return m_component.lock();
}

QString CodeModuleImpl::Name() {
  auto component = m_component.lock();
  return component ? component->Name() : QString();
}

std::shared_ptr<CodePaneImpl> CodeModuleImpl::pane() {
  if (!m_pane) m_pane = std::make_shared<CodePaneImpl>(shared_from_this());
  return m_pane;
}

ide::Ref<ide::CodePane> CodeModuleImpl::CodePane() {
  checkEditable();
  return pane();
}

ide::Ref<ide::Members> CodeModuleImpl::Members() {
  return std::make_shared<MembersImpl>(shared_from_this());
}

void CodeModuleImpl::checkEditable() {
  auto component = m_component.lock();
  if (!component || !component->attached()) ide::raise(ide::err::ObjectVariableNotSet);
}

void CodeModuleImpl::checkWritable() {
  // Called for every line a walk replaces: each owner is locked once.
  auto component = m_component.lock();
  auto project = component ? component->project() : nullptr;
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  // While the program runs its code is read-only, for add-ins as in the code window.
  if (auto vbe = project->vbe(); vbe && vbe->mode() == ide::IdeMode::Run) ide::raise(ide::err::CannotEdit);
}

void CodeModuleImpl::InsertLines(int line, const QString& text) {
  checkWritable();
  this->text().insertLines(line, text);
}

void CodeModuleImpl::DeleteLines(int startLine, int count) {
  checkWritable();
  text().deleteLines(startLine, count);
}

void CodeModuleImpl::ReplaceLine(int line, const QString& text) {
  checkWritable();
  this->text().replaceLine(line, text);
}

void CodeModuleImpl::AddFromString(const QString& text) {
  checkWritable();
  this->text().addFromString(text);
}

int CodeModuleImpl::ProcStartLine(const QString& procName, ide::ProcKind kind) {
  return text().procStartLine(procName, kind);
}

int CodeModuleImpl::ProcBodyLine(const QString& procName, ide::ProcKind kind) {
  return text().procBodyLine(procName, kind);
}

int CodeModuleImpl::ProcCountLines(const QString& procName, ide::ProcKind kind) {
  return text().procCountLines(procName, kind);
}

bool CodeModuleImpl::Find(const QString& target, int& startLine, int& startColumn, int& endLine,
                          int& endColumn, bool wholeWord, bool matchCase, bool patternSearch) {
  return text().find(target, startLine, startColumn, endLine, endColumn, wholeWord, matchCase, patternSearch);
}

void CodeModuleImpl::load(std::vector<SourceLine> code, std::vector<MemberAttributeLine> attributes) {
  m_editsBefore = changeCount();
  m_unread.reset();
  m_madeFrom.reset();
  m_text.load(std::move(code), std::move(attributes));
  m_madeAt = m_text.changeCount();
}

void CodeModuleImpl::loadLater(Unread code) {
  m_editsBefore = changeCount();
  if (!m_unread) m_text.load({}, {});
  m_text.shrinkToFit();
  m_madeFrom.reset();
  m_unread = std::move(code);
}

bool CodeModuleImpl::unload(std::optional<Unread> code) {
  if (m_pane || m_unread) return false;
  if (!code && (!m_madeFrom || changeCount() != m_editsBefore)) return false;
  loadLater(code ? std::move(*code) : std::move(*m_madeFrom));
  return true;
}

void CodeModuleImpl::readUnread() {
  ModuleSource parts;
  parseModuleCode(QByteArrayView(m_unread->bytes).sliced(m_unread->offset), m_unread->fileName,
                  m_unread->firstLine, parts);
  m_madeFrom = std::exchange(m_unread, std::nullopt);
  m_text.load(std::move(parts.code), std::move(parts.memberAttributes));
  m_madeAt = m_text.changeCount();
}

quint64 CodeModuleImpl::changeCount() const {
  return m_unread ? m_editsBefore : m_editsBefore + (m_text.changeCount() - m_madeAt);
}

void CodeModuleImpl::linesChanged(int firstLine, int removed, int inserted) {
  if (m_pane) m_pane->linesChanged(firstLine, removed, inserted);
}

}  // namespace host
