// A host for a process that keeps its root directory: enough for the platform's classes.
#pragma once

#include <fcntl.h>

#include "host/attached_host.h"
#include "host/root/image_index.h"
#include "platform/tavon_exception.h"
#include "platform/zek_access.h"
#include "tests/host/trace/trace_fixture.h"
#include "tests/support/temporary_directory.h"

namespace StandIn {

using Tavon::Lib::TavonException;
using ZekCtl::Security::ZekAccessInterfaceImpl;

class AccessTest : public TraceTest {
 protected:
  AccessTest() {
    WriteBytes(root_ / "motd", "hello\n");
    Attach(&attached_);
  }
  ~AccessTest() override { Attach(nullptr); }

  // What `call` throws.
  template <typename Call>
  static std::string ErrorOf(const Call& call) {
    return MessageOf<TavonException>(call);
  }

  TemporaryDirectory root_;
  RootIndex files_{ImageIndex{{{"base.tar", {"/motd"}}}},
                   UniqueFd(open(root_.Path().c_str(), O_PATH | O_CLOEXEC))};
  AttachedHost attached_{observed_, point_, module_, files_};
};

}  // namespace StandIn
