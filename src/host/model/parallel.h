// SPDX-License-Identifier: MIT
// Runs independent pieces of work (reading the files of a project, encoding the files of a save) on every
// core. The pieces must touch nothing but their own objects; the IDE's objects are not shared between them.
#pragma once

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <exception>
#include <thread>
#include <vector>

namespace host {

/// Calls work(i) for i in [0, count), spread over the machine's cores, and returns when all are done.
/// What each call throws is kept in `failures[i]` (resized to `count`), so that the caller can report
/// the first failure in order, as a sequential run would.
template <class Work>
void parallelFor(std::size_t count, Work&& work, std::vector<std::exception_ptr>& failures) {
  failures.assign(count, nullptr);
  std::atomic<std::size_t> next{0};
  auto worker = [&] {
    for (std::size_t i = next++; i < count; i = next++) {
      try {
        work(i);
      } catch (...) {
        failures[i] = std::current_exception();
      }
    }
  };
  const std::size_t threads = std::min<std::size_t>(count, std::max(1u, std::thread::hardware_concurrency()));
  std::vector<std::thread> helpers;
  for (std::size_t t = 1; t < threads; ++t)
    helpers.emplace_back(worker);
  worker();
  for (std::thread& helper : helpers)
    helper.join();
}

}  // namespace host
