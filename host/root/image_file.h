// Reading of image.json together with what it describes.
#pragma once

#include <functional>
#include <optional>

#include "host/root/image_index.h"
#include "host/state/host_directory.h"

namespace StandIn {

// The content of image.json; nothing when the host has not been assembled. `readRest` reads what is
// to belong to the same image: the root file system, the state of the kernel. Since nobody is
// locked out meanwhile, it is called once more whenever the host was assembled anew in between, and
// what it read last counts.
//
// Throws HostError: the errors of OpenFileIfThere and ParseImageIndex, what `readRest` throws, and
// "DIR: was assembled again and again while it was read" after as many attempts as one second has
// room for.
std::optional<ImageIndex> ReadImage(const HostDirectory& host,
                                    const std::function<void()>& readRest);

}  // namespace StandIn
