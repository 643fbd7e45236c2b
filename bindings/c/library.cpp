#include <chrono>
#include <memory>

#include "bindings/c/boundary.h"
#include "image_processing/quality/niqe.h"

using namespace pelorin::c_api;

uint32_t quenby_abi(void) {
  return QUENBY_ABI;
}

const char* quenby_version(void) {
  return PELORIN_VERSION;
}

const char* quenby_niqe_model(void) {
  return pelorin::image_processing::niqeModelId;
}

int32_t quenby_cancel_new(quenby_cancel** cancel, quenby_error* error) {
  if (cancel != nullptr) *cancel = nullptr;
  return guarded(error, [&] {
    required(cancel, "cancel");
    *cancel = new quenby_cancel;
  });
}

int32_t quenby_cancel_new_after(uint32_t milliseconds, quenby_cancel** cancel,
                                quenby_error* error) {
  if (cancel != nullptr) *cancel = nullptr;
  return guarded(error, [&] {
    required(cancel, "cancel");
    auto made = std::make_unique<quenby_cancel>();
    made->limit.emplace(std::chrono::milliseconds(milliseconds), made->source.get_token());
    *cancel = made.release();
  });
}

void quenby_cancel_request(quenby_cancel* cancel) {
  if (cancel != nullptr) cancel->source.request_stop();
}

void quenby_cancel_free(quenby_cancel* cancel) {
  delete cancel;
}
