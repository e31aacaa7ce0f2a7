#include "Batch.h"

namespace Desktop {

Batch::~Batch() {
  for (const OperationPtr& operation : operations_) {
    const bool isSent = operation != nullptr;
    if (isSent && pa_operation_get_state(operation.get()) == PA_OPERATION_RUNNING) {
      pa_operation_cancel(operation.get());
    }
  }
}

int Batch::Await(Connection::Lock& lock, Connection::Time limit) {
  const int error = connection_.Await(lock, limit, [this] { return outstanding_ == 0; });
  return error != SOUND_MANAGER_ERROR_NONE ? error : ToErrorCode(error_);
}

void Batch::OnAnswer(pa_context* context, int success, void* self) {
  static_cast<Batch*>(self)->Finish(success ? PA_OK : pa_context_errno(context));
}

void Batch::OnStreamAnswer(pa_stream* stream, int success, void* self) {
  OnAnswer(pa_stream_get_context(stream), success, self);
}

void Batch::OnOptionalAnswer(pa_context*, int, void* self) {
  static_cast<Batch*>(self)->Finish(PA_OK);
}

void Batch::Finish(int error) {
  if (error_ == PA_OK) error_ = error;
  if (--outstanding_ > 0) return;
  if (error_ == PA_OK && onSuccess_ != nullptr) onSuccess_();
  connection_.NotifyProgress();
}

}  // namespace Desktop
