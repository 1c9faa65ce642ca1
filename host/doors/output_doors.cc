// What the library says, handed to whoever uses it in this thread.
#include "core/log.h"
#include "host/doors/library_use.h"

namespace SecPolicy {

using StandIn::LibraryUse;

void LogInfo(const std::string& message) {
  if (LibraryUse* use = LibraryUse::Current()) use->Output().OnInfo(message);
}

void LogError(const std::string& message, const Tavon::Lib::TavonException* failure) {
  if (LibraryUse* use = LibraryUse::Current()) use->Output().OnError(message, failure);
}

void PrintLine(const std::string& text) {
  if (LibraryUse* use = LibraryUse::Current()) use->Output().OnPrint(text);
}

}  // namespace SecPolicy
