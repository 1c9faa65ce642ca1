#include "core/diagnostics.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "core/log.h"
#include "platform/tavon_strcat.h"

namespace SecPolicy {

using Tavon::Lib::KestMessage;
using Tavon::Lib::TavonException;
using Tavon::Misc::StrCat;

namespace {

[[noreturn]] void ThrowDomainError(const char* what, const std::string& domain, unsigned int line,
                                   const std::string& cause) {
  throw TavonException(
      StrCat("Error in ", what, " policy for domain: ", domain, ": ", line, " : ", cause));
}

}  // namespace

SecPolicyRetryException::SecPolicyRetryException(const std::string& message)
    : TavonException(message) {}

SecPolicyRetryException::SecPolicyRetryException(const std::string& message,
                                                 const KestMessage& structuredMessage)
    : TavonException(message, structuredMessage) {}

SecPolicyRetryException::SecPolicyRetryException(const SecPolicyRetryException&) = default;

SecPolicyRetryException::~SecPolicyRetryException() = default;

void SecpolicyInfo(std::string msg) { LogInfo(msg); }

void SecpolicyError(std::string msg) { LogError(msg, nullptr); }

void RuleSizeError() { throw TavonException("incorrect number of arguments for this rule type"); }

void DisplayHeader(std::string first, std::string second) {
  const std::string dashes(std::max(first.size(), second.size()), '-');
  for (const std::string& line : {std::string(), std::string(), dashes, first, second, dashes}) {
    PrintLine(line);
  }
}

void ThrowDomainParseError(unsigned int line, std::string domain, std::string cause) {
  ThrowDomainError("parsing", domain, line, cause);
}

void ThrowDomainSetError(unsigned int line, std::string domain, std::string cause) {
  ThrowDomainError("setting", domain, line, cause);
}

std::string AtLine(const std::string& file, unsigned int line, const std::string& cause) {
  return StrCat(file, ":", line, " : ", cause);
}

std::string SystemReason() { return std::strerror(errno); }

void LogSummary(bool succeeded, const char* success, const char* failure) {
  succeeded ? SecpolicyInfo(success) : SecpolicyError(failure);
}

}  // namespace SecPolicy
