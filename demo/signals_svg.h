// A picture of waveforms against time: one self-contained SVG document, viewable in a browser.
#ifndef KVSVDEMO_SIGNALS_SVG_H
#define KVSVDEMO_SIGNALS_SVG_H

#include <string>
#include <vector>

namespace kvsvdemo {

struct tPlotCurve {
  std::string label;      // name and unit, shown in the legend and on the curve's own axis
  double interval = 0.0;  // seconds between samples
  std::vector<double> samples;
};

// Each curve is scaled to its own value range (its axis on the left for the first, on the right
// for the second), over a shared time axis in seconds.
std::string PlotSvg(const std::string &title, const std::vector<tPlotCurve> &curves);

}  // namespace kvsvdemo

#endif
