// What the kernel answers to ordinary system calls that concern the security module.
#pragma once

#include "host/kernel/private_call_answers.h"

namespace StandIn {

// Whether the call is one that the module answers: any but those for other attributes. Safe in
// signal handlers.
bool ConcernsModule(long number, const CallArguments& arguments) noexcept;

// Each answers as a system call does: a result, or a negative errno. Addresses may be anything.
// None throws.

// prctl with the option that resolves a path.
long AnswerResolvePath(const AttachedHost& host, const CallArguments& arguments) noexcept;

// setxattr and getxattr. Attributes other than the label's are the kernel's, which is asked for
// them.
long AnswerSetAttribute(const AttachedHost& host, const CallArguments& arguments) noexcept;
long AnswerGetAttribute(const AttachedHost& host, const CallArguments& arguments) noexcept;

}  // namespace StandIn
