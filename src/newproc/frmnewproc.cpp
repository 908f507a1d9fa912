// SPDX-License-Identifier: MIT
// The new-procedure wizard.
#include "newproc/frmnewproc.h"

#include "appdata/appinfofile.h"
#include "common/errors.h"
#include "common/strings.h"
#include "newproc/procwriter.h"
#include "newproc/texts.h"

#include <QCheckBox>
#include <QComboBox>
#include <QFontDatabase>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QTabWidget>
#include <QTextDocument>
#include <QVBoxLayout>

#include <exception>
#include <optional>

namespace newproc {

namespace {
const QColor kReminderColor(255, 0, 0);

// The data types the list offers.
constexpr const char* kDataTypes[] = {"Boolean", "Byte",   "Currency", "Date",   "Double", "Integer",
                                      "Long",    "Object", "Single",   "String", "Variant"};
// Typed or chosen, these types are never objects.
constexpr QStringView kPlainTypes[] = {u"integer", u"long", u"single", u"double", u"currency",
                                       u"string",  u"date", u"byte",   u"boolean"};

// A template box's text with CR LF between its lines, whatever breaks the stored text had.
QString templateText(const QPlainTextEdit* box) {
  QString raw = box->document()->toRawText();
  raw.replace(QChar::ParagraphSeparator, QStringLiteral("\r\n"));
  raw.replace(QChar::LineSeparator, QStringLiteral("\r\n"));
  return raw;
}

void setTemplateText(QPlainTextEdit* box, QString text) {
  text.replace(QStringLiteral("\r\n"), QStringLiteral("\n"));
  box->setPlainText(text);
}

void enable(std::initializer_list<QWidget*> widgets, bool enabled) {
  for (QWidget* widget : widgets)
    widget->setEnabled(enabled);
}

void clearAndDisable(QCheckBox* box) {
  box->setChecked(false);
  box->setEnabled(false);
}

}  // namespace

void showNewProcedureDialog(const NewProcServices& services, QWidget* parent) {
  ide::VBE& vbe = *services.vbe;
  ide::UserInterface& ui = vbe.Platform().ui();
  if (!vbe.ActiveCodePane()) return;  // nothing to write into
  if (services.programRunning && services.programRunning()) {
    // The code windows are read-only until the program ends.
    common::recordError(ide::Error(ide::err::CannotEdit, ide::standardDescription(ide::err::CannotEdit)),
                        QStringLiteral("frmNewProc"), QStringLiteral("Form_Load"), __LINE__);
    common::logLastError();
    ui.MsgBox(common::LoadResString(kCreationFailed), ide::mb::Exclamation, common::title());
    return;
  }
  if (!services.appInfo) {
    ui.MsgBox(services.appInfoUnavailable, ide::mb::Exclamation, common::title());
    return;
  }
  if (!parent) parent = qobject_cast<QWidget*>(ui.dialogParent());
  std::optional<frmNewProc> dialog;
  try {
    dialog.emplace(services, parent);
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmNewProc"), QStringLiteral("Form_Load"), __LINE__);
    common::ShowErrorReport(ui);
    return;
  }
  dialog->exec();
}

frmNewProc::frmNewProc(const NewProcServices& services, QWidget* parent)
    : QDialog(parent), m_services(services), m_appInfo(*services.appInfo) {
  buildControls();
  Form_Load();
}

frmNewProc::~frmNewProc() = default;

void frmNewProc::buildControls() {
  const auto named = [this](auto* widget, const char* name) {
    widget->setObjectName(QLatin1StringView(name));
    return widget;
  };
  m_tabNewProc = named(new QTabWidget(this), "tabNewProc");
  m_tabNewProc->setUsesScrollButtons(false);  // the three tabs are always shown whole
  for (size_t i = 0; i < m_frNewProc.size(); ++i) {
    m_frNewProc[i] = new QWidget(m_tabNewProc);
    m_frNewProc[i]->setObjectName(QStringLiteral("frNewProc%1").arg(i));
    m_tabNewProc->addTab(m_frNewProc[i], QString());
  }

  // First page: the procedure.
  QWidget* page = m_frNewProc[0];
  m_lblName = named(new QLabel(page), "lblName");
  m_txtName = named(new QLineEdit(page), "txtName");
  m_lblName->setBuddy(m_txtName);
  m_frProcType = named(new QGroupBox(page), "frProcType");
  m_frScope = named(new QGroupBox(page), "frScope");
  auto* kinds = new QVBoxLayout(m_frProcType);
  auto* scopes = new QVBoxLayout(m_frScope);
  const char* const kindCaptions[] = {"Sub", "Function", "Property"};
  const char* const scopeCaptions[] = {"Private", "Public", "Friend"};
  for (size_t i = 0; i < 3; ++i) {
    m_opType[i] = new QRadioButton(QLatin1StringView(kindCaptions[i]), m_frProcType);
    m_opType[i]->setObjectName(QStringLiteral("opType%1").arg(i));
    kinds->addWidget(m_opType[i]);
    m_opScope[i] = new QRadioButton(QLatin1StringView(scopeCaptions[i]), m_frScope);
    m_opScope[i]->setObjectName(QStringLiteral("opScope%1").arg(i));
    scopes->addWidget(m_opScope[i]);
  }
  m_frPropProcs = named(new QGroupBox(page), "frPropProcs");
  m_ckPropGet = named(new QCheckBox(QStringLiteral("Property_Get"), m_frPropProcs), "ckPropGet");
  m_ckPropLet = named(new QCheckBox(QStringLiteral("Property_Let"), m_frPropProcs), "ckPropLet");
  m_ckPropSet = named(new QCheckBox(QStringLiteral("Property_Set"), m_frPropProcs), "ckPropSet");
  auto* accessors = new QVBoxLayout(m_frPropProcs);
  for (QCheckBox* box : {m_ckPropGet, m_ckPropLet, m_ckPropSet})
    accessors->addWidget(box);
  m_lblMemberVar = named(new QLabel(page), "lblMemberVar");
  m_txtVariable = named(new QLineEdit(page), "txtVariable");
  m_lblMemberVar->setBuddy(m_txtVariable);
  m_lblType = named(new QLabel(page), "lblType");
  m_cboDataType = named(new QComboBox(page), "cboDataType");
  m_cboDataType->setEditable(true);
  m_cboDataType->setInsertPolicy(QComboBox::NoInsert);
  for (const char* type : kDataTypes)
    m_cboDataType->addItem(QLatin1StringView(type));
  m_lblType->setBuddy(m_cboDataType);
  m_ckIsObject = named(new QCheckBox(page), "ckIsObject");
  m_ckStatic = named(new QCheckBox(QStringLiteral("Static"), page), "ckStatic");
  m_ckDefault = named(new QCheckBox(QStringLiteral("Default"), page), "ckDefault");
  m_ckErrHandler = named(new QCheckBox(page), "ckErrHandler");
  m_ckDocHeader = named(new QCheckBox(page), "ckDocHeader");

  auto* nameRow = new QHBoxLayout;
  nameRow->addWidget(m_lblName);
  nameRow->addWidget(m_txtName, 1);
  auto* typeBoxes = new QGridLayout;
  typeBoxes->addWidget(m_lblMemberVar, 0, 0);
  typeBoxes->addWidget(m_txtVariable, 0, 1);
  typeBoxes->addWidget(m_lblType, 1, 0);
  typeBoxes->addWidget(m_cboDataType, 1, 1);
  typeBoxes->addWidget(m_ckIsObject, 2, 1);
  auto* left = new QVBoxLayout;
  left->addWidget(m_frProcType);
  left->addWidget(m_frScope);
  auto* right = new QVBoxLayout;
  right->addWidget(m_frPropProcs);
  right->addLayout(typeBoxes);
  right->addStretch();
  auto* middle = new QHBoxLayout;
  middle->addLayout(left);
  middle->addLayout(right, 1);
  auto* options = new QHBoxLayout;
  for (QCheckBox* box : {m_ckStatic, m_ckDefault, m_ckErrHandler, m_ckDocHeader})
    options->addWidget(box);
  options->addStretch();
  auto* first = new QVBoxLayout(page);
  first->addLayout(nameRow);
  first->addLayout(middle);
  first->addLayout(options);

  // Second and third pages: the templates, in a fixed-pitch font.
  const auto templatePage = [&](QWidget* on, QLabel*& label, QPlainTextEdit*& box, const char* labelName,
                                const char* boxName) {
    label = named(new QLabel(on), labelName);
    label->setWordWrap(true);
    box = named(new QPlainTextEdit(on), boxName);
    box->setFont(QFontDatabase::systemFont(QFontDatabase::FixedFont));
    box->setLineWrapMode(QPlainTextEdit::NoWrap);
    label->setBuddy(box);
    auto* layout = new QVBoxLayout(on);
    layout->addWidget(label);
    layout->addWidget(box, 1);
  };
  templatePage(m_frNewProc[1], m_lblEnterEH, m_txtErrCode, "lblEnterEH", "txtErrCode");
  templatePage(m_frNewProc[2], m_lblEnterDocH, m_txtDocHeader, "lblEnterDocH", "txtDocHeader");

  m_cmdOk = named(new QPushButton(QStringLiteral("&OK"), this), "cmdOk");
  m_cmdCancel = named(new QPushButton(this), "cmdCancel");
  m_cmdHelp = named(new QPushButton(this), "cmdHelp");
  m_cmdOk->setDefault(true);
  auto* buttons = new QVBoxLayout;
  for (QPushButton* button : {m_cmdOk, m_cmdCancel, m_cmdHelp})
    buttons->addWidget(button);
  buttons->addStretch();
  auto* layout = new QHBoxLayout(this);
  layout->addWidget(m_tabNewProc, 1);
  layout->addLayout(buttons);

  m_objectColor = m_ckIsObject->palette().color(QPalette::Active, QPalette::WindowText);
}

void frmNewProc::loadTexts() {
  setWindowTitle(common::title() + QStringLiteral(" - ") + common::LoadResString(kNewProcCaption));
  for (int i = 0; i < 3; ++i)
    m_tabNewProc->setTabText(i, common::LoadResString(kNewProcTabFirst + i));
  m_lblName->setText(common::LoadResString(kNameLabel));
  m_frProcType->setTitle(common::LoadResString(kProcTypeFrame));
  m_frScope->setTitle(common::LoadResString(kScopeFrame));
  m_frPropProcs->setTitle(common::LoadResString(kPropertyProcsFrame));
  m_lblMemberVar->setText(common::LoadResString(kMemberVariableLabel));
  m_lblType->setText(common::LoadResString(kDataTypeLabel));
  m_ckIsObject->setText(common::LoadResString(kIsObject));
  m_ckErrHandler->setText(common::LoadResString(kErrorHandler));
  m_ckDocHeader->setText(common::LoadResString(kDocHeader));
  m_cmdCancel->setText(common::LoadResString(kNewProcCancel));
  m_cmdHelp->setText(common::LoadResString(kNewProcHelp));
  m_lblEnterEH->setText(common::LoadResString(kEnterErrorHandler));
  m_lblEnterDocH->setText(common::LoadResString(kEnterDocHeader));
}

void frmNewProc::Form_Load() {
  auto pane = m_services.vbe->ActiveCodePane();
  if (!pane) {
    m_noCodePane = true;
    return;
  }
  loadTexts();
  m_ckErrHandler->setChecked(m_services.settings.flag(common::setting::ErrorHandlerOnNewProc));
  m_ckDocHeader->setChecked(m_services.settings.flag(common::setting::ErrorDocHeaderOnNewProc));

  // Opens on Function and Private with the property controls off; the kind rules apply from the first
  // click on a kind.
  m_opType[1]->setChecked(true);
  m_opScope[0]->setChecked(true);
  try {
    // A standard module has no Friend procedures. What counts is the module the procedure goes into,
    // the active code pane's, not the component selected in the Project window.
    const auto target = pane->CodeModule()->Parent();
    m_opScope[2]->setEnabled(!target || target->Type() != ide::ComponentType::StdModule);
  } catch (const ide::Error& failure) {
    // Friend stays offered; writing the procedure reports a module that went.
    common::logFailure(failure, QStringLiteral("frmNewProc"), QStringLiteral("Form_Load"), __LINE__);
  }
  m_cboDataType->setEditText(QStringLiteral("String"));
  enable({m_frPropProcs, m_ckPropGet, m_ckPropLet, m_ckIsObject}, false);
  clearAndDisable(m_ckPropSet);

  m_loadedErrorHandler = m_appInfo.GetDefErrorHandler();
  m_loadedDocHeader = m_appInfo.GetProcDocHeader();
  setTemplateText(m_txtErrCode, m_loadedErrorHandler);
  setTemplateText(m_txtDocHeader, m_loadedDocHeader);
  tabNewProc_Click(0);

  connect(m_tabNewProc, &QTabWidget::currentChanged, this, &frmNewProc::tabNewProc_Click);
  for (int i = 0; i < 3; ++i)
    connect(m_opType[size_t(i)], &QRadioButton::clicked, this, [this, i] { opType_Click(i); });
  connect(m_txtName, &QLineEdit::textChanged, this, &frmNewProc::txtName_Change);
  connect(m_cboDataType, &QComboBox::currentTextChanged, this, &frmNewProc::cboDataType_Change);
  connect(m_ckIsObject, &QCheckBox::clicked, this, &frmNewProc::ckIsObject_Click);
  connect(m_cmdOk, &QPushButton::clicked, this, &frmNewProc::cmdOk_Click);
  connect(m_cmdCancel, &QPushButton::clicked, this, &QDialog::reject);
  connect(m_cmdHelp, &QPushButton::clicked, this, &frmNewProc::cmdHelp_Click);
}

int frmNewProc::exec() {
  if (m_noCodePane) return QDialog::Rejected;
  return QDialog::exec();
}

void frmNewProc::done(int result) {
  Form_Unload();
  QDialog::done(result);
}

void frmNewProc::Form_Unload() {
  if (m_noCodePane) return;
  const auto store = [this](const common::setting::Key& key, const QCheckBox* box) {
    m_services.settings.setValue(key, box->isChecked() ? QStringLiteral("-1") : QStringLiteral("0"));
  };
  store(common::setting::ErrorHandlerOnNewProc, m_ckErrHandler);
  store(common::setting::ErrorDocHeaderOnNewProc, m_ckDocHeader);
}

void frmNewProc::tabNewProc_Click(int index) {
  for (size_t i = 0; i < m_frNewProc.size(); ++i)
    m_frNewProc[i]->setEnabled(int(i) == index);
}

ProcType frmNewProc::kind() const {
  if (m_opType[0]->isChecked()) return ProcType::Sub;
  if (m_opType[2]->isChecked()) return ProcType::Property;
  return ProcType::Function;
}

void frmNewProc::chooseScopeAgain() {
  if (m_opScope[1]->isChecked())
    m_opScope[1]->setChecked(true);
  else if (m_opScope[0]->isChecked())
    m_opScope[0]->setChecked(true);
  else
    m_opScope[2]->setChecked(true);
}

void frmNewProc::opType_Click(int index) {
  const auto type = static_cast<ProcType>(index);
  const bool property = type == ProcType::Property;
  enable({m_frPropProcs, m_ckPropGet, m_ckPropLet, m_ckPropSet, m_lblMemberVar, m_txtVariable}, property);
  enable({m_lblType, m_cboDataType}, type != ProcType::Sub);
  enable({m_ckErrHandler, m_ckStatic, m_ckDefault}, true);
  chooseScopeAgain();
  switch (type) {
    case ProcType::Sub:
      m_ckIsObject->setEnabled(false);
      break;
    case ProcType::Function:
      m_lblType->setText(common::LoadResString(kReturnTypeLabel));
      functionTypeRule();
      break;
    case ProcType::Property:
      m_lblType->setText(common::LoadResString(kDataTypeLabel));
      if (m_txtVariable->text().trimmed().isEmpty())
        m_txtVariable->setText(QStringLiteral("m_") + m_txtName->text().trimmed());
      propertyTypeRule();
      break;
  }
}

int frmNewProc::SearchListString(const QString& text) const {
  return m_cboDataType->findText(text, Qt::MatchFixedString);
}

void frmNewProc::functionTypeRule() {
  const int found = SearchListString(m_cboDataType->currentText());
  const QString item = found < 0 ? QString() : m_cboDataType->itemText(found);
  if (found < 0 || item == QLatin1StringView("Variant")) {
    m_ckIsObject->setEnabled(true);
  } else if (item == QLatin1StringView("Object")) {
    m_ckIsObject->setChecked(true);
    m_ckIsObject->setEnabled(false);
  } else {
    clearAndDisable(m_ckIsObject);
  }
  setObjectReminder(!m_ckIsObject->isChecked());
}

void frmNewProc::propertyTypeRule() {
  const int found = SearchListString(m_cboDataType->currentText());
  const QString item = found < 0 ? QString() : m_cboDataType->itemText(found);
  if (found < 0) {
    m_ckIsObject->setEnabled(true);
    if (m_ckIsObject->isChecked()) {
      setObjectReminder(false);
      clearAndDisable(m_ckPropLet);
    } else {
      setObjectReminder(true);
    }
  } else if (item == QLatin1StringView("Object")) {
    m_ckIsObject->setChecked(true);
    m_ckIsObject->setEnabled(false);
    clearAndDisable(m_ckPropLet);
    m_ckPropSet->setEnabled(true);
  } else if (item == QLatin1StringView("Variant")) {
    m_ckIsObject->setEnabled(true);
  } else {
    clearAndDisable(m_ckIsObject);
    clearAndDisable(m_ckPropSet);
  }
}

void frmNewProc::txtName_Change() {
  const QString name = m_txtName->text().trimmed();
  if (kind() == ProcType::Property && !name.isEmpty()) m_txtVariable->setText(QStringLiteral("m_") + name);
}

void frmNewProc::cboDataType_Change(const QString& typed) {
  const QString type = typed.toLower();
  const bool property = kind() == ProcType::Property;
  if (std::find(std::begin(kPlainTypes), std::end(kPlainTypes), type) != std::end(kPlainTypes)) {
    clearAndDisable(m_ckIsObject);
    if (property) {
      clearAndDisable(m_ckPropSet);
      m_ckPropLet->setEnabled(true);
    }
  } else if (type == QLatin1StringView("object")) {
    m_ckIsObject->setChecked(true);
    m_ckIsObject->setEnabled(false);
    if (property) {
      clearAndDisable(m_ckPropLet);
      m_ckPropSet->setEnabled(true);
    }
  } else {
    // A Variant or a class: it may hold an object, which the user is reminded to say.
    m_ckIsObject->setEnabled(true);
    if (property) {
      enable({m_ckPropLet, m_ckPropSet}, true);
      if (m_ckIsObject->isChecked()) {
        m_ckPropSet->setChecked(true);
      } else {
        setObjectReminder(true);
        m_ckPropSet->setChecked(false);
      }
    } else if (kind() == ProcType::Function && !m_ckIsObject->isChecked()) {
      setObjectReminder(true);
    }
  }
}

void frmNewProc::ckIsObject_Click() {
  setObjectReminder(false);
  if (kind() != ProcType::Property) return;
  if (m_ckIsObject->isChecked()) {
    m_ckPropSet->setEnabled(true);
    if (m_cboDataType->currentText().toLower() == QLatin1StringView("variant"))
      m_ckPropLet->setEnabled(true);
    else
      clearAndDisable(m_ckPropLet);
  } else {
    m_ckPropLet->setEnabled(true);
    clearAndDisable(m_ckPropSet);
  }
}

void frmNewProc::setObjectReminder(bool shown) {
  QPalette palette = m_ckIsObject->palette();
  // Only the enabled look: a disabled caption stays grey.
  for (const auto group : {QPalette::Active, QPalette::Inactive})
    palette.setColor(group, QPalette::WindowText, shown ? kReminderColor : m_objectColor);
  m_ckIsObject->setPalette(palette);
}

bool frmNewProc::objectReminderShown() const {
  return m_ckIsObject->palette().color(QPalette::Active, QPalette::WindowText) == kReminderColor;
}

NewProcChoices frmNewProc::choices() const {
  NewProcChoices choices;
  choices.name = m_txtName->text();
  choices.type = kind();
  choices.scope = m_opScope[1]->isChecked()   ? ProcScope::Public
                  : m_opScope[0]->isChecked() ? ProcScope::Private
                                              : ProcScope::Friend;
  choices.isStatic = m_ckStatic->isChecked();
  choices.dataType = m_cboDataType->currentText();
  choices.isObject = m_ckIsObject->isChecked();
  choices.get = m_ckPropGet->isChecked();
  choices.let = m_ckPropLet->isChecked();
  choices.set = m_ckPropSet->isChecked();
  choices.memberVariable = m_txtVariable->text();
  choices.errorHandler = m_ckErrHandler->isChecked();
  choices.docHeader = m_ckDocHeader->isChecked();
  choices.isDefault = m_ckDefault->isChecked();
  return choices;
}

void frmNewProc::refuse(const Refusal& refusal) {
  m_services.vbe->Platform().ui().MsgBox(refusal.message, refusal.icon, common::title());
  QWidget* focus = m_txtName;
  int tab = 0;
  switch (refusal.field) {
    case Field::ErrorHandler:
      tab = 1;
      focus = m_txtErrCode;
      break;
    case Field::DocHeader:
      tab = 2;
      focus = m_txtDocHeader;
      break;
    case Field::Name:
      break;
    case Field::DataType:
      focus = m_cboDataType;  // disabled while Sub is chosen: then the focus stays where it is
      break;
    case Field::MemberVariable:
      focus = m_txtVariable;
      break;
    case Field::PropertyProcs:
      focus = m_ckPropGet;
      break;
  }
  m_tabNewProc->setCurrentIndex(tab);
  if (focus->isEnabled()) focus->setFocus();
}

void frmNewProc::writeTemplates(const QString& errorHandler, const QString& docHeader) {
  // The loaded texts change first and both writes are tried: when the database refuses them, the user is
  // told once and the next OK writes the procedure with the templates as edited.
  std::exception_ptr failure;
  const auto write = [&failure](QString& loaded, const QString& edited, auto&& store) {
    if (edited == loaded) return;
    loaded = edited;
    try {
      store(edited);
    } catch (const std::exception&) {
      if (!failure) failure = std::current_exception();
    }
  };
  write(m_loadedErrorHandler, errorHandler, [this](const QString& t) { m_appInfo.WriteDefErrorHandler(t); });
  write(m_loadedDocHeader, docHeader, [this](const QString& t) { m_appInfo.WriteProcDocHeader(t); });
  if (failure) std::rethrow_exception(failure);
}

void frmNewProc::cmdOk_Click() {
  const NewProcChoices choices = this->choices();
  const Templates templates{templateText(m_txtErrCode), templateText(m_txtDocHeader)};
  if (const auto refusal = Validate(choices, templates.errorHandler, templates.docHeader)) {
    refuse(*refusal);
    return;
  }
  ide::UserInterface& ui = m_services.vbe->Platform().ui();
  try {
    const auto pane = m_services.vbe->ActiveCodePane();
    if (!pane) ide::raise(ide::err::ObjectVariableNotSet);
    if (const auto refusal = CheckNamesFree(*pane->CodeModule(), choices)) {
      refuse(*refusal);
      return;
    }
    writeTemplates(templates.errorHandler, templates.docHeader);
    WriteProcedures(*m_services.vbe, pane, choices, templates, m_services.textInsertion);
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmNewProc"), QStringLiteral("cmdOk_Click"), __LINE__);
    common::logLastError();
    ui.MsgBox(common::LoadResString(kCreationFailed), ide::mb::Exclamation, common::title());
    return;
  }
  const QString another = common::LoadResString(kCreated) + u'\n' + common::LoadResString(kCreateAnother);
  if (ui.MsgBox(another, ide::mb::YesNo | ide::mb::Question, common::title()) == ide::mb::Yes)
    readyForNext();
  else
    accept();
}

void frmNewProc::readyForNext() {
  m_ckDefault->setChecked(false);
  m_txtName->clear();
  if (m_tabNewProc->currentIndex() != 0) m_tabNewProc->setCurrentIndex(0);
  m_txtName->setFocus();
}

void frmNewProc::cmdHelp_Click() {
  if (m_services.showHelp) m_services.showHelp();
}

}  // namespace newproc
