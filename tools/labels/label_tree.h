// Labels of trees of files.
#pragma once

#include <functional>
#include <string>

#include "host/root/file_tree.h"

namespace SecPolicyTool {

// Whether a verb is about one file or about all below it.
enum class Extent { kFile, kTree };

// Hands `visit` the path of each file of `root` that labelling `path` would label: itself, and for
// a tree also the directories, regular files, devices and pipes below it, each directory before its
// content, in the byte order of their names; links and sockets are neither labelled nor followed.
// Throws std::runtime_error "DIR cannot be listed: REASON".
void ForEachLabelled(const StandIn::FileTree& root, const std::string& path, Extent extent,
                     const std::function<void(const std::string& path)>& visit);

}  // namespace SecPolicyTool
