// SPDX-License-Identifier: MIT
// Runs independent pieces of work (reading the files of a project, encoding and writing the files of a
// save, walking modules) on several threads. The pieces must touch nothing but their own objects; the
// IDE's objects are not shared between them.
#pragma once

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <exception>
#include <thread>
#include <vector>

namespace fileio {

/// How many threads `count` pieces of work get: one per core (or at most `limit`), never more than there
/// are pieces, at least one.
inline std::size_t threadsFor(std::size_t count, std::size_t limit = 0) {
  if (limit == 0) limit = std::max(1u, std::thread::hardware_concurrency());
  return std::max<std::size_t>(1, std::min(count, limit));
}

/// The indices [0, count), handed out one at a time to whichever thread asks first.
class WorkQueue {
 public:
  explicit WorkQueue(std::size_t count) : m_count(count) {}
  /// Takes the next index; false when every one has been taken.
  bool take(std::size_t& index) {
    index = m_next++;
    return index < m_count;
  }

 private:
  std::size_t m_count;
  std::atomic<std::size_t> m_next{0};
};

/// Runs worker(w) for every w in [0, threads) at the same time, w = 0 on the calling thread, and returns
/// when every one has returned.
template <class Worker>
void runWorkers(std::size_t threads, Worker&& worker) {
  std::vector<std::thread> helpers;
  for (std::size_t w = 1; w < threads; ++w)
    helpers.emplace_back([&worker, w] { worker(w); });
  worker(std::size_t{0});
  for (std::thread& helper : helpers)
    helper.join();
}

/// Calls work(i) for i in [0, count) on up to threadsFor(count, limit) threads, and returns when all are
/// done. What each call throws is kept in `failures[i]` (resized to `count`), so that the caller can
/// report the first failure in order, as a sequential run would.
template <class Work>
void parallelFor(std::size_t count, Work&& work, std::vector<std::exception_ptr>& failures,
                 std::size_t limit = 0) {
  failures.assign(count, nullptr);
  WorkQueue queue(count);
  runWorkers(threadsFor(count, limit), [&](std::size_t) {
    for (std::size_t i = 0; queue.take(i);) {
      try {
        work(i);
      } catch (...) {
        failures[i] = std::current_exception();
      }
    }
  });
}

}  // namespace fileio
