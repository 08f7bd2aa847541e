#pragma once

// A small SVG writer for line plots with axes, ticks, labels and a legend,
// and for a heat map (a spectrogram) on the same axes conventions.

#include <string>
#include <vector>

namespace kestaudio {

struct Series {
    std::string label;
    std::vector<double> x, y;
};

struct Plot {
    std::string title, xLabel, yLabel;
    bool logX = false, logY = false;
    double xMin = 0, xMax = 1, yMin = 0, yMax = 1;
    std::vector<Series> series;
};

struct Heatmap {
    std::string title, xLabel, yLabel;
    double xMin = 0, xMax = 1, yMin = 1, yMax = 2;  // y is logarithmic
    double vMin = -120, vMax = 0;                  // the colour scale, dB
    std::vector<std::vector<double>> cells;        // [column][row], rows from yMin up
};

// One SVG document holding the plots, stacked top to bottom.
std::string RenderSvg(const std::vector<Plot>& plots, const std::vector<Heatmap>& heatmaps = {});

}  // namespace kestaudio
