// SPDX-License-Identifier: MIT
// What a declaring statement introduces: the procedure a header declares, the members a module-level
// declaration names. Statements arrive joined (see joinContinuedLines).
#pragma once

#include "ide/types.h"

#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace syntax {

struct ProcHeader {
  QString name;
  ide::ProcKind kind = ide::ProcKind::Proc;
  bool isFunction = false;
  ide::Scope scope = ide::Scope::Public;
  bool isStatic = false;
};

/// The procedure a header statement declares; nothing when `statement` is not a header.
std::optional<ProcHeader> parseProcHeader(QStringView statement);

struct Declaration {
  ide::MemberType type = ide::MemberType::Variable;
  ide::Scope scope = ide::Scope::Private;
  bool isStatic = false;
  std::vector<QString> names;
};

/// The members a module-level declaration statement introduces (variables, constants, an event, a Declare).
std::optional<Declaration> parseDeclaration(QStringView statement);

}  // namespace syntax
