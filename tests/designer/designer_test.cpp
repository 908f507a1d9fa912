// SPDX-License-Identifier: MIT
// Form-designer assistance over a headless IDE: the values typed into the dialogs, the renaming of a control
// in its form's code, the actions on new forms and controls with the procedures they write, and the options
// and property defaults dialogs offscreen.
#include "common/errors.h"
#include "designer/actions.h"
#include "designer/frmoptions.h"
#include "designer/frmprops.h"
#include "designer/values.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "printers.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QCheckBox>
#include <QLineEdit>
#include <QListWidget>
#include <QPushButton>
#include <QTemporaryDir>
#include <QTest>
#include <QToolButton>

namespace designer {
namespace {

QStringList linesOf(ide::CodeModule& module) {
  QStringList lines;
  for (int i = 1; i <= module.CountOfLines(); ++i)
    lines << module.Lines(i, 1);
  return lines;
}

/// A new form in an unsaved project, the actions over it, and a property defaults dialog that records
/// the controls it was shown for and gives `choice`.
struct Scene {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();
  ide::Ref<ide::VBComponent> form = project->Add(ide::ComponentType::VBForm);
  common::Options options{.ColorOnFocus = u"&HFFFF&"_qs};
  PropsChoice choice{.Cancelled = false};
  QStringList shownFor;
  DesignerActions actions{*vbe->headlessUi(), options, [this](const ide::Ref<ide::VBControl>& control) {
                            shownFor << control->name();
                            return choice;
                          }};

