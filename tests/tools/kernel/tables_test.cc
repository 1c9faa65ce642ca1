// Tables that change while they are read.
#include "tools/kernel/tables.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <optional>

#include "host/module/description_json.h"
#include "host/module/module_error.h"
#include "tests/support/memory_host.h"

namespace SecPolicyTool {
namespace {

using StandIn::Operation;

// After each count of a domain's rules, the domain has another number of them.
class ChangingTable final : public StandIn::OperationHook {
 public:
  ChangingTable(StandIn::SecurityModule& module, StandIn::DomainId domain,
                std::vector<std::uint32_t> sizes)
      : module_(module), domain_(domain), sizes_(std::move(sizes)) {
    Resize(sizes_.front());
  }

  void Around(const StandIn::OperationCall& call, const StandIn::Callable<void>& proceed) override {
    ++calls;
    if (refusal) throw StandIn::ModuleError(*refusal, "refused");
    proceed();
    if (call.operation == Operation::kCountFileRules && next_ < sizes_.size()) {
      Resize(sizes_[next_++]);
    }
  }

  std::size_t calls = 0;
  std::optional<int> refusal;  // of every call

 private:
  void Resize(std::uint32_t size) {
    for (; size_ < size; ++size_) {
      std::uint32_t taken = 0;
      module_.AddFileRules(domain_, {{0, "/" + std::to_string(size_), 1}}, taken);
    }
    for (; size_ > size; --size_) {
      module_.RemoveFileRule(0, domain_, "/" + std::to_string(size_ - 1));
    }
  }

  StandIn::SecurityModule& module_;
  StandIn::DomainId domain_;
  std::vector<std::uint32_t> sizes_;
  std::size_t next_ = 1;
  std::uint32_t size_ = 0;
};

class TablesTest : public testing::Test {
 protected:
  // Reads the table of a domain whose rules are as many as each of `sizes` in turn.
  std::string ReadFrom(std::vector<std::uint32_t> sizes) {
    const StandIn::DomainId domain =
        host_.Module().CreateDomain("domain", StandIn::DomainOrigin::kPolicy);
    ChangingTable table(host_.Module(), domain, std::move(sizes));
    host_.Add(table);
    const std::size_t size = ReadFileRules(domain).size();
    return std::to_string(size) + " rules after " + std::to_string(table.calls) + " calls";
  }

  SecPolicyTest::MemoryHost host_{
      StandIn::ReadDescription(StandIn::DefaultDescriptionText(), "host.json")};
};

TEST_F(TablesTest, IsReadAtOnceWhenNothingChanges) {
  EXPECT_EQ(ReadFrom({2}), "2 rules after 2 calls");
}

TEST_F(TablesTest, EmptyTableIsEmpty) { EXPECT_EQ(ReadFrom({0}), "0 rules after 2 calls"); }

TEST_F(TablesTest, IsReadAgainWhileRulesAreAdded) {
  EXPECT_EQ(ReadFrom({1, 2, 3}), "3 rules after 6 calls");
}

TEST_F(TablesTest, RulesThatWereRemovedMeanwhileAreNotShown) {
  EXPECT_EQ(ReadFrom({5, 2}), "2 rules after 2 calls");
}

TEST_F(TablesTest, OtherFailuresPass) {
  ChangingTable table(host_.Module(), 0, {0});
  table.refusal = EIO;
  host_.Add(table);
  try {
    ReadFileRules(3);
    FAIL() << "nothing was thrown";
  } catch (const Tavon::Lib::TavonException& failure) {
    EXPECT_STREQ(failure.what(),
                 "Failed to get number of file policies for domain :: 3:Input/output error");
  }
}

}  // namespace
}  // namespace SecPolicyTool
