#include "Filmstrip.h"

#include "base/Failure.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace CommandLine {
namespace {

using Tizen::Media::VideoFrame;

// All in pixels.
constexpr int kThumbnailSize = 240;  // of the longer side
constexpr int kMargin = 16;          // around and between the thumbnails
constexpr int kCaptionHeight = 26;
constexpr double kCaptionBaseline = 18;
constexpr double kFontSize = 13;
constexpr double kCornerRadius = 4;

constexpr std::size_t kLongestRow = 6;  // in thumbnails, until a square has longer ones

constexpr Color kBackground{0.086, 0.094, 0.114};
constexpr Color kText{0.78, 0.80, 0.84};

Filmstrip::Size ThumbnailSize(const VideoFrame& frame) {
  const double scale = double(kThumbnailSize) / std::max(frame.width, frame.height);
  const auto scaled = [scale](int side) { return std::max(1, int(std::lround(side * scale))); };
  return {scaled(frame.width), scaled(frame.height)};
}

/// 83500 -> "1:23.500"; from an hour on, "1:01:23.500".
std::string FormatTime(long milliseconds) {
  const long seconds = milliseconds / 1000;
  const long minutes = seconds / 60;
  const std::string rest = fmt::format("{:02}.{:03}", seconds % 60, milliseconds % 1000);
  if (minutes < 60) return fmt::format("{}:{}", minutes, rest);
  return fmt::format("{}:{:02}:{}", minutes / 60, minutes % 60, rest);
}

/// Rows and columns, as even as they can be.
struct Grid {
  explicit Grid(std::size_t count) {
    const auto square = static_cast<std::size_t>(std::ceil(std::sqrt(double(count))));
    const std::size_t longest = std::max(kLongestRow, square);
    rows = (count + longest - 1) / longest;
    columns = (count + rows - 1) / rows;
  }
  std::size_t rows;
  std::size_t columns;
};

void AddRoundedRectangle(cairo_t* context, double x, double y, Filmstrip::Size size) {
  constexpr double kQuarter = M_PI / 2;
  const double left = x + kCornerRadius, right = x + size.width - kCornerRadius;
  const double top = y + kCornerRadius, bottom = y + size.height - kCornerRadius;
  cairo_new_sub_path(context);
  cairo_arc(context, right, top, kCornerRadius, -kQuarter, 0);
  cairo_arc(context, right, bottom, kCornerRadius, 0, kQuarter);
  cairo_arc(context, left, bottom, kCornerRadius, kQuarter, 2 * kQuarter);
  cairo_arc(context, left, top, kCornerRadius, 2 * kQuarter, 3 * kQuarter);
  cairo_close_path(context);
}

void DrawThumbnail(cairo_t* context, cairo_surface_t* picture, double center, double y) {
  const Filmstrip::Size size{cairo_image_surface_get_width(picture),
                             cairo_image_surface_get_height(picture)};
  const double x = std::floor(center - size.width / 2.0);
  cairo_set_source_surface(context, picture, x, y);
  AddRoundedRectangle(context, x, y, size);
  cairo_fill(context);
}

void DrawCaption(cairo_t* context, const std::string& text, double center, double baseline) {
  cairo_text_extents_t extents;
  cairo_text_extents(context, text.c_str(), &extents);
  cairo_move_to(context, std::round(center - extents.x_advance / 2), baseline);
  SetColor(context, kText);
  cairo_show_text(context, text.c_str());
}

Surface SurfaceOf(const VideoFrame& frame) {
  Surface surface = NewImage(frame.width, frame.height);
  const unsigned char* from = frame.pixels.data();
  for (int row = 0; row < frame.height; ++row) {
    unsigned char* to = cairo_image_surface_get_data(surface.get()) +
                        std::ptrdiff_t(cairo_image_surface_get_stride(surface.get())) * row;
    for (int column = 0; column < frame.width; ++column, from += 3, to += 4) {
      const std::uint32_t pixel = from[0] * 0x10000u + from[1] * 0x100u + from[2];
      std::memcpy(to, &pixel, sizeof pixel);
    }
  }
  cairo_surface_mark_dirty(surface.get());
  return surface;
}

}  // namespace

void Filmstrip::Add(const VideoFrame& frame, long position) {
  const Size size = ThumbnailSize(frame);
  const Surface full = SurfaceOf(frame);
  Surface small = NewImage(size.width, size.height);
  const Context context = NewContext(small.get());
  cairo_scale(context.get(), double(size.width) / frame.width, double(size.height) / frame.height);
  cairo_set_source_surface(context.get(), full.get(), 0, 0);
  cairo_pattern_set_extend(cairo_get_source(context.get()), CAIRO_EXTEND_PAD);  // no dark edges
  cairo_paint(context.get());
  CheckCairo(cairo_status(context.get()));
  thumbnails_.push_back({std::move(small), FormatTime(position)});
  largest_ = {std::max(largest_.width, size.width), std::max(largest_.height, size.height)};
}

Filmstrip::Size Filmstrip::Write(OutputFile& file) const {
  const Grid grid(Count());
  const int cellWidth = largest_.width + kMargin;
  const int cellHeight = largest_.height + kCaptionHeight + kMargin;
  const Size size{int(grid.columns) * cellWidth + kMargin, int(grid.rows) * cellHeight + kMargin};
  const Surface picture = NewImage(size.width, size.height);
  const Context context = NewContext(picture.get());
  SetColor(context.get(), kBackground);
  cairo_paint(context.get());
  cairo_select_font_face(context.get(), "sans-serif", CAIRO_FONT_SLANT_NORMAL,
                         CAIRO_FONT_WEIGHT_NORMAL);
  cairo_set_font_size(context.get(), kFontSize);
  for (std::size_t i = 0; i < Count(); ++i) {
    const std::size_t column = i % grid.columns;
    const std::size_t row = i / grid.columns;
    const double x = kMargin + double(column) * cellWidth;
    const double y = kMargin + double(row) * cellHeight;
    const double center = x + largest_.width / 2.0;
    DrawThumbnail(context.get(), thumbnails_[i].picture.get(), center, y);
    DrawCaption(context.get(), thumbnails_[i].time, center, y + largest_.height + kCaptionBaseline);
  }
  CheckCairo(cairo_status(context.get()));
  WritePng(picture.get(), file);
  return size;
}

}  // namespace CommandLine
