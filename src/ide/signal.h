// SPDX-License-Identifier: MIT
// Event sources of the object model. A sink connects a handler and keeps the returned Connection; the
// handler stays connected exactly as long as the Connection lives, so a sink's teardown is its destructor.
#pragma once

#include <exception>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

namespace ide {

namespace detail {
/// Called when an event handler throws: the event source goes on with the next handler, as the IDE does.
void handlerFailed(const std::exception* error) noexcept;
}  // namespace detail

/// Owns one handler's connection; disconnects on destruction. Safe to outlive the event source.
class Connection {
 public:
  Connection() = default;
  explicit Connection(std::function<void()> disconnect) : m_disconnect(std::move(disconnect)) {}
  Connection(Connection&& other) noexcept : m_disconnect(std::exchange(other.m_disconnect, {})) {}
  Connection& operator=(Connection&& other) noexcept {
    if (this != &other) {
      disconnect();
      m_disconnect = std::exchange(other.m_disconnect, {});
    }
    return *this;
  }
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;
  ~Connection() { disconnect(); }

  void disconnect() {
    if (auto d = std::exchange(m_disconnect, {})) d();
  }
  bool connected() const { return static_cast<bool>(m_disconnect); }

 private:
  std::function<void()> m_disconnect;
};

/// A list of handlers called in connection order. Emitting is re-entrant: a handler may emit further
/// events, connect or disconnect handlers; a handler disconnected during an emission is not called.
template <typename... Args>
class Signal {
 public:
  using Handler = std::function<void(Args...)>;

  Signal() : m_state(std::make_shared<State>()) {}
  Signal(const Signal&) = delete;
  Signal& operator=(const Signal&) = delete;

  [[nodiscard]] Connection connect(Handler handler) {
    auto slot = std::make_shared<Slot>(std::move(handler));
    m_state->handlers.push_back(slot);
    std::weak_ptr<State> weakState = m_state;
    std::weak_ptr<Slot> weakSlot = slot;
    return Connection([weakState, weakSlot] {
      auto slot = weakSlot.lock();
      if (!slot) return;
      slot->alive = false;
      if (auto state = weakState.lock()) std::erase(state->handlers, slot);
    });
  }

  void fire(Args... args) const {
    if (m_state->handlers.empty()) return;
    const auto snapshot = m_state->handlers;  // handlers may change the list while we walk it
    for (const auto& slot : snapshot) {
      if (!slot->alive) continue;
      try {
        slot->handler(args...);
      } catch (const std::exception& e) {
        detail::handlerFailed(&e);
      } catch (...) {
        detail::handlerFailed(nullptr);
      }
    }
  }

  bool hasHandlers() const { return !m_state->handlers.empty(); }

 private:
  struct Slot {
    explicit Slot(Handler h) : handler(std::move(h)) {}
    Handler handler;
    bool alive = true;
  };
  struct State {
    std::vector<std::shared_ptr<Slot>> handlers;
  };
  std::shared_ptr<State> m_state;
};

}  // namespace ide
