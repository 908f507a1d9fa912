// SPDX-License-Identifier: MIT
#include "newproc/procgen.h"

#include "common/strings.h"
#include "ide/platform.h"
#include "newproc/texts.h"

#include <QStringList>

#include <algorithm>
#include <iterator>

namespace newproc {
namespace {

// The words the language reserves: statements, markers, operators, the names and forms the compiler
// treats itself, the intrinsic types and literals. Words that are only functions or statements VB lets
// a class reuse (Name, Line, Width, Left, Error ...) are not here: members are often called that.
constexpr QStringView kReservedWords[] = {
    u"Abs",        u"AddressOf", u"And",        u"Any",        u"Array",      u"As",      u"Attribute",
    u"Boolean",    u"ByRef",     u"Byte",       u"ByVal",      u"Call",       u"Case",    u"CBool",
    u"CByte",      u"CCur",      u"CDate",      u"CDbl",       u"CDec",       u"CDecl",   u"CInt",
    u"Circle",     u"CLng",      u"Close",      u"Const",      u"CSng",       u"CStr",    u"Currency",
    u"CVar",       u"CVErr",     u"Date",       u"Debug",      u"Decimal",    u"Declare", u"DefBool",
    u"DefByte",    u"DefCur",    u"DefDate",    u"DefDbl",     u"DefDec",     u"DefInt",  u"DefLng",
    u"DefObj",     u"DefSng",    u"DefStr",     u"DefVar",     u"Dim",        u"Do",      u"DoEvents",
    u"Double",     u"Each",      u"Else",       u"ElseIf",     u"Empty",      u"End",     u"EndIf",
    u"Enum",       u"Eqv",       u"Erase",      u"Event",      u"Exit",       u"False",   u"Fix",
    u"For",        u"Friend",    u"Function",   u"Get",        u"Global",     u"GoSub",   u"GoTo",
    u"If",         u"Imp",       u"Implements", u"In",         u"Input",      u"InputB",  u"Int",
    u"Integer",    u"Is",        u"LBound",     u"Len",        u"LenB",       u"Let",     u"Like",
    u"Lock",       u"Long",      u"Loop",       u"LSet",       u"Me",         u"Mod",     u"New",
    u"Next",       u"Not",       u"Nothing",    u"Null",       u"Object",     u"On",      u"Open",
    u"Option",     u"Optional",  u"Or",         u"ParamArray", u"Preserve",   u"Print",   u"Private",
    u"Property",   u"PSet",      u"Public",     u"Put",        u"RaiseEvent", u"ReDim",   u"Rem",
    u"Resume",     u"Return",    u"RSet",       u"Scale",      u"Seek",       u"Select",  u"Set",
    u"Sgn",        u"Shared",    u"Single",     u"Spc",        u"Static",     u"Stop",    u"String",
    u"Sub",        u"Tab",       u"Then",       u"To",         u"True",       u"Type",    u"TypeOf",
    u"UBound",     u"Unlock",    u"Until",      u"Variant",    u"Wend",       u"While",   u"With",
    u"WithEvents", u"Write",     u"Xor",
};

// The intrinsic types, as the data-type list offers them.
constexpr QStringView kIntrinsicTypes[] = {u"Boolean", u"Byte",    u"Currency", u"Date",
                                           u"Double",  u"Integer", u"Long",     u"Object",
                                           u"Single",  u"String",  u"Variant"};

bool sameWord(QStringView a, QStringView b) {
  return a.compare(b, Qt::CaseInsensitive) == 0;
}

bool isAsciiLetter(QChar c) {
  return (c >= u'a' && c <= u'z') || (c >= u'A' && c <= u'Z');
}

// A letter the modules' code page (Windows-1252) holds: VB takes these inside names ("Ação").
bool isCodePageLetter(QChar c) {
  const char16_t u = c.unicode();
  if (isAsciiLetter(c)) return true;
  if (u >= 0xC0 && u <= 0xFF) return u != 0xD7 && u != 0xF7;
  return u == 0x152 || u == 0x153 || u == 0x160 || u == 0x161 || u == 0x178 || u == 0x17D || u == 0x17E;
}

// Letter first, then letters, digits and underscores, within the length VB takes.
bool hasIdentifierShape(QStringView name) {
  if (name.isEmpty() || name.size() > kMaxIdentifierLength || !isAsciiLetter(name.front())) return false;
  return std::all_of(name.begin(), name.end(),
                     [](QChar c) { return isCodePageLetter(c) || (c >= u'0' && c <= u'9') || c == u'_'; });
}

// A double quote, the caption of the option, a double quote, a blank and the rest of the message.
QString quotedOption(int optionId, int restId) {
  return u'"' + common::LoadResString(optionId) + QStringLiteral("\" ") + common::LoadResString(restId);
}

bool isObjectType(const NewProcChoices& choices) {
  return choices.isObject || sameWord(choices.dataType.trimmed(), u"Object");
}

}  // namespace

bool IsReservedWord(QStringView word) {
  return std::any_of(std::begin(kReservedWords), std::end(kReservedWords),
                     [word](QStringView reserved) { return sameWord(word, reserved); });
}

bool IsVbIdentifier(QStringView name) {
  return hasIdentifierShape(name) && !IsReservedWord(name);
}

bool IsVbTypeName(QStringView type) {
  const qsizetype dot = type.indexOf(u'.');
  if (dot >= 0) return hasIdentifierShape(type.first(dot)) && hasIdentifierShape(type.sliced(dot + 1));
  if (!hasIdentifierShape(type)) return false;
  return !IsReservedWord(type) ||
         std::any_of(std::begin(kIntrinsicTypes), std::end(kIntrinsicTypes),
                     [type](QStringView intrinsic) { return sameWord(type, intrinsic); });
}

QString ScopeWord(const NewProcChoices& choices) {
  QString word;
  switch (choices.scope) {
    case ProcScope::Private:
      word = QStringLiteral("Private ");
      break;
    case ProcScope::Public:
      word = QStringLiteral("Public ");
      break;
    case ProcScope::Friend:
      word = QStringLiteral("Friend ");
      break;
  }
  if (choices.isStatic) word += QStringLiteral("Static ");
  return word;
}

std::vector<ide::ProcKind> KindsToWrite(const NewProcChoices& choices) {
  if (choices.type != ProcType::Property) return {ide::ProcKind::Proc};
  std::vector<ide::ProcKind> kinds;
  if (choices.get) kinds.push_back(ide::ProcKind::Get);
  if (choices.let) kinds.push_back(ide::ProcKind::Let);
  if (choices.set) kinds.push_back(ide::ProcKind::Set);
  return kinds;
}

QString GenerateProcedure(const NewProcChoices& choices, ide::ProcKind kind) {
  const QString name = choices.name.trimmed();
  const QString scope = ScopeWord(choices);
  const QString type = choices.dataType.trimmed();
  const bool eh = choices.errorHandler;
  QStringList lines;
  const auto add = [&lines](const QString& line) { lines << line; };
  const auto handlerStart = [&] {
    if (eh) lines << QStringLiteral("\tOn Error GoTo ErrorHandler") << QString();
  };
  const auto handlerEnd = [&](QStringView exitWord) {
    if (eh) lines << QStringLiteral("\tExit ") + exitWord.toString() << QStringLiteral("ErrorHandler:");
  };

  if (choices.type == ProcType::Sub) {
    add(scope + QStringLiteral("Sub ") + name + QStringLiteral("()"));
    add({});
    handlerStart();
    add(QStringLiteral("\t' Entre com o código aqui "));
    add({});
    handlerEnd(u"Sub");
    add(QStringLiteral("End Sub"));
  } else if (choices.type == ProcType::Function) {
    const QString returned = type.isEmpty() ? QStringLiteral("Variant") : type;
    add(scope + QStringLiteral("Function ") + name + QStringLiteral("() As ") + returned);
    add({});
    handlerStart();
    add(QStringLiteral("\tDim ret As ") + returned);
    add({});
    add(QStringLiteral("\t' Entre com o código aqui "));
    add({});
    // Written without a blank before the equals sign, as the wizard always has.
    add(u'\t' + (choices.isObject ? QStringLiteral("Set ") : QString()) + name + QStringLiteral("= ret"));
    add({});
    handlerEnd(u"Function");
    add(QStringLiteral("End Function"));
  } else {
    const QString member = choices.memberVariable.trimmed();
    switch (kind) {
      case ide::ProcKind::Let:
        add(scope + QStringLiteral("Property Let ") + name + QStringLiteral("(NewValue As ") + type + u')');
        break;
      case ide::ProcKind::Set:
        add(scope + QStringLiteral("Property Set ") + name + QStringLiteral("(NewValue As ") + type + u')');
        break;
      default:
        add(scope + QStringLiteral("Property Get ") + name + QStringLiteral("() As ") + type);
        break;
    }
    add({});
    handlerStart();
    switch (kind) {
      case ide::ProcKind::Let:
        add(u'\t' + member + QStringLiteral(" = newValue"));
        break;
      case ide::ProcKind::Set:
        add(QStringLiteral("\tSet ") + member + QStringLiteral(" = newValue"));
        break;
      default:
        add(u'\t' + (isObjectType(choices) ? QStringLiteral("Set ") : QString()) + name +
            QStringLiteral(" = ") + member);
        break;
    }
    add({});
    handlerEnd(u"Property");
    add(QStringLiteral("End Property"));
  }
  return lines.join(QStringLiteral("\r\n"));
}

QString MemberDeclaration(const NewProcChoices& choices) {
  return QStringLiteral("Private ") + choices.memberVariable.trimmed() + QStringLiteral(" As ") +
         choices.dataType.trimmed();
}

std::optional<Refusal> Validate(const NewProcChoices& choices, const QString& errorHandler,
                                const QString& docHeader) {
  if (choices.errorHandler && errorHandler.trimmed().isEmpty())
    return Refusal{quotedOption(5101, 5102), ide::mb::Exclamation, Field::ErrorHandler};
  if (choices.docHeader && docHeader.trimmed().isEmpty())
    return Refusal{quotedOption(5103, 5104), ide::mb::Exclamation, Field::DocHeader};

  const QString name = choices.name.trimmed();
  // A Function keeps its result in the local "ret", which its own name would clash with.
  if (!IsVbIdentifier(name) || (choices.type == ProcType::Function && sameWord(name, u"ret")))
    return Refusal{common::LoadResString(kInvalidName), ide::mb::Exclamation, Field::Name};

  // The type is checked where it is written: a Function without one returns a Variant; a Sub has none.
  const QString type = choices.dataType.trimmed();
  const bool typeNeeded = choices.type == ProcType::Property;
  if (choices.type != ProcType::Sub && (typeNeeded || !type.isEmpty()) && !IsVbTypeName(type))
    return Refusal{common::LoadResString(kInvalidDataType), ide::mb::Exclamation, Field::DataType};

  if (choices.type != ProcType::Property) return std::nullopt;
  // The member variable may be neither the property itself nor the parameter its Let and Set assign.
  const QString member = choices.memberVariable.trimmed();
  if (!IsVbIdentifier(member) || sameWord(member, name) || sameWord(member, u"NewValue"))
    return Refusal{common::LoadResString(kInvalidMemberVariable), ide::mb::Exclamation,
                   Field::MemberVariable};
  if (!choices.get && !choices.let && !choices.set)
    return Refusal{common::LoadResString(kNoPropertyProcs), ide::mb::Information, Field::PropertyProcs};
  if (choices.isObject && sameWord(type, u"variant") && choices.let != choices.set)
    return Refusal{common::LoadResString(kVariantNeedsLetAndSet), ide::mb::Information, Field::PropertyProcs};
  return std::nullopt;
}

}  // namespace newproc
