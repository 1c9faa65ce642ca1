// The decision engine: may a program of this domain do that?
//
// Pure functions of the domain's rules and level and of the operation. Every part of the project
// that has to know what a policy allows asks here.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include "host/engine/domain_rules.h"

namespace StandIn {

// How a domain's rules are applied.
enum class Level : std::uint8_t {
  kEnforcing,   // what the rules do not grant is denied
  kPermissive,  // it is allowed, and recorded as a denial
  kUnconfined,  // everything is allowed; the rules only move programs and label files
};

// The level of a domain that nobody has changed: that of `rootDom`, slot 0, is kUnconfined.
Level StartingLevel(DomainId domain);

// A program's domain.
struct Subject {
  const DomainRules& rules;
  Level level = Level::kEnforcing;
};

// What is accessed.
struct FileObject {
  std::string path;                  // absolute, without links
  std::optional<std::string> label;  // nothing for a file that does not exist or has none
};

struct Verdict {
  bool isAllowed = false;
  bool isDenial = false;            // the rules do not grant it, which is to be recorded
  std::optional<std::size_t> rule;  // the number of the one that decided; nothing for none
};

// Of exec and fork.
struct TransitionVerdict : Verdict {
  // The domain in which the program goes on, and the number of the rule that says so; nothing when
  // it stays in its own, or is not allowed.
  std::optional<std::string> domain;
  std::optional<std::size_t> transition;
};

// Of the creation of a file.
struct CreationVerdict : Verdict {
  // The new file's label; nothing when no rule gives it one, or it is not allowed.
  std::optional<std::string> label;
};

// An access, a word such as "read", to a file. The path rule with the longest path decides that is
// the file's or that of a directory above it, when it has a letter for such an access; where no
// path rule speaks, the "-a" rule of the file's label and the access. Neither: not granted.
Verdict DecideAccess(const Subject& subject, const std::string& access, const FileObject& file);

// The creation of a file of a type, a word such as "fifo", in a directory: the access "create" to
// the directory, then the first granted "-f" rule of the directory's label and that type.
CreationVerdict DecideCreation(const Subject& subject, const std::string& fileType,
                               const FileObject& directory);

// The creation of a Unix socket of a type, a word such as "stream". `label` is the one that the
// socket's file will have, or that of the program's file for an unbound socket.
Verdict DecideSocket(const Subject& subject, const std::string& socketType,
                     const std::string& label);

// A connection to the Unix socket with that file: the access "connect".
Verdict DecideConnection(const Subject& subject, const FileObject& socket);

Verdict DecideSystemCall(const Subject& subject, const std::string& name);

// The use of a capability, with what it is used for where that is known ("tcp/443", "mount"): the
// "-p" rule of both, or else the "-c" rule of the capability.
Verdict DecideCapability(const Subject& subject, const std::string& capability,
                         const std::optional<std::string>& parameter);

// The execution of a program's file: the access "exec" to it, then the first granted "-d" rule of
// its label and the event "exec", which moves the program.
TransitionVerdict DecideExec(const Subject& subject, const FileObject& program);

// A fork of a program that runs from `program`: no rule denies it; the first granted "-d" rule of
// the file's label and the event "fork" moves the new process.
TransitionVerdict DecideFork(const Subject& subject, const FileObject& program);

}  // namespace StandIn
