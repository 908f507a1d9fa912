// SPDX-License-Identifier: MIT
// `quimbel number`: line numbers for the executable lines of every procedure in the scope, restarting at
// the start number in each procedure.
#include "transform/numberwalk.h"
#include "transformjob.h"

#include <memory>

namespace cli {

int runNumber(const TransformOptions& options) {
  const transform::NumberingOptions numbering = numberingOf(options);
  return runTransform(options, [&](transform::WalkContext& context) {
    auto walk =
        std::make_shared<transform::NumberingWalk>(context, numbering.startNumber, numbering.interval);
    return Walks{[walk](const auto& project) { walk->NumberProject(project, true); },
                 [walk](const auto& module) { walk->NumberModule(module, true); },
                 [walk](const auto& module, const auto& member) { walk->NumberMember(module, member, true); },
                 transform::ProgressUnit::Members};
  });
}

}  // namespace cli
