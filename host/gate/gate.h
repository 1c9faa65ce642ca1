// The gate between this process and the kernel.
#pragma once

namespace StandIn {

// From here on, for the rest of this process's life, the private system calls, prctl with the path
// option, and setxattr and getxattr of the label's attribute are answered by the attached host (see
// host/attached_host.h); without one, as by a kernel that has no security module. Everything else
// passes untouched. Does nothing when the gate is there already. Children made by fork have it too.
//
// Enter it only in a process that starts no other program: the filter stays across exec, what
// answers does not, so that a program that made a private call would be killed. Code that is loaded
// later reaches the kernel's own attribute calls.
//
// Throws HostError when the filter cannot be installed, or when calls are not trapped although it
// is, as under an emulator that answers unknown system calls itself (valgrind).
void EnterGate();

}  // namespace StandIn
