// The order of virtual functions, with which programs were compiled: a function in another slot is
// another function for them.
#include <gtest/gtest.h>

#include <memory>
#include <new>

#include "domain/file_path_access_rules.h"
#include "domain/keyword_rules.h"
#include "tardisk/tardisk_exception_rules.h"
#include "tests/abi/vtable.h"

namespace SecPolicyTest {
namespace {

using SecPolicy::PolicyRules;
using SecPolicy::TardiskRules;
using Tavon::Lib::TavonException;

// ---- Functions -----------------------------------------------------------------------------

TEST(SlotsTest, ExceptionsTextStandsBehindTheDestructors) {
  EXPECT_EQ(SlotOf(&std::exception::what), 2);
  EXPECT_EQ(SlotOf(&TavonException::what), 2);
  EXPECT_EQ(SlotOf(&SecPolicy::SecPolicyRetryException::what), 2);
}

template <typename Rules>
void ExpectOrderOfPolicyRules() {
  EXPECT_EQ(SlotOf(&Rules::AddRule), 0);
  EXPECT_EQ(SlotOf(&Rules::Set), 1);
  EXPECT_EQ(SlotOf(&Rules::ReadSystemRules), 2);
  EXPECT_EQ(SlotOf(&Rules::CheckConstraints), 3);
  EXPECT_EQ(SlotOf(&Rules::PrintRules), 4);
}

TEST(SlotsTest, RuleSets) {
  ExpectOrderOfPolicyRules<PolicyRules>();
  ExpectOrderOfPolicyRules<SecPolicy::FilePathAccessRules>();
  ExpectOrderOfPolicyRules<SecPolicy::SyscallRules>();
  ExpectOrderOfPolicyRules<SecPolicy::CapabilityRules>();
  ExpectOrderOfPolicyRules<SecPolicy::ObjectAccessRules>();
  ExpectOrderOfPolicyRules<SecPolicy::DomTransRules>();
  ExpectOrderOfPolicyRules<SecPolicy::FileCreationRules>();
  ExpectOrderOfPolicyRules<SecPolicy::UnixSockCreationRules>();
  ExpectOrderOfPolicyRules<SecPolicy::CapabilityParamRules>();
}

TEST(SlotsTest, TardiskRuleSets) {
  EXPECT_EQ(SlotOf(&TardiskRules::AddRule), 0);
  EXPECT_EQ(SlotOf(&TardiskRules::Set), 1);
  EXPECT_EQ(SlotOf(&SecPolicy::TardiskExceptionRules::AddRule), 0);
  EXPECT_EQ(SlotOf(&SecPolicy::TardiskExceptionRules::Set), 1);
}

TEST(SlotsTest, FunctionThatIsNotVirtualHasNone) {
  EXPECT_EQ(SlotOf(&PolicyRules::Keyword), -1);
  EXPECT_EQ(SlotOf(&TavonException::StructuredMessage), -1);
}

// ---- Destructors ---------------------------------------------------------------------------
//
// There is no pointer to them: each slot is called, and what happened is looked at. The complete
// destructor stands before the deleting one.

struct Ends {
  int destroyed = 0;
  int deleted = 0;
  bool operator==(const Ends&) const = default;
};

Ends ends;

// Counts the ends of its objects; `Base` is what is looked at through its table.
template <typename Base>
class Counted : public Base {
 public:
  using Base::Base;
  ~Counted() override { ++ends.destroyed; }
  // NOLINTNEXTLINE(misc-new-delete-overloads): only deletions are counted
  static void operator delete(void* memory) noexcept {
    ++ends.deleted;
    ::operator delete(memory);
  }
};

class SomePolicyRules : public PolicyRules {
 public:
  void AddRule(unsigned int, std::string, unsigned int, std::queue<std::string>,
               SecPolicy::ZekAccessInterfaceImpl&) override {}
  void Set(SecPolicy::ZekAccessInterfaceImpl&) override {}
  void ReadSystemRules(unsigned int, SecPolicy::ZekAccessInterfaceImpl&) override {}
  void CheckConstraints(std::string, SecPolicy::ZekAccessInterfaceImpl&) override {}
  void PrintRules() override {}
};

class SomeTardiskRules : public TardiskRules {
 public:
  void AddRule(unsigned int, std::string, std::string, std::queue<std::string>,
               SecPolicy::ZekAccessInterfaceImpl&) override {}
  void Set(SecPolicy::ZekAccessInterfaceImpl&) override {}
};

template <typename Object, typename... Arguments>
void ExpectDestructorsAt(std::size_t complete, Arguments... arguments) {
  ends = {};
  alignas(Object) std::byte memory[sizeof(Object)];
  CallSlot(new (memory) Object(arguments...), complete);
  EXPECT_EQ(ends, (Ends{.destroyed = 1, .deleted = 0})) << "slot " << complete;

  ends = {};
  auto object = std::make_unique<Object>(arguments...);
  CallSlot(object.release(), complete + 1);
  EXPECT_EQ(ends, (Ends{.destroyed = 1, .deleted = 1})) << "slot " << complete + 1;
}

TEST(SlotsTest, DestructorsOfExceptionsComeFirst) {
  ExpectDestructorsAt<Counted<TavonException>>(0, "text");
  ExpectDestructorsAt<Counted<SecPolicy::SecPolicyRetryException>>(0, "text");
}

TEST(SlotsTest, DestructorsOfRuleSetsComeLast) {
  ExpectDestructorsAt<Counted<SomePolicyRules>>(5);
  ExpectDestructorsAt<Counted<SomeTardiskRules>>(2);
}

TEST(SlotsTest, DestructorsOfARuleTypeComeLast) {
  ExpectDestructorsAt<Counted<SecPolicy::SyscallRules>>(5);
  ExpectDestructorsAt<Counted<SecPolicy::FilePathAccessRules>>(5);
  ExpectDestructorsAt<Counted<SecPolicy::TardiskExceptionRules>>(2);
}

}  // namespace
}  // namespace SecPolicyTest
