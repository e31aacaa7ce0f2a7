#include "SoundPlot.h"

#include "Drawing.h"
#include "base/OutputFile.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <utility>

namespace CommandLine {
namespace {

// All in pixels.
constexpr int kWidth = 900;
constexpr int kHeader = 50;
constexpr int kPanelHeight = 400;
constexpr double kLeft = 70, kRight = 870;
constexpr double kTop = 30, kBottom = 345;  // of a panel
constexpr double kFontSize = 13;
constexpr double kTitleSize = 18;

constexpr double kLowest = 20, kHighest = 20000;  // in Hz
constexpr double kGainStep = 6;                   // between grid lines, in dB
constexpr double kLevelStep = 10;                 // the same, of levels
constexpr double kSoftest = -60;                  // in dB of full scale
constexpr double kFloor = -80;                    // of the decay, in dB
constexpr double kDecayBegin = -0.1, kDecayEnd = 2.5, kDecayStep = 0.5;  // in seconds

// What is enough to be drawn, in dB: another gain at another level, and a decay after a moment.
constexpr double kBend = 1;
constexpr double kLoudestBend = -12;  // above, the limiter may be at work
constexpr double kAudibleDecay = -60;
constexpr double kMoment = 0.1;  // in seconds
constexpr double kFlat = 1;      // standard deviation of a response

constexpr Color kBackground{1, 1, 1};
constexpr Color kGrid{0.88, 0.89, 0.91};
constexpr Color kReference{0.55, 0.57, 0.60};
constexpr Color kText{0.25, 0.27, 0.30};
constexpr Color kCurve{0.10, 0.40, 0.75};

/// Which point of a text is given; twice the part of the width that is before it.
enum class At { kStart, kMiddle, kEnd };

using Points = std::vector<std::pair<double, double>>;

struct Axis {
  double Place(double value) const {
    return isLogarithmic ? std::log(value / begin) / std::log(end / begin)
                         : (value - begin) / (end - begin);
  }

  double begin;
  double end;
  bool isLogarithmic = false;
};

struct GridLine {
  double value;
  std::string label;
};

struct Panel {
  std::string subtitle;
  std::string abscissa;
  Axis x, y;
  std::vector<GridLine> columns, rows;
  Points reference, curve;
};

/// \return the highest gain of the axis, which has as much above as below, in dB.
double GainLimit(const FrequencyResponse& response) {
  double limit = 2 * kGainStep;
  for (const ResponsePoint& point : response) {
    if (std::isfinite(point.gain)) limit = std::max(limit, std::abs(point.gain));
  }
  return std::ceil(limit / kGainStep) * kGainStep;
}

std::vector<GridLine> Frequencies() {
  std::vector<GridLine> lines;
  for (const double decade : {10, 100, 1000, 10000}) {
    for (int factor = 1; factor <= 9; ++factor) {
      const double frequency = decade * factor;
      if (frequency < kLowest || frequency >= kHighest) continue;
      const bool hasRoom = factor == 1 || factor == 2 || factor == 5;
      const std::string label = frequency < 1000 ? fmt::format("{:.0f}", frequency)
                                                 : fmt::format("{:.0f}k", frequency / 1000);
      lines.push_back({frequency, hasRoom ? label : ""});
    }
  }
  lines.push_back({kHighest, "20k"});
  return lines;
}

/// \param format of a label
std::vector<GridLine> Steps(double begin, double end, double step, const char* format) {
  std::vector<GridLine> lines;
  const long count = std::lround(std::floor((end - begin) / step + 0.01));
  for (long i = 0; i <= count; ++i) {
    const double value = begin + double(i) * step;
    lines.push_back({value, value == 0 ? "0" : fmt::format(fmt::runtime(format), value)});
  }
  return lines;
}

Panel ResponsePanel(const FrequencyResponse& response) {
  const double limit = GainLimit(response);
  Panel panel{"gain in dB against the neutral setting, measured with noise, 1/6 octave",
              "frequency in Hz",
              {kLowest, kHighest, true},
              {-limit, limit},
              Frequencies(),
              Steps(-limit, limit, kGainStep, "{:+.0f}"),
              {{kLowest, 0}, {kHighest, 0}},
              {}};
  for (const ResponsePoint& point : response) panel.curve.emplace_back(point.frequency, point.gain);
  return panel;
}

Panel LevelPanel(const std::vector<LevelPoint>& levels) {
  Panel panel{"output in dB of full scale, a tone of 1 kHz; grey: unchanged",
              "input in dB of full scale",
              {kSoftest, 0},
              {kSoftest, 0},
              Steps(kSoftest, 0, kLevelStep, "{:.0f}"),
              Steps(kSoftest, 0, kLevelStep, "{:.0f}"),
              {{kSoftest, kSoftest}, {0, 0}},
              {}};
  for (const LevelPoint& point : levels) panel.curve.emplace_back(point.input, point.output);
  return panel;
}

Points ToPoints(const std::vector<DecayPoint>& decay) {
  Points points;
  for (const DecayPoint& point : decay) {
    if (point.time <= kDecayEnd) points.emplace_back(point.time, std::max(point.level, kFloor));
  }
  return points;
}

Panel DecayPanel(const SoundMeasurement& measurement) {
  return {"level in dB after noise that ends at 0; grey: unchanged",
          "time in seconds",
          {kDecayBegin, kDecayEnd},
          {kFloor, 0},
          Steps(0, kDecayEnd, kDecayStep, "{:.1f}"),
          Steps(kFloor, 0, 2 * kLevelStep, "{:.0f}"),
          ToPoints(measurement.neutralDecay),
          ToPoints(measurement.decay)};
}

/// \return how far the gains at different levels are apart, in dB.
double BendOf(const std::vector<LevelPoint>& levels) {
  double least = 0, most = 0;
  for (const LevelPoint& point : levels) {
    const double gain = point.output - point.input - (levels.front().output - kSoftest);
    if (point.input > kLoudestBend) break;
    least = std::min(least, gain);
    most = std::max(most, gain);
  }
  return most - least;
}

bool IsHeardAfterwards(const std::vector<DecayPoint>& decay) {
  return std::any_of(decay.begin(), decay.end(), [](const DecayPoint& point) {
    return point.time > kMoment && point.level > kAudibleDecay;
  });
}

/// A reverb's few peaks at low frequencies count for little.
bool IsFlat(const FrequencyResponse& response) {
  double sum = 0, squares = 0;
  for (const ResponsePoint& point : response) {
    sum += point.gain;
    squares += point.gain * point.gain;
  }
  const double mean = sum / double(response.size());
  return std::sqrt(squares / double(response.size()) - mean * mean) < kFlat;
}

std::vector<Panel> PanelsOf(const SoundMeasurement& measurement) {
  std::vector<Panel> panels;
  if (BendOf(measurement.levels) > kBend) panels.push_back(LevelPanel(measurement.levels));
  if (IsHeardAfterwards(measurement.decay)) panels.push_back(DecayPanel(measurement));
  if (panels.empty() || !IsFlat(measurement.response)) {
    panels.insert(panels.begin(), ResponsePanel(measurement.response));
  }
  return panels;
}

class Plot {
 public:
  explicit Plot(cairo_t* context) : context_(context) {
    SetColor(context_, kBackground);
    cairo_paint(context_);
    cairo_select_font_face(context_, "sans-serif", CAIRO_FONT_SLANT_NORMAL,
                           CAIRO_FONT_WEIGHT_NORMAL);
  }

