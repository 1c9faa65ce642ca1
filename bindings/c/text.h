// Results as texts.
#pragma once

#include <memory>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <utility>

#include "bindings/c/arguments.h"
#include "bindings/c/barrier.h"
#include "bindings/c/child.h"
#include "bindings/c/handles.h"
#include "tools/policy/output.h"

namespace SecPolicyC {

// A function whose result is a text alone: `prepare` reads the arguments and returns the work, a
// callable that gives the JSON and is called in a child.
template <typename Prepare>
secpolicy_status AnswerWithText(secpolicy_text** result, secpolicy_error** error,
                                const Prepare& prepare) noexcept {
  if (result != nullptr) *result = nullptr;
  return Guarded(error, [&] {
    RequireSet(result, "result");
    const auto work = prepare();
    Fields answer = InChild([&] { return Fields{SecPolicyTool::TextOfJson(work())}; });
    *result = std::make_unique<secpolicy_text>(std::move(answer.at(0))).release();
  });
}

}  // namespace SecPolicyC
