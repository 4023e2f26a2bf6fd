#include "signals_svg.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

namespace kvsvdemo {

namespace {

constexpr double kWidth = 800, kHeight = 420;
constexpr double kLeft = 80, kRight = 720, kTop = 50, kBottom = 360;
constexpr int kTicks = 5;
const char *const kColours[] = {"#1f77b4", "#d62728", "#2ca02c", "#9467bd"};

std::string Number(double value) {
  char text[32];
  std::snprintf(text, sizeof text, "%.4g", value);
  return text;
}

std::string Escape(const std::string &text) {
  std::string out;
  for (char c : text) {
    switch (c) {
      case '&':
        out += "&amp;";
        break;
      case '<':
        out += "&lt;";
        break;
      case '>':
        out += "&gt;";
        break;
      case '"':
        out += "&quot;";
        break;
      default:
        out += c;
    }
  }
  return out;
}

std::string Text(double x, double y, const std::string &anchor, const std::string &colour,
                 const std::string &text) {
  return "<text x=\"" + Number(x) + "\" y=\"" + Number(y) + "\" text-anchor=\"" + anchor +
         "\" fill=\"" + colour + "\">" + Escape(text) + "</text>\n";
}

}  // namespace

std::string PlotSvg(const std::string &title, const std::vector<tPlotCurve> &curves) {
  double endTime = 0.0;
  for (const tPlotCurve &c : curves)
    endTime = std::max(endTime, c.interval * std::max<double>(0, c.samples.size() - 1.0));
  if (endTime <= 0.0) endTime = 1.0;

  std::string svg = "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" + Number(kWidth) +
                    "\" height=\"" + Number(kHeight) + "\" viewBox=\"0 0 " + Number(kWidth) + " " +
                    Number(kHeight) + "\" font-family=\"sans-serif\" font-size=\"12\">\n";
  svg += "<rect width=\"100%\" height=\"100%\" fill=\"white\"/>\n";
  svg += Text(kWidth / 2, 24, "middle", "black", title);
  svg += "<path d=\"M" + Number(kLeft) + " " + Number(kTop) + " V" + Number(kBottom) + " H" +
         Number(kRight) + " V" + Number(kTop) + "\" fill=\"none\" stroke=\"black\"/>\n";
  for (int t = 0; t <= kTicks; ++t) {
    const double x = kLeft + (kRight - kLeft) * t / kTicks;
    svg += "<line x1=\"" + Number(x) + "\" y1=\"" + Number(kBottom) + "\" x2=\"" + Number(x) +
           "\" y2=\"" + Number(kBottom + 5) + "\" stroke=\"black\"/>\n";
    svg += Text(x, kBottom + 20, "middle", "black", Number(endTime * t / kTicks));
  }
  svg += Text((kLeft + kRight) / 2, kBottom + 40, "middle", "black", "time (s)");

  for (size_t i = 0; i < curves.size() && i < 4; ++i) {
    const tPlotCurve &c = curves[i];
    const std::string colour = kColours[i];
    if (c.samples.empty()) continue;
    double low = *std::min_element(c.samples.begin(), c.samples.end());
    double high = *std::max_element(c.samples.begin(), c.samples.end());
    if (high <= low) {
      low -= 1.0;
      high += 1.0;
    }
    // The first curve's axis on the left, the others' on the right.
    const bool left = i == 0;
    const double axisX = left ? kLeft : kRight;
    for (int t = 0; t <= kTicks; ++t) {
      const double y = kBottom - (kBottom - kTop) * t / kTicks;
      svg += Text(axisX + (left ? -6 : 6), y + 4, left ? "end" : "start", colour,
                  Number(low + (high - low) * t / kTicks));
    }
    svg += Text(left ? kLeft : kRight, kTop - 10 - 14.0 * (i / 2), left ? "start" : "end", colour,
                c.label);
    svg += "<polyline fill=\"none\" stroke=\"" + colour + "\" stroke-width=\"1.5\" points=\"";
    for (size_t k = 0; k < c.samples.size(); ++k) {
      const double x = kLeft + (kRight - kLeft) * (c.interval * k) / endTime;
      const double y = kBottom - (kBottom - kTop) * (c.samples[k] - low) / (high - low);
      svg += (k == 0 ? "" : " ") + Number(x) + "," + Number(y);
    }
    svg += "\"/>\n";
  }
  svg += "</svg>\n";
  return svg;
}

}  // namespace kvsvdemo
