// The one point that every operation on the module passes.
#pragma once

#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "host/trace/operation.h"
#include "host/trace/thread_occupation.h"

namespace StandIn {

// A reference to something callable that lives as long as the call it is passed to.
template <typename Result>
class Callable {
 public:
  template <typename Function>
  explicit Callable(const Function& function)
      : function_(&function),
        call_([](const void* f) -> Result { return (*static_cast<const Function*>(f))(); }) {}

  Result operator()() const { return call_(function_); }

 private:
  const void* function_;
  Result (*call_)(const void*);
};

// One operation on its way. The words are put together only for who asks.
struct OperationCall {
  Operation operation;
  Callable<std::string> words;
};

// For operations without arguments.
inline constexpr auto kNoWords = [] { return std::string(); };

// Something that surrounds every operation.
class OperationHook {
 public:
  virtual ~OperationHook() = default;

  // Runs the operation by calling `proceed` once, or refuses it by throwing ModuleError instead.
  // What `proceed` throws must be passed on.
  virtual void Around(const OperationCall& call, const Callable<void>& proceed) = 0;
};

// Leads every operation through the hooks, the first one added outermost.
class OperationPoint {
 public:
  // `hook` must outlive this object.
  void Add(OperationHook& hook) { hooks_.push_back(&hook); }

  // Runs `action`, surrounded by the hooks, and returns what it returns. `words` yields the
  // operation's arguments as text. Throws ModuleError EDEADLK within another operation of the
  // thread.
  template <typename Words, typename Action>
  auto Pass(Operation operation, const Words& words, const Action& action) const {
    const OperationScope scope;
    const OperationCall call{operation, Callable<std::string>(words)};
    using Result = std::invoke_result_t<Action>;
    if constexpr (std::is_void_v<Result>) {
      Run(0, call, Callable<void>(action));
    } else {
      std::optional<Result> result;
      const auto keepResult = [&] { result.emplace(action()); };
      Run(0, call, Callable<void>(keepResult));
      return std::move(*result);
    }
  }

 private:
  void Run(std::size_t hook, const OperationCall& call, const Callable<void>& action) const {
    if (hook == hooks_.size()) return action();
    const auto proceed = [&] { Run(hook + 1, call, action); };
    hooks_[hook]->Around(call, Callable<void>(proceed));
  }

  std::vector<OperationHook*> hooks_;
};

}  // namespace StandIn