  ide::Ref<ide::VBControl> add(const QString& className) {
    auto control = form->Designer()->VBControls()->Add(className);
    actions.ControlAdded(control);
    return control;
  }
  QStringList code() { return linesOf(*form->CodeModule()); }
};

QVariant propertyOf(const ide::Ref<ide::VBControl>& control, const char* name) {
  return control->Properties()->Item(QString::fromLatin1(name))->Value();
}

// ---------------------------------------------------------------------------------------------------

TEST(Values, TypedTextReadsAsVbReadsIt) {
  for (const char* text : {"&HFFFF&", "&hff", "  12 ", "-1.5E3", "", "&H80000005&"})
    EXPECT_TRUE(isColourText(QString::fromLatin1(text))) << text;
  for (const char* text : {"FFFF", "abc", "&HFFFF&&", "&HG1", "1.2.3"})
    EXPECT_FALSE(isColourText(QString::fromLatin1(text))) << text;
  EXPECT_EQ(vbNumber(u"&HFFFF"), -1.0) << "four hexadecimal digits are an Integer";
  EXPECT_EQ(colourLiteral(QColor(255, 255, 0)), u"&HFFFF&"_qs);
  EXPECT_EQ(colourLiteral(Qt::black), u"&H0&"_qs);

  struct Case {
    const char* text;
    QVariant sample;
    QVariant expected;  // invalid: the error number below
    long error = 0;
  };
  const Case cases[] = {
      {"5", QVariant::fromValue<qint32>(0), QVariant::fromValue<qint32>(5)},
      {" 2.5 ", QVariant::fromValue<qint16>(0), QVariant::fromValue<qint16>(2)},
      {"&H10", QVariant::fromValue<qint16>(0), QVariant::fromValue<qint16>(16)},
      {"true", QVariant(false), QVariant(true)},
      {"0", QVariant(true), QVariant(false)},
      {"1.25", QVariant::fromValue(1.0f), QVariant::fromValue(1.25f)},
      {"abc", QVariant(u"x"_qs), QVariant(u"abc"_qs)},
      {"abc", QVariant::fromValue<qint32>(0), {}, kTypeMismatch},
      {"70000", QVariant::fromValue<qint16>(0), {}, kOverflow},
      {"Talvez", QVariant(false), {}, kTypeMismatch},
  };
  for (const Case& c : cases) {
    const QString text = QString::fromLatin1(c.text);
    EXPECT_EQ(host::test::errorNumberOf([&] { ToValueType(text, c.sample); }), c.error) << c.text;
    if (c.error) continue;
    const QVariant value = ToValueType(text, c.sample);
    EXPECT_EQ(value.typeId(), c.sample.typeId()) << c.text;
    EXPECT_EQ(value, c.expected) << c.text;
  }
}

TEST(RenameInCode, OnlyTheControlsOwnReferencesOutsideStringsChange) {
  const std::pair<const char*, const char*> cases[] = {
      {"Text1.Text = \"Text1\" & Text10", "txtName.Text = \"Text1\" & Text10"},
      {"Private Sub Text1_Change()", "Private Sub txtName_Change()"},
      {"10 MsgBox \"Diga \"\"Text1\"\"\", , Text1.Text ' Text1 e MyText1",
       "10 MsgBox \"Diga \"\"Text1\"\"\", , txtName.Text ' txtName e MyText1"},
      {"   Rem Text1 \"Text1", "   Rem txtName \"txtName"},
      {"Set c = Me.Text1: text1.SetFocus", "Set c = Me.txtName: text1.SetFocus"},
      {"Text1_Foo = Text1_ + Text1x", "txtName_Foo = Text1_ + Text1x"},
  };
  for (const auto& [before, after] : cases)
    EXPECT_EQ(renameControlInLine(QString::fromUtf8(before), u"Text1", u"txtName"), QString::fromUtf8(after));
}

// ---------------------------------------------------------------------------------------------------

TEST(ControlAdded, ANewTextBoxWithTheDefaultOptionsIsEmptiedAndGetsItsProcedures) {
  Scene scene;
  auto text = scene.add(u"TextBox"_qs);
  EXPECT_EQ(scene.shownFor, QStringList{u"Text1"_qs});
  EXPECT_EQ(propertyOf(text, "Text"), QString());
  const QStringList written = {u"Private Sub Text1_GotFocus()"_qs,
                               u"   On Error Resume Next"_qs,
                               u"   Text1.SelStart = 0"_qs,
                               u"   Text1.SelLength = Len(Text1.Text)"_qs,
                               u"End Sub"_qs,
                               u"Private Sub Text1_KeyPress(KeyAscii As Integer)"_qs,
                               u"   KeyAscii = Asc(UCase(Chr(KeyAscii)))"_qs,
                               u"End Sub"_qs};
  EXPECT_EQ(scene.code().mid(scene.code().size() - written.size()), written);

  // A label turns transparent and gets no code; a button gets none either.
  const QStringList before = scene.code();
  auto label = scene.add(u"Label"_qs);
  scene.add(u"CommandButton"_qs);
  EXPECT_EQ(propertyOf(label, "BackStyle"), 0);
  EXPECT_EQ(scene.code(), before);
}

TEST(ControlAdded, ControlArraysGetIndexedProceduresOnceAndCancelChoosesNothing) {
  Scene scene;
  scene.choice = {
      .Cancelled = false, .EnterAsTab = true, .BackColorOnFocus = true, .FocusColor = u"&HC0FFFF&"_qs};
  auto first = scene.form->Designer()->VBControls()->Add(u"TextBox"_qs);
  first->Properties()->Item(u"Name"_qs)->setValue(u"txtItem"_qs);
  first->Properties()->Item(u"Index"_qs)->setValue(0);
  scene.actions.ControlAdded(first);
  EXPECT_EQ(
      scene.code(),
      (QStringList{u"Private Sub txtItem_KeyDown(Index As Integer, KeyCode As Integer, Shift As Integer)"_qs,
                   u"   If (KeyCode = vbKeyReturn) Then"_qs, u"       KeyCode = 0"_qs,
                   u"       SendKeys \"{Tab}\", False"_qs, u"   End If"_qs, u"End Sub"_qs,
                   u"Private Sub txtItem_GotFocus(Index as Integer)"_qs, u"   On Error Resume Next"_qs,
                   u"   txtItem(Index).BackColor = &HC0FFFF&"_qs, u"   txtItem(Index).SelStart = 0"_qs,
                   u"   txtItem(Index).SelLength = Len(txtItem(Index).Text)"_qs, u"End Sub"_qs,
                   u"Private Sub txtItem_LostFocus(Index As Integer)"_qs,
                   u"   txtItem(Index).BackColor = &H80000005&"_qs, u"End Sub"_qs,
                   u"Private Sub txtItem_KeyPress(Index As Integer, KeyAscii As Integer)"_qs,
                   u"   KeyAscii = Asc(UCase(Chr(KeyAscii)))"_qs, u"End Sub"_qs}));

  // The second element of the array finds every procedure there already.
  const QStringList before = scene.code();
  auto second = scene.form->Designer()->VBControls()->Add(u"TextBox"_qs);
  second->Properties()->Item(u"Index"_qs)->setValue(1);
  second->Properties()->Item(u"Name"_qs)->setValue(u"txtItem"_qs);
  scene.actions.ControlAdded(second);
  EXPECT_EQ(scene.code(), before);

  // Cancelled: neither Enter as Tab nor the colour.
  scene.choice = {.Cancelled = true, .EnterAsTab = true, .BackColorOnFocus = true};
  scene.options.SelectTextBoxOnFocus = false;
  scene.options.TextBoxUpperCase = false;
  scene.add(u"TextBox"_qs);
  EXPECT_EQ(scene.code(), before);
  EXPECT_EQ(scene.form->CodeModule()->ProcCountLines(u"txtItem_LostFocus"_qs, ide::ProcKind::Proc), 3);
}

TEST(FormAdded, OnlyNewFormsThatAreNoMdiChildrenAreCentredWithAFixedBorder) {
  Scene scene;
  auto properties = scene.form->Properties();
  scene.actions.FormAdded(scene.form);
  EXPECT_EQ(properties->Item(u"StartUpPosition"_qs)->Value(), 2);
  EXPECT_EQ(properties->Item(u"BorderStyle"_qs)->Value(), 1);

  auto child = scene.project->Add(ide::ComponentType::VBForm);
  child->Properties()->Item(u"MDIChild"_qs)->setValue(true);
  scene.actions.FormAdded(child);
  EXPECT_EQ(child->Properties()->Item(u"StartUpPosition"_qs)->Value(), 3) << "Windows Default";
  EXPECT_EQ(child->Properties()->Item(u"BorderStyle"_qs)->Value(), 2) << "Sizable";

  // A form added from its file keeps its layout.
  scene.project->SaveAs(scene.dir.filePath(u"Projeto.vbp"_qs));
  auto other = host::VbeImpl::create()->newProject();
  auto existing = other->AddFile(child->FileNames(1));
  child->Properties()->Item(u"MDIChild"_qs)->setValue(false);
  scene.actions.FormAdded(existing);
  EXPECT_EQ(existing->Properties()->Item(u"StartUpPosition"_qs)->Value(), 3);
}

TEST(ControlRenamed, TheOldNameIsReplacedAsAnIdentifierOrTheModuleStaysAsItWas) {
  Scene scene;
  scene.options.RenameInCodeOnControlRenamed = true;
  auto module = scene.form->CodeModule();
  module->AddFromString(
      u"Private Sub Text1_Change()\r\n   Text10.Text = Text1.Text & \"Text1\"\r\nEnd Sub"_qs);
  auto text = scene.form->Designer()->VBControls()->Add(u"TextBox"_qs);
  text->Properties()->Item(u"Name"_qs)->setValue(u"txtName"_qs);
  scene.actions.ControlRenamed(text, u"Text1"_qs, -1);
  const QStringList renamed = {u"Private Sub txtName_Change()"_qs,
                               u"   Text10.Text = txtName.Text & \"Text1\""_qs, u"End Sub"_qs};
  EXPECT_EQ(scene.code(), renamed);

  // While the program runs the code cannot be edited: nothing changes, and the handler hears why.
  scene.vbe->setMode(ide::IdeMode::Run);
  text->Properties()->Item(u"Name"_qs)->setValue(u"txtNome"_qs);
  EXPECT_EQ(host::test::errorNumberOf([&] { scene.actions.ControlRenamed(text, u"txtName"_qs, -1); }),
            ide::err::CannotEdit);
  EXPECT_EQ(scene.code(), renamed);
}

// ---------------------------------------------------------------------------------------------------
// The dialogs

void showActive(QWidget& widget) {
  widget.show();
  QApplication::setActiveWindow(&widget);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&widget));
}

