#include "secpolicy/secpolicy_c.h"

extern "C" uint32_t secpolicy_c_version(void) {
  return SECPOLICY_C_VERSION_MAJOR * 65536U + SECPOLICY_C_VERSION_MINOR;
}
