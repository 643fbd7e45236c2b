#include <memory>
#include <optional>
#include <string>

#include "bindings/c/photos.h"
#include "bindings/c/pixels.h"
#include "bindings/c/workers.h"
#include "image_processing/core/work_stopped.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/filter_photo.h"
#include "photo/photo_error.h"

using namespace pelorin;
using namespace pelorin::c_api;
using namespace pelorin::image_processing;

struct quenby_session {
  quenby_session(std::shared_ptr<Picture> picture, const ImageMetadata& metadata)
      : width(picture->width),
        height(picture->height),
        filters(picture, metadata, "", defaultFilterConfigValue,
                DefaultFilterFactory::filterFactory(), &stoppable) {}

  const uint32_t width, height;
  std::optional<CallersWorkers> workers = {};
  StoppableWorkers stoppable = {};
  FilteredImage filters;
};

int32_t quenby_session_open(const quenby_pixels* pixels, const quenby_face* faces,
                            size_t face_count, uint32_t flags, quenby_session** session,
                            quenby_error* error) {
  if (session != nullptr) *session = nullptr;
  return guarded(error, [&] {
    required(session, "session");
    if (flags > QUENBY_BORROW_PIXELS) refuse("flags", "unknown");
    const auto boxes = facesOf(faces, face_count);
    const auto picture = (flags & QUENBY_BORROW_PIXELS) != 0 ? viewOf(pixels) : copyOf(pixels);
    *session = new quenby_session(picture,
                                  photo::metadataWithFaces(boxes, picture->width, picture->height));
  });
}

int32_t quenby_session_open_photo(const quenby_photo* photo, const quenby_face* faces,
                                  size_t face_count, quenby_session** session,
                                  quenby_error* error) {
  if (session != nullptr) *session = nullptr;
  return guarded(error, [&] {
    required(session, "session");
    const photo::Photo& from = required(photo, "photo").photo;
    const auto boxes = photo::allFaces(facesOf(faces, face_count), from.faces);
    *session = new quenby_session(
        from.image,
        photo::metadataWithFaces(boxes, from.image->width, from.image->height, photo->scale));
  });
}

int32_t quenby_session_apply(quenby_session* session, const char* filter, const char* params,
                             uint8_t* rgba, size_t stride, const quenby_cancel* cancel,
                             quenby_error* error) {
  return guarded(error, [&] {
    required(session, "session");
    const std::string text = params == nullptr ? "" : params;
    const std::string& name = photo::filterFor(&required(filter, "filter"), text).name;
    Output output(rgba, stride, session->width, session->height);
    const std::stop_token stop = tokenOf(cancel);
    photo::stopIfAsked(stop);
    try {
      const StoppableWorkers::Call call(stop);
      session->filters.applyFilterWithParams(name, text, defaultFilterConfigValue,
                                             output.picture());
    } catch (const WorkStopped&) {
      throw photo::Stopped();
    }
    photo::stopIfAsked(stop);
    output.close();
  });
}

int32_t quenby_session_share(quenby_session* session, const quenby_workers* workers,
                             quenby_error* error) {
  return guarded(error, [&] {
    required(session, "session");
    session->workers.emplace(required(workers, "workers"));
    session->stoppable.lend(&*session->workers);
  });
}

void quenby_session_free(quenby_session* session) {
  delete session;
}
