// SPDX-License-Identifier: MIT
// libgsf as an independent reader and writer of compound files, for the tests. Kept free of Qt: glib's
// headers do not compile after Qt's.
#pragma once

#include <string>
#include <vector>

namespace projinfo::test {

/// Every element below the root as libgsf reads it, sorted: "Storage/" for a storage,
/// "Storage/Stream 42" (with its size) for a stream. One "error: ..." entry when it cannot read the file.
std::vector<std::string> gsfTree(const std::string& path);

/// Writes a file with a storage "TaskList" of `count` streams "Task1" ... each holding the string
/// "[Name](Tarefa N)" in the stream layout, Task7 padded to 5000 bytes. False when libgsf failed.
bool gsfWriteTasks(const std::string& path, int count);

}  // namespace projinfo::test
