// SPDX-License-Identifier: MIT
// `quimbel unnumber`: the line numbers of every procedure in the scope removed, the code after them kept.
#include "transform/numberwalk.h"
#include "transformjob.h"

#include <memory>

namespace cli {

int runUnnumber(const TransformOptions& options) {
  return runTransform(options, [](transform::WalkContext& context) {
    // Removing numbers needs neither a start nor an interval.
    auto walk = std::make_shared<transform::NumberingWalk>(context, 0, 0);
    return Walks{
        [walk](const auto& project) { walk->NumberProject(project, false); },
        [walk](const auto& module) { walk->NumberModule(module, false); },
        [walk](const auto& module, const auto& member) { walk->NumberMember(module, member, false); },
        transform::ProgressUnit::Members};
  });
}

}  // namespace cli
