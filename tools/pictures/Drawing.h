#pragma once

#include <cairo.h>

#include <memory>

namespace CommandLine {

class OutputFile;

// What pictures are drawn with. Functions throw a `Failure` when the drawing library fails.

struct SurfaceDeleter {
  void operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }
};
using Surface = std::unique_ptr<cairo_surface_t, SurfaceDeleter>;

struct ContextDeleter {
  void operator()(cairo_t* context) const { cairo_destroy(context); }
};
using Context = std::unique_ptr<cairo_t, ContextDeleter>;

struct Color {
  double red, green, blue;
};

void CheckCairo(cairo_status_t status);

/// \return a picture of pixels, black.
Surface NewImage(int width, int height);

/// \return a picture that is written to \p file while it is drawn and is whole when it is finished.
Surface NewVectorImage(OutputFile& file, double width, double height);

Context NewContext(cairo_surface_t* surface);

void SetColor(cairo_t* context, Color color);

/// Writes a picture of pixels and completes the file.
void WritePng(cairo_surface_t* picture, OutputFile& file);

/// Finishes a picture of `NewVectorImage` and completes its file.
void FinishVectorImage(cairo_surface_t* picture, OutputFile& file);

}  // namespace CommandLine
