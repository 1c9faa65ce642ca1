// One of several processes that use one host at the same time.
#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <map>
#include <random>
#include <string>

#include "secpolicy/secpolicy.h"
#include "tests/crash/operation_log.h"

namespace CrashTest {

constexpr std::size_t kUsers = 20;
constexpr std::size_t kDomainsEach = 4;
constexpr std::size_t kContested = 3;
constexpr std::size_t kSlots = 1024;

// What all users know of each other at any moment.
struct Board {
  struct Domain {
    std::atomic<std::uint64_t> changes;  // odd while its owner changes it
    std::atomic<unsigned int> slot;      // its id and 1; 0 when there is no such domain
  };
  std::array<std::array<Domain, kDomainsEach>, kUsers> domains;
  std::array<std::atomic<int>, kSlots> holders;       // of each id: 0 or 1
  std::array<std::atomic<int>, kContested> creators;  // of each name that everybody wants: 0 or 1
  std::atomic<std::int64_t> longestMicroseconds;      // that an operation took
};

// Creates, destroys and looks up domains, and adds, changes, removes and counts file rules, at
// random, by the library's calls, in a host that this process has entered. What reported success is
// logged; an answer that no order of all users' operations explains makes an expectation fail.
class HostUser {
 public:
  // `common` is the domain to which all users add rules. `board` and `log` must outlive this.
  HostUser(std::size_t number, unsigned int common, Board& board, OperationLog& log);

  void DoSomething();
  // Gives back the names that others may want.
  void GiveBackContestedNames();

 private:
  void ChangeOwnDomain();
  void LookUpOwnDomain();
  void LookUpAnothersDomain();
  void TakeContestedName();
  void SetRule();
  void RemoveRule();
  void CountRules();

  unsigned int Create(const std::string& name);
  void Destroy(const std::string& name, unsigned int id);
  // The slot of the domain of that name: its id and 1, or 0.
  unsigned int SlotOf(const std::string& name);
  std::size_t Below(std::size_t end) {
    return std::uniform_int_distribution<std::size_t>(0, end - 1)(random_);
  }
  [[nodiscard]] std::string RandomPath();

  std::size_t number_;
  unsigned int common_;
  Board& board_;
  OperationLog& log_;
  std::mt19937 random_;
  SecPolicy::ZekAccessInterfaceImpl interface_;
  std::map<std::size_t, unsigned int> contested_;  // the names that this user has, and their ids
  std::map<std::string, unsigned int> rules_;      // of this user in the common domain
};

}  // namespace CrashTest