  void DrawTitle(const std::string& title) {
    cairo_set_font_size(context_, kTitleSize);
    DrawText(title, kLeft, kHeader - 14, At::kStart);
    cairo_set_font_size(context_, kFontSize);
    cairo_translate(context_, 0, kHeader);
  }

  /// Below the one before.
  void Draw(const Panel& panel) {
    DrawText(panel.subtitle, kLeft, kTop - 14, At::kStart);
    DrawText(panel.abscissa, (kLeft + kRight) / 2, kBottom + 40, At::kMiddle);
    DrawGrid(panel);
    cairo_set_line_width(context_, 1.5);
    DrawCurve(panel, panel.reference, kReference);
    cairo_set_line_width(context_, 2.5);
    DrawCurve(panel, panel.curve, kCurve);
    cairo_translate(context_, 0, kPanelHeight);
  }

 private:
  static double X(const Panel& panel, double value) {
    return kLeft + (kRight - kLeft) * panel.x.Place(value);
  }

  static double Y(const Panel& panel, double value) {
    return kBottom - (kBottom - kTop) * panel.y.Place(value);
  }

  void DrawText(const std::string& text, double x, double y, At at) {
    cairo_text_extents_t extents;
    cairo_text_extents(context_, text.c_str(), &extents);
    cairo_move_to(context_, x - extents.x_advance * static_cast<int>(at) / 2, y);
    SetColor(context_, kText);
    cairo_show_text(context_, text.c_str());
  }

  void DrawLine(double x1, double y1, double x2, double y2) {
    cairo_move_to(context_, x1, y1);
    cairo_line_to(context_, x2, y2);
    SetColor(context_, kGrid);
    cairo_set_line_width(context_, 1);
    cairo_stroke(context_);
  }

  void DrawGrid(const Panel& panel) {
    for (const auto& [value, label] : panel.columns) {
      const double x = X(panel, value);
      DrawLine(x, kTop, x, kBottom);
      DrawText(label, x, kBottom + 20, At::kMiddle);
    }
    for (const auto& [value, label] : panel.rows) {
      const double y = Y(panel, value);
      DrawLine(kLeft, y, kRight, y);
      DrawText(label, kLeft - 10, y + 4, At::kEnd);
    }
  }

  void DrawCurve(const Panel& panel, const Points& points, Color color) {
    cairo_new_path(context_);  // a text leaves a point behind
    for (const auto& [x, y] : points) {
      if (std::isfinite(y)) cairo_line_to(context_, X(panel, x), Y(panel, y));
    }
    SetColor(context_, color);
    cairo_set_line_join(context_, CAIRO_LINE_JOIN_ROUND);
    cairo_stroke(context_);
    CheckCairo(cairo_status(context_));
  }

  cairo_t* const context_;
};

void Draw(cairo_surface_t* picture, const std::vector<Panel>& panels, const std::string& title) {
  const Context context = NewContext(picture);
  Plot plot(context.get());
  plot.DrawTitle(title);
  for (const Panel& panel : panels) plot.Draw(panel);
}

}  // namespace

void WriteSoundPlot(OutputFile& file, const SoundMeasurement& measurement,
                    const std::string& title) {
  const std::vector<Panel> panels = PanelsOf(measurement);
  const int height = kHeader + kPanelHeight * static_cast<int>(panels.size());
  const bool vector = std::filesystem::path(file.Name()).extension() == ".svg";
  const Surface picture = vector ? NewVectorImage(file, kWidth, height) : NewImage(kWidth, height);
  Draw(picture.get(), panels, title);
  vector ? FinishVectorImage(picture.get(), file) : WritePng(picture.get(), file);
}

}  // namespace CommandLine
