// What the library refuses something with.
#pragma once

#include <string>

#include "platform/tavon_exception.h"

namespace SecPolicyTest {

// The text of the TavonException that `action` throws; nothing for none. Others pass through.
template <typename Action>
std::string RefusalOf(const Action& action) try {
  action();
  return "";
} catch (const Tavon::Lib::TavonException& failure) {
  return failure.what();
}

}  // namespace SecPolicyTest
