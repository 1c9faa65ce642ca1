// What becomes of what the library says.
#pragma once

#include <set>
#include <string>
#include <vector>

#include "host/doors/library_use.h"

namespace SecPolicyTool {

// Keeps the errors, in order; progress and displays are dropped.
class ErrorList final : public StandIn::LibraryOutput {
 public:
  void OnInfo(const std::string&) override {}
  void OnError(const std::string& message, const Tavon::Lib::TavonException*) override {
    errors_.push_back(message);
    if (StandIn::LibraryUse::Current()->TakeDescriptorShortage()) shortages_.insert(message);
  }
  void OnPrint(const std::string&) override {}

  [[nodiscard]] std::vector<std::string>& Errors() noexcept { return errors_; }
  // Those that there were not enough descriptors for.
  [[nodiscard]] const std::set<std::string>& Shortages() const noexcept { return shortages_; }

 private:
  std::vector<std::string> errors_;
  std::set<std::string> shortages_;
};

// Progress and errors go to the system log, errors to standard error too, displays to standard
// output: what the library does in a program of its own.
class SystemLog final : public StandIn::LibraryOutput {
 public:
  // The log's messages are those of "secpolicy".
  SystemLog();

  void OnInfo(const std::string& message) override;
  void OnError(const std::string& message, const Tavon::Lib::TavonException*) override;
  void OnPrint(const std::string& line) override;
};

// Sends a message to the system log: progress, or an error in the form of the library.
void LogProgress(const std::string& message);
void LogFailure(const std::string& message);

}  // namespace SecPolicyTool
