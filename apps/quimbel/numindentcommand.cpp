// SPDX-License-Identifier: MIT
// `quimbel numindent`: numbering (or, with --remove, removing numbers) and indenting in one pass, so that
// the numbers stand in a column of their own.
#include "transform/numindent.h"
#include "transformjob.h"

#include <memory>

namespace cli {

int runNumIndent(const TransformOptions& options) {
  const transform::NumberingOptions numbering = numberingOf(options);
  const transform::IndentationOptions indentation = indentationOf(options);
  return runTransform(options, [&](transform::WalkContext& context) {
    auto walk =
        std::make_shared<transform::NumIndentWalk>(context, numbering.startNumber, numbering.interval,
                                                   indentation.mode, indentation.spaces, !options.remove);
    return Walks{[walk](const auto& project) { walk->NumIndentProject(project); },
                 [walk](const auto& module) { walk->NumIndentModule(module); },
                 [walk](const auto& module, const auto& member) { walk->NumIndentMember(module, member); },
                 transform::ProgressUnit::Lines};
  });
}

}  // namespace cli
