// What this process has open.
#pragma once

namespace SecPolicyTest {

// How many descriptors this process has open.
int OpenDescriptors();

}  // namespace SecPolicyTest