QStringList rowsOf(const frmProps& dialog) {
  QStringList rows;
  for (int i = 0; i < frmProps::kRows; ++i)
    if (dialog.txtValor(i)->isVisibleTo(&dialog))
      rows << dialog.lblProp(i)->text() + u'=' + dialog.txtValor(i)->text();
  return rows;
}

TEST(PropertyDialog, OffersTheClassRowsAndWritesTypedValuesInTheirTypes) {
  Scene scene;
  auto text = scene.form->Designer()->VBControls()->Add(u"TextBox"_qs);
  frmProps dialog(text, scene.options, *scene.vbe->headlessUi());
  showActive(dialog);
  EXPECT_EQ(dialog.windowTitle(), u"Quimbel - Propriedades"_qs);
  EXPECT_EQ(rowsOf(dialog),
            (QStringList{u"Name=Text1"_qs, u"Index="_qs, u"Locked=False"_qs, u"MaxLength=0"_qs,
                         u"Multiline=False"_qs, u"ScrollBars=0 - None"_qs, u"ToolTipText="_qs}));
  EXPECT_EQ(dialog.txtCor()->text(), u"&HFFFF&"_qs);

  // Letters in MaxLength are refused with a message naming it; the row keeps its value.
  dialog.txtValor(3)->setFocus();
  dialog.txtValor(3)->setText(u"cinco"_qs);
  dialog.txtValor(4)->setFocus();
  ASSERT_EQ(scene.vbe->headlessUi()->messageBoxes().size(), 1u);
  EXPECT_EQ(scene.vbe->headlessUi()->messageBoxes()[0].prompt,
            u"13 Valor inválido para MaxLength: \"cinco\"."_qs);
  EXPECT_EQ(dialog.txtValor(3)->text(), u"0"_qs);

  // ScrollBars from its list with the Down key, then Enter.
  dialog.txtValor(5)->setFocus();
  ASSERT_TRUE(dialog.cmdSeta()->isVisible());
  QTest::keyClick(dialog.txtValor(5), Qt::Key_Down);
  ASSERT_TRUE(dialog.lstColeta()->isVisible());
  QTest::keyClick(dialog.lstColeta(), Qt::Key_Down);
  QTest::keyClick(dialog.lstColeta(), Qt::Key_Down);
  QTest::keyClick(dialog.lstColeta(), Qt::Key_Return);
  EXPECT_FALSE(dialog.lstColeta()->isVisible());
  EXPECT_EQ(dialog.txtValor(5)->text(), u"2 - Vertical"_qs);

  dialog.txtValor(3)->setFocus();
  dialog.txtValor(3)->setText(u" 5 "_qs);
  dialog.ckEnterTab()->click();
  dialog.txtCor()->setText(u"&hc0ffff"_qs);
  EXPECT_EQ(dialog.txtCor()->text(), u"&HC0FFFF"_qs) << "typed letters turn into capitals";
  dialog.cmdOK()->click();
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_FALSE(dialog.Cancelled());
  EXPECT_TRUE(dialog.EnterAsTab());
  EXPECT_FALSE(dialog.BackColorOnFocus());
  EXPECT_EQ(dialog.FocusColor(), u"&HC0FFFF"_qs);
  EXPECT_EQ(propertyOf(text, "MaxLength"), QVariant::fromValue<qint32>(5));
  EXPECT_EQ(propertyOf(text, "ScrollBars"), 2);
  EXPECT_EQ(propertyOf(text, "Index"), QVariant::fromValue<qint16>(-1));
}

