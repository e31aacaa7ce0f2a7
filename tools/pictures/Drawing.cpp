#include "Drawing.h"

#include "base/Failure.h"
#include "base/OutputFile.h"

#include <cairo-svg.h>
#include <fmt/format.h>

namespace CommandLine {
namespace {

cairo_status_t WriteBytes(void* file, const unsigned char* data, unsigned size) {
  return static_cast<OutputFile*>(file)->Write(data, size) ? CAIRO_STATUS_SUCCESS
                                                           : CAIRO_STATUS_WRITE_ERROR;
}

/// A write's error is the file's to tell, in better words.
void Complete(OutputFile& file, cairo_status_t status) {
  if (status != CAIRO_STATUS_WRITE_ERROR) CheckCairo(status);
  file.Complete();
}

Surface Checked(cairo_surface_t* created) {
  Surface surface(created);
  CheckCairo(cairo_surface_status(created));
  return surface;
}

}  // namespace

void CheckCairo(cairo_status_t status) {
  if (status == CAIRO_STATUS_SUCCESS) return;
  throw Failure(fmt::format("cannot draw the picture: {}", cairo_status_to_string(status)));
}

Surface NewImage(int width, int height) {
  return Checked(cairo_image_surface_create(CAIRO_FORMAT_RGB24, width, height));
}

Surface NewVectorImage(OutputFile& file, double width, double height) {
  return Checked(cairo_svg_surface_create_for_stream(WriteBytes, &file, width, height));
}

Context NewContext(cairo_surface_t* surface) {
  Context context(cairo_create(surface));
  CheckCairo(cairo_status(context.get()));
  return context;
}

void SetColor(cairo_t* context, Color color) {
  cairo_set_source_rgb(context, color.red, color.green, color.blue);
}

void WritePng(cairo_surface_t* picture, OutputFile& file) {
  Complete(file, cairo_surface_write_to_png_stream(picture, WriteBytes, &file));
}

void FinishVectorImage(cairo_surface_t* picture, OutputFile& file) {
  cairo_surface_finish(picture);
  Complete(file, cairo_surface_status(picture));
}

}  // namespace CommandLine
