// Results as texts.
#pragma once

#include <memory>
#include <nlohmann/json_fwd.hpp>

#include "bindings/c/arguments.h"
#include "bindings/c/barrier.h"
#include "bindings/c/handles.h"
#include "tools/policy/output.h"

namespace SecPolicyC {

// A function whose result is a text alone: `prepare` reads the arguments and returns the work, a
// callable that gives the JSON.
template <typename Prepare>
secpolicy_status AnswerWithText(secpolicy_text** result, secpolicy_error** error,
                                const Prepare& prepare) noexcept {
  if (result != nullptr) *result = nullptr;
  return Guarded(error, [&] {
    RequireSet(result, "result");
    const auto work = prepare();
    *result = std::make_unique<secpolicy_text>(SecPolicyTool::TextOfJson(work())).release();
  });
}

}  // namespace SecPolicyC