TEST(PropertyDialog, OtherClassesOfferTheirCommonPropertiesAndClosingOtherwiseCancels) {
  Scene scene;
  const std::pair<const char*, QStringList> cases[] = {
      {"HScrollBar", {u"Name=HScroll1"_qs, u"Index="_qs, u"Enabled=True"_qs, u"ToolTipText="_qs}},
      {"Shape", {u"Name=Shape1"_qs, u"Index="_qs}},
  };
  for (const auto& [className, rows] : cases) {
    frmProps dialog(scene.form->Designer()->VBControls()->Add(QString::fromLatin1(className)), scene.options,
                    *scene.vbe->headlessUi());
    showActive(dialog);
    EXPECT_EQ(rowsOf(dialog), rows);
    dialog.close();  // the close box
    EXPECT_TRUE(dialog.Cancelled());
  }
  frmProps dialog(scene.form->Designer()->VBControls()->Add(u"Label"_qs), scene.options,
                  *scene.vbe->headlessUi());
  showActive(dialog);
  dialog.txtCor()->setText(u"amarelo"_qs);
  dialog.cmdOK()->click();
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_EQ(scene.vbe->headlessUi()->messageBoxes().back().prompt,
            u"Erro: valor não numérico informado para a cor do controle no ganho do foco."_qs);
  dialog.cmdCancel()->click();
  EXPECT_TRUE(dialog.Cancelled());
}

