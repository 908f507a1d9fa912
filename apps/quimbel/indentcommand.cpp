// SPDX-License-Identifier: MIT
// `quimbel indent`: the code of every procedure and declarations section in the scope re-indented with
// tabs or spaces.
#include "transform/indentwalk.h"
#include "transformjob.h"

#include <memory>

namespace cli {

int runIndent(const TransformOptions& options) {
  const transform::IndentationOptions indentation = indentationOf(options);
  return runTransform(options, [&](transform::WalkContext& context) {
    auto walk = std::make_shared<transform::IndentationWalk>(context, indentation.mode, indentation.spaces);
    return Walks{[walk](const auto& project) { walk->IndentProject(project); },
                 [walk](const auto& module) { walk->IndentModule(module); },
                 [walk](const auto& module, const auto& member) { walk->IndentMember(module, member); },
                 transform::ProgressUnit::Lines};
  });
}

}  // namespace cli
