#include "ResponsePlot.h"

#include "Drawing.h"
#include "OutputFile.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <filesystem>

namespace CommandLine {
namespace {

// All in pixels.
constexpr int kWidth = 900;
constexpr int kHeight = 480;
constexpr double kLeft = 70, kRight = 870;
constexpr double kTop = 70, kBottom = 420;
constexpr double kFontSize = 13;
constexpr double kTitleSize = 18;

constexpr double kLowest = 20, kHighest = 20000;  // in Hz
constexpr double kGainStep = 6;                   // between grid lines, in dB

constexpr Color kBackground{1, 1, 1};
constexpr Color kGrid{0.88, 0.89, 0.91};
constexpr Color kZeroLine{0.55, 0.57, 0.60};
constexpr Color kText{0.25, 0.27, 0.30};
constexpr Color kCurve{0.10, 0.40, 0.75};

/// Which point of a text is given; twice the part of the width that is before it.
enum class At { kStart, kMiddle, kEnd };

/// \return the highest gain of the axis, which has as much above as below, in dB.
double GainLimit(const FrequencyResponse& response) {
  double limit = 2 * kGainStep;
  for (const ResponsePoint& point : response) {
    if (std::isfinite(point.gain)) limit = std::max(limit, std::abs(point.gain));
  }
  return std::ceil(limit / kGainStep) * kGainStep;
}

class Plot {
 public:
  Plot(cairo_t* context, double gainLimit) : context_(context), gainLimit_(gainLimit) {}

  void Draw(const FrequencyResponse& response, const std::string& title) {
    SetColor(context_, kBackground);
    cairo_paint(context_);
    cairo_select_font_face(context_, "sans-serif", CAIRO_FONT_SLANT_NORMAL,
                           CAIRO_FONT_WEIGHT_NORMAL);
    DrawTexts(title);
    DrawFrequencies();
    DrawGains();
    DrawCurve(response);
  }

 private:
  static double X(double frequency) {
    return kLeft + (kRight - kLeft) * std::log(frequency / kLowest) / std::log(kHighest / kLowest);
  }

  double Y(double gain) const {
    return kTop + (kBottom - kTop) * (gainLimit_ - gain) / (2 * gainLimit_);
  }

  void DrawText(const std::string& text, double x, double y, At at) {
    cairo_text_extents_t extents;
    cairo_text_extents(context_, text.c_str(), &extents);
    cairo_move_to(context_, x - extents.x_advance * static_cast<int>(at) / 2, y);
    SetColor(context_, kText);
    cairo_show_text(context_, text.c_str());
  }

  void DrawLine(double x1, double y1, double x2, double y2, Color color) {
    cairo_move_to(context_, x1, y1);
    cairo_line_to(context_, x2, y2);
    SetColor(context_, color);
    cairo_set_line_width(context_, 1);
    cairo_stroke(context_);
  }

  void DrawTexts(const std::string& title) {
    cairo_set_font_size(context_, kTitleSize);
    DrawText(title, kLeft, kTop - 34, At::kStart);
    cairo_set_font_size(context_, kFontSize);
    DrawText("gain in dB against the neutral setting, measured with noise, 1/6 octave", kLeft,
             kTop - 14, At::kStart);
    DrawText("frequency in Hz", (kLeft + kRight) / 2, kBottom + 44, At::kMiddle);
  }

  void DrawFrequencies() {
    for (double decade = 10; decade < kHighest; decade *= 10) {
      for (int factor = 1; factor <= 9; ++factor) DrawFrequency(decade * factor, factor);
    }
  }

  void DrawFrequency(double frequency, int factor) {
    if (frequency < kLowest || frequency > kHighest) return;
    DrawLine(X(frequency), kTop, X(frequency), kBottom, kGrid);
    if (factor != 1 && factor != 2 && factor != 5) return;  // there is no room for all
    const std::string label = frequency < 1000 ? fmt::format("{:.0f}", frequency)
                                               : fmt::format("{:.0f}k", frequency / 1000);
    DrawText(label, X(frequency), kBottom + 20, At::kMiddle);
  }

  void DrawGains() {
    for (double gain = -gainLimit_; gain <= gainLimit_; gain += kGainStep) {
      DrawLine(kLeft, Y(gain), kRight, Y(gain), gain == 0 ? kZeroLine : kGrid);
      const std::string label = gain == 0 ? "0" : fmt::format("{:+.0f}", gain);
      DrawText(label, kLeft - 10, Y(gain) + 4, At::kEnd);
    }
  }

  void DrawCurve(const FrequencyResponse& response) {
    cairo_new_path(context_);  // a text leaves a point behind
    for (const ResponsePoint& point : response) {
      if (std::isfinite(point.gain)) cairo_line_to(context_, X(point.frequency), Y(point.gain));
    }
    SetColor(context_, kCurve);
    cairo_set_line_width(context_, 2.5);
    cairo_set_line_join(context_, CAIRO_LINE_JOIN_ROUND);
    cairo_stroke(context_);
    CheckCairo(cairo_status(context_));
  }

  cairo_t* const context_;
  const double gainLimit_;  // in dB
};

void Draw(cairo_surface_t* picture, const FrequencyResponse& response, const std::string& title) {
  const Context context = NewContext(picture);
  Plot(context.get(), GainLimit(response)).Draw(response, title);
}

}  // namespace

void WriteResponsePlot(const std::string& path, const FrequencyResponse& response,
                       const std::string& title) {
  OutputFile file(path);
  const bool vector = std::filesystem::path(path).extension() == ".svg";
  const Surface picture =
      vector ? NewVectorImage(file, kWidth, kHeight) : NewImage(kWidth, kHeight);
  Draw(picture.get(), response, title);
  vector ? FinishVectorImage(picture.get(), file) : WritePng(picture.get(), file);
}

}  // namespace CommandLine
