// SPDX-License-Identifier: MIT
// What the numbering and indentation commands share: opening the files, finding the scope, walking it
// with a progress bar, and then writing the changed files, printing a diff or checking.
#pragma once

#include "cli.h"
#include "transform/options.h"
#include "transform/walk.h"

#include <functional>

namespace cli {

/// One command's walks over the three scopes, made for the run's context.
struct Walks {
  std::function<void(const ide::Ref<ide::VBProject>&)> project;
  std::function<void(const ide::Ref<ide::CodeModule>&)> module;
  std::function<void(const ide::Ref<ide::CodeModule>&, const ide::Ref<ide::Member>&)> member;
  /// What the walks advance the bar by.
  transform::ProgressUnit unit = transform::ProgressUnit::Lines;
};

/// Opens every file (nothing is written when one cannot be read), walks the scope the options name and
/// then writes the files whose code changed, keeping everything else in them, or prints the diff, or
/// checks. A walk that fails writes nothing. Returns the exit code.
int runTransform(const TransformOptions& options, const std::function<Walks(transform::WalkContext&)>& walks);

/// The numbering and indentation the options ask for; what they leave out comes from the settings.
transform::NumberingOptions numberingOf(const TransformOptions& options);
transform::IndentationOptions indentationOf(const TransformOptions& options);

}  // namespace cli
