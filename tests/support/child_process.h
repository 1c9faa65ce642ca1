// Parts of a test that run in a process of their own.
#pragma once

#include <sys/types.h>

#include <functional>
#include <string>

namespace StandIn {

// What a test body did in its own process.
enum class ChildResult { kPassed, kFailed, kNotPermitted };

// Forks and runs `body` there; the id of the child. It ends with 0 if `body` neither threw nor made
// an expectation fail.
pid_t StartChild(const std::function<void()>& body);

// Waits for a child; whether it ended with 0.
bool ChildPassed(pid_t child);

// Runs `body` in a child that is not root, whoever runs the test. What it needs must belong to
// `kOrdinaryUser`, or to the user who runs the test if that one isn't root.
inline constexpr uid_t kOrdinaryUser = 65534;
bool PassesAsOrdinaryUser(const std::function<void()>& body);

// Gives `path` to the user as whom PassesAsOrdinaryUser runs.
void GiveToOrdinaryUser(const std::string& path);

// Runs `body` in a child where an empty file system of `bytes` bytes is mounted on `path`, for that
// child alone. kNotPermitted: this user may not mount here.
ChildResult RunOnSmallFileSystem(const std::string& path, std::size_t bytes,
                                 const std::function<void()>& body);

// The same where the directory `from` is mounted on the directory `to`.
ChildResult RunWithMount(const std::string& from, const std::string& to,
                         const std::function<void()>& body);

}  // namespace StandIn
