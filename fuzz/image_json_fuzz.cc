// The account of an assembled root: refused with HostError, or written as it was read.
#include "fuzz/support/input.h"
#include "fuzz/support/require.h"
#include "host/root/image_index.h"
#include "secpolicy/host/host_error.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  try {
    const auto index = StandIn::ParseImageIndex(Fuzz::BytesOf(data, size), "image.json");
    const std::string written = StandIn::FormatImageIndex(index);
    Fuzz::Require(StandIn::ParseImageIndex(written, "image.json") == index,
                  "an account is read as it was written");
    for (const StandIn::TardiskContent& tardisk : index.tardisks) {
      for (const std::string& path : tardisk.paths) {
        Fuzz::Require(path.starts_with("/") && path.find("/../") == std::string::npos,
                      "paths stay within the root");
      }
    }
  } catch (const StandIn::HostError& error) {
    Fuzz::Require(std::string(error.what()).starts_with("image.json:"), "the file is named");
  }
  return 0;
}
