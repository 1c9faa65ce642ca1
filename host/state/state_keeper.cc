#include "host/state/state_keeper.h"

#include <cerrno>
#include <utility>

#include "host/module/module_error.h"
#include "host/trace/thread_occupation.h"
#include "secpolicy/host/host_error.h"

namespace StandIn {

StateKeeper::StateKeeper(StateFile& file, std::string path, StorableModule& module)
    : file_(file), path_(std::move(path)), module_(module) {
  module_.Save([this](std::string_view part) { initial_ += part; });
}

void StateKeeper::Refresh() {
  if (file_.CurrentVersion() == version_) return;
  const auto text = file_.Open();
  module_.Restore(text ? *text : ReaderOf(initial_), path_);
  version_ = file_.LastVersion();
}

void StateKeeper::Around(const OperationCall& call, const Callable<void>& proceed) {
  const Effect effect = InfoOf(call.operation).effect;
  if (effect == Effect::kNone) return proceed();
  if (batch_) {
    changedInBatch_ |= effect == Effect::kChanges;
    return proceed();
  }
  try {
    if (effect != Effect::kChanges) {
      Refresh();
      return proceed();
    }
    const StateFile::Lock lock(file_);
    Refresh();
    Guarded(proceed);
  } catch (const HostError& failure) {
    throw ModuleError(EIO, failure.what());
  }
}

// A refused operation may have done part of its work, which is kept as well.
void StateKeeper::Guarded(const Callable<void>& proceed) {
  try {
    proceed();
  } catch (...) {
    Write();
    throw;
  }
  Write();
}

void StateKeeper::Write() {
  try {
    file_.Write([this](const TextSink& sink) { module_.Save(sink); });
    version_ = file_.LastVersion();
  } catch (...) {
    // Back to what is kept.
    version_.reset();
    Refresh();
    throw;
  }
}

void StateKeeper::BeginBatch() {
  const OperationScope scope;  // for signal handlers it is one
  batch_.emplace(file_);
  try {
    Refresh();
  } catch (...) {
    batch_.reset();
    throw;
  }
  changedInBatch_ = false;
}

void StateKeeper::Commit() {
  if (!batch_) return;
  const OperationScope scope;
  try {
    if (changedInBatch_) Write();
  } catch (...) {
    batch_.reset();
    throw;
  }
  batch_.reset();
}

}  // namespace StandIn
