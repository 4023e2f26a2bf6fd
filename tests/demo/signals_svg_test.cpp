// The picture of waveforms: one polyline per curve with a point per sample, every point inside
// the plot, the time axis running left to right, and labels escaped for the document.
#include "signals_svg.h"

#include <gtest/gtest.h>

#include <regex>
#include <sstream>
#include <string>
#include <vector>

namespace {

using kvsvdemo::PlotSvg;
using kvsvdemo::tPlotCurve;

std::vector<std::vector<std::pair<double, double>>> Polylines(const std::string &svg) {
  std::vector<std::vector<std::pair<double, double>>> lines;
  const std::regex polyline("<polyline[^>]*points=\"([^\"]*)\"");
  for (auto it = std::sregex_iterator(svg.begin(), svg.end(), polyline);
       it != std::sregex_iterator(); ++it) {
    std::vector<std::pair<double, double>> points;
    std::istringstream text((*it)[1].str());
    std::string point;
    while (text >> point) {
      const size_t comma = point.find(',');
      points.emplace_back(std::stod(point.substr(0, comma)), std::stod(point.substr(comma + 1)));
    }
    lines.push_back(points);
  }
  return lines;
}

TEST(SignalsSvg, EachCurveIsAPolylineInsideThePlot) {
  const std::vector<tPlotCurve> curves = {
      {"speed (kph)", 0.01, {0, 10, 40, 90, 40, 10}},
      {"steering <deg> & more", 0.025, {-5, 5, -5}},
  };
  const std::string svg = PlotSvg("two curves", curves);
  EXPECT_EQ(svg.rfind("<svg xmlns=\"http://www.w3.org/2000/svg\"", 0), 0u);
  EXPECT_NE(svg.find("</svg>"), std::string::npos);
  EXPECT_NE(svg.find("steering &lt;deg&gt; &amp; more"), std::string::npos);
  EXPECT_NE(svg.find("time (s)"), std::string::npos);

  const auto lines = Polylines(svg);
  ASSERT_EQ(lines.size(), 2u);
  for (size_t c = 0; c < lines.size(); ++c) {
    ASSERT_EQ(lines[c].size(), curves[c].samples.size());
    for (size_t k = 1; k < lines[c].size(); ++k)
      EXPECT_GT(lines[c][k].first, lines[c][k - 1].first);
    for (const auto &[x, y] : lines[c]) {
      EXPECT_GE(x, 80.0);
      EXPECT_LE(x, 720.0);
      EXPECT_GE(y, 50.0);
      EXPECT_LE(y, 360.0);
    }
  }
  // Both curves span the same 0.05 s: their last points meet at the right edge.
  EXPECT_DOUBLE_EQ(lines[0].back().first, 720.0);
  EXPECT_DOUBLE_EQ(lines[1].back().first, 720.0);
  // Each curve fills its own range: the highest sample at the top, the lowest at the bottom.
  EXPECT_DOUBLE_EQ(lines[0][3].second, 50.0);
  EXPECT_DOUBLE_EQ(lines[0][0].second, 360.0);
  EXPECT_DOUBLE_EQ(lines[1][1].second, 50.0);
}

TEST(SignalsSvg, AFlatCurveStaysInTheMiddle) {
  const auto lines = Polylines(PlotSvg("flat", {{"gear", 0.01, {3, 3, 3}}}));
  ASSERT_EQ(lines.size(), 1u);
  for (const auto &[x, y] : lines[0]) EXPECT_DOUBLE_EQ(y, 205.0);
}

}  // namespace
