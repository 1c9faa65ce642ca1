#include "bindings/c/failure.h"

#include <new>
#include <system_error>

#include "tools/query/bad_request.h"

namespace SecPolicyC {

Failure CurrentFailure() {
  try {
    throw;
  } catch (const Failure& failure) {
    return failure;
  } catch (const std::bad_alloc&) {
    return {SECPOLICY_OUT_OF_MEMORY, "out of memory"};
  } catch (const SecPolicyTool::BadRequest& problem) {
    return {SECPOLICY_BAD_REQUEST, problem.what()};
  } catch (const std::system_error& problem) {
    return {SECPOLICY_SYSTEM, problem.what()};
  } catch (const std::exception& problem) {
    return {SECPOLICY_FAILED, problem.what()};
  } catch (...) {
    return {SECPOLICY_SYSTEM, "the work ended in an unknown way"};
  }
}

}  // namespace SecPolicyC
