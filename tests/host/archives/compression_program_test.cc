// Compressions that the archive library leaves to programs.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>

#include "tests/host/root/host_fixture.h"

namespace StandIn {
namespace {

// Programs of these names stand first on the way; each leaves a file behind when it is started.
class CompressionProgramTest : public HostFixture {
 protected:
  CompressionProgramTest() {
    for (const char* name : {"lrzip", "grzip", "lzop", "unlzop", "gzip", "bzip2", "xz", "zstd"}) {
      const std::string program = programs_ / name;
      WriteBytes(program, "#!/bin/sh\n: > '" + Trace() + "'\n");
      EXPECT_EQ(::chmod(program.c_str(), S_IRWXU), 0);
    }
    ::setenv("PATH", (programs_.Path() + ":" + path_).c_str(), 1);
  }
  ~CompressionProgramTest() override { ::setenv("PATH", path_.c_str(), 1); }

  [[nodiscard]] std::string Trace() const { return programs_ / "was-started"; }
  [[nodiscard]] bool WasStarted() const { return std::filesystem::exists(Trace()); }

 private:
  const std::string path_ = std::getenv("PATH");
  TemporaryDirectory programs_;
};

TEST_F(CompressionProgramTest, NoArchiveStartsAProgram) {
  using namespace std::string_literals;
  for (const std::string& beginning :
       {"LRZI\0\6"s, "GRZipII\0\2\4:)"s, "\x89LZO\0\r\n\x1a\n\x10\x30\x20\x90"s}) {
    Tardisk("new.tar", beginning + std::string(4096, 'x'));
    EXPECT_EQ(AssembleError(), Path("tardisks/new.tar: at byte 0: Unrecognized archive format"));
    EXPECT_FALSE(WasStarted()) << beginning;
  }
}

}  // namespace
}  // namespace StandIn
