// A module behind the point that every operation passes.
#pragma once

#include <string>
#include <vector>

#include "host/trace/fault_plan.h"
#include "host/trace/observed_module.h"
#include "host/trace/trace_log.h"
#include "tests/host/module/module_fixture.h"

namespace StandIn {

class TraceTest : public ModuleTest {
 protected:
  TraceTest() {
    point_.Add(trace_);
    point_.Add(faults_);
  }

  // The line that `call` is traced as, or several of them, each with its end.
  std::string TraceOf(const std::function<void()>& call) {
    lines_.clear();
    try {
      call();
    } catch (const std::exception&) {
      // The line says what it was refused with.
    }
    std::string text;
    for (const std::string& line : lines_) text += (text.empty() ? "" : "\n") + line;
    return text;
  }

  std::vector<std::string> lines_;
  TraceLog trace_{[this](const std::string& line) { lines_.push_back(line); }};
  FaultPlan faults_;
  OperationPoint point_;
  ObservedModule observed_{module_, point_};
};

}  // namespace StandIn