TEST(PropertyDialog, EmptiedBoxesTakeTheirDefaults) {
  Scene scene;
  auto button = scene.form->Designer()->VBControls()->Add(u"CommandButton"_qs);
  button->Properties()->Item(u"Index"_qs)->setValue(0);
  frmProps dialog(button, scene.options, *scene.vbe->headlessUi());
  showActive(dialog);
  EXPECT_EQ(rowsOf(dialog).mid(0, 3),
            (QStringList{u"Name=Command1"_qs, u"Index=0"_qs, u"Caption=Command1"_qs}));
  for (int row : {0, 1, 2})
    dialog.txtValor(row)->clear();
  dialog.cmdOK()->click();
  ASSERT_FALSE(dialog.isVisible());
  EXPECT_EQ(propertyOf(button, "Name"), u"Command1"_qs) << "an empty name is the current one";
  EXPECT_EQ(propertyOf(button, "Index"), QVariant::fromValue<qint16>(-1));
  EXPECT_EQ(propertyOf(button, "Caption"), QString());
  EXPECT_TRUE(scene.vbe->headlessUi()->messageBoxes().empty());
}

// On the example group's frmCliente, through the dialog: the focus colour goes only to controls with a
// BackColor and focus events, and comes back as the control had it; a new button joins the cmdAcao array
// by its boxes filled one by one; a name in use is refused in the dialog's language. The form compiles.
TEST(PropertyDialog, OnTheExampleFormWritesWhatCompiles) {
  host::test::ExampleCopy copy;
  const auto vbe = host::VbeImpl::create();
  const auto form = vbe->open(copy.groupFile()).front()->VBComponents()->Item(u"frmCliente"_qs);
  const common::Options options{.ColorOnFocus = u"&HFFFF&"_qs};
  ide::UserInterface& ui = *vbe->headlessUi();
  QStringList typed;  // the Name and Index boxes, filled in one by one
  DesignerActions actions(ui, options, [&](const ide::Ref<ide::VBControl>& control) {
    frmProps d(control, options, ui);
    showActive(d);
    for (int row = 0; row < typed.size(); ++row) {
      d.txtValor(row)->setFocus();
      d.txtValor(row)->setText(typed[row]);
    }
    d.ckBackColor()->click();
    d.cmdOK()->click();
    return PropsChoice{d.Cancelled(), d.EnterAsTab(), d.BackColorOnFocus(), d.FocusColor()};
  });
  for (const char16_t* className : {u"Timer", u"Image", u"CommandButton", u"TextBox"})
    actions.ControlAdded(form->Designer()->VBControls()->Add(QString::fromUtf16(className)));
  typed = QStringList{u"cmdAcao"_qs, u"3"_qs};
  actions.ControlAdded(form->Designer()->VBControls()->Add(u"CommandButton"_qs));
  EXPECT_TRUE(vbe->headlessUi()->messageBoxes().empty());
  const QStringList code = linesOf(*form->CodeModule());
  for (const QString& line :
       {u"   Command1.BackColor = &H8000000F&"_qs, u"   Text1.BackColor = &H80000005&"_qs,
        u"   cmdAcao(Index).BackColor = &H8000000F&"_qs})
    EXPECT_TRUE(code.contains(line)) << line.toStdString();

  frmProps d(form->Designer()->VBControls()->Add(u"CommandButton"_qs), options, ui);
  showActive(d);
  d.txtValor(0)->setText(u"txtNome"_qs);
  d.txtValor(1)->setText(u"1"_qs);
  d.cmdOK()->click();
  EXPECT_TRUE(d.isVisible());
  EXPECT_EQ(vbe->headlessUi()->messageBoxes().back().prompt,
            u"35010 Já existe neste formulário um controle chamado \"txtNome(1)\"."_qs);
  d.cmdCancel()->click();

  vbe->saveAll();
  const auto other = host::VbeImpl::create();
  const auto saved = other->open(copy.groupFile()).front()->VBComponents()->Item(u"frmCliente"_qs);
  EXPECT_EQ(host::test::uncompilableLines(*saved), QStringList());
  EXPECT_EQ(propertyOf(saved->Designer()->VBControls()->Item(u"Command2"_qs), "Index"),
            QVariant::fromValue<qint16>(-1));
}

