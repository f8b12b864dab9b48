#include "tools/outputs/picture/drawByCairo.h"

#include <cairo-pdf.h>
#include <cairo.h>

#include <cmath>
#include <memory>

#include "tools/outputs/picture/CairoCanvas.h"
#include "tools/outputs/picture/Picture.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kMostPixels = 2e8;  // of a PNG, which is held in memory

cairo_status_t writeToTarget(void* target, const unsigned char* bytes, unsigned count) {
  return static_cast<ByteTarget*>(target)->tryWrite(bytes, count) == count ? CAIRO_STATUS_SUCCESS
                                                                           : CAIRO_STATUS_WRITE_ERROR;
}

cairo_surface_t* createPng(PictureSize size, const std::string& path) {
  constexpr double kScale = PictureOptions::kPixelsPerPoint;
  if (size.width * size.height * kScale * kScale > kMostPixels) {
    throw Refusal(path + ": the picture would have more than " + formatQuantity(kMostPixels, "pixels"),
                  "Make it smaller, or use .svg or .pdf.");
  }
  cairo_surface_t* surface =
      cairo_image_surface_create(CAIRO_FORMAT_RGB24, static_cast<int>(std::lround(size.width * kScale)),
                                 static_cast<int>(std::lround(size.height * kScale)));
  cairo_surface_set_device_scale(surface, kScale, kScale);
  return surface;
}

void check(ByteTarget& target, cairo_status_t status) {
  if (status == CAIRO_STATUS_SUCCESS) return;
  if (target.hasFailed()) target.fail();
  throw Refusal(target.path() + ": cannot be written: " + cairo_status_to_string(status));
}

}  // namespace

void requireCairo(const std::string&) {}

void drawByCairo(ByteTarget& target, PictureFormat format, PictureSize size, const std::function<void(Canvas&)>& draw) {
  const std::unique_ptr<cairo_surface_t, decltype(&cairo_surface_destroy)> surface(
      format == PictureFormat::kPdf
          ? cairo_pdf_surface_create_for_stream(writeToTarget, &target, size.width, size.height)
          : createPng(size, target.path()),
      &cairo_surface_destroy);
  const std::unique_ptr<cairo_t, decltype(&cairo_destroy)> context(cairo_create(surface.get()), &cairo_destroy);
  CairoCanvas canvas(context.get());
  draw(canvas);
  check(target, cairo_status(context.get()));
  if (format == PictureFormat::kPng) {
    check(target, cairo_surface_write_to_png_stream(surface.get(), writeToTarget, &target));
  }
  cairo_surface_finish(surface.get());
  check(target, cairo_surface_status(surface.get()));
}

}  // namespace tools