TEST(OptionsDialog, ShowsTheSettingsAndOkSavesThemIntoTheGlobals) {
  Scene scene;
  common::SettingsStore settings(scene.dir.filePath(u"Quimbel.ini"_qs));
  settings.setFlag(common::setting::FormsBorder, false);
  frmOptions dialog(settings, scene.options, *scene.vbe->headlessUi());
  showActive(dialog);
  EXPECT_EQ(dialog.windowTitle(), u"Quimbel - Opções "_qs);
  EXPECT_FALSE(dialog.checkBox(frmOptions::BorderStyle)->isChecked());
  EXPECT_FALSE(dialog.checkBox(frmOptions::ControlRenamed)->isChecked());
  EXPECT_TRUE(dialog.checkBox(frmOptions::NumIndent)->isChecked());
  QTest::mouseClick(dialog.label(frmOptions::ControlRenamed), Qt::LeftButton);
  dialog.checkBox(frmOptions::NumIndent)->click();
  dialog.setColourChooser([](QWidget*, const QColor&) { return QColor(0, 255, 0); });
  dialog.cmdCor()->click();
  EXPECT_EQ(dialog.txtCor()->text(), u"&HFF00&"_qs);

  dialog.txtCor()->setText(u"FFFF"_qs);
  dialog.cmdOK()->click();
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_EQ(scene.vbe->headlessUi()->messageBoxes().back().prompt,
            u"Erro: valor não numérico informado para a cor dos TextBoxes no ganho do foco."_qs);
  EXPECT_TRUE(scene.options.OneCommandNumIndent) << "nothing saved yet";

  dialog.txtCor()->setText(u"  "_qs);  // empty: the stored colour stays
  dialog.cmdOK()->click();
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_TRUE(scene.options.RenameInCodeOnControlRenamed);
  EXPECT_FALSE(scene.options.OneCommandNumIndent);
  EXPECT_FALSE(scene.options.FormsBorder);
  EXPECT_EQ(scene.options.ColorOnFocus, u"&HFFFF&"_qs);
  EXPECT_EQ(settings.value(common::setting::RenameInCodeOnControlRenamed), u"1"_qs);
}

}  // namespace
}  // namespace designer
