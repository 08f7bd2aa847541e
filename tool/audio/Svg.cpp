#include "audio/Svg.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <sstream>

namespace kestaudio {

namespace {

const int kWidth = 960, kHeight = 460;
const int kLeft = 80, kRight = 250, kTop = 40, kBottom = 60;
const char* const kColours[] = {"#1f77b4", "#d62728", "#2ca02c", "#ff7f0e", "#9467bd",
                                "#8c564b", "#e377c2", "#17becf", "#7f7f7f", "#bcbd22"};

std::string Escape(const std::string& s)
{
    std::string out;
    for (char c : s) {
        if (c == '<') out += "&lt;";
        else if (c == '>') out += "&gt;";
        else if (c == '&') out += "&amp;";
        else out += c;
    }
    return out;
}

std::string Number(double v)
{
    char buf[32];
    std::snprintf(buf, sizeof buf, "%.1f", v);
    return buf;
}

std::string TickLabel(double v, bool log)
{
    char buf[32];
    if (log && (std::fabs(v) >= 1e5 || std::fabs(v) < 1e-2)) {
        std::snprintf(buf, sizeof buf, "1e%d", int(std::lround(std::log10(v))));
    } else if (std::fabs(v) >= 1000 && std::fmod(v, 1000) == 0) {
        std::snprintf(buf, sizeof buf, "%gk", v / 1000);
    } else {
        std::snprintf(buf, sizeof buf, "%g", v);
    }
    return buf;
}

struct Axis {
    double lo, hi;
    bool log;
    int p0, p1;  // pixel positions of lo and hi
    double Map(double v) const
    {
        const double a = log ? std::log10(lo) : lo, b = log ? std::log10(hi) : hi;
        const double t = ((log ? std::log10(std::max(v, 1e-300)) : v) - a) / (b - a);
        return p0 + (p1 - p0) * std::clamp(t, -0.05, 1.05);
    }
    std::vector<double> Ticks() const
    {
        std::vector<double> t;
        if (log) {
            const double span = std::log10(hi) - std::log10(lo);
            const int step = span > 12 ? 2 : 1;
            for (int e = int(std::floor(std::log10(lo))); e <= int(std::ceil(std::log10(hi))); e += step) {
                for (int m : {1, 2, 5}) {
                    const double v = m * std::pow(10.0, e);
                    if (v >= lo * 0.999 && v <= hi * 1.001 && (m == 1 || span <= 4)) t.push_back(v);
                }
            }
        } else {
            const double raw = (hi - lo) / 8, mag = std::pow(10.0, std::floor(std::log10(raw)));
            const double step = raw / mag < 2 ? 2 * mag : raw / mag < 5 ? 5 * mag : 10 * mag;
            for (double v = std::ceil(lo / step) * step; v <= hi + step * 1e-9; v += step) t.push_back(v);
        }
        return t;
    }
};

void Frame(std::ostringstream& s, int y0, const std::string& title, const std::string& xLabel,
           const std::string& yLabel, const Axis& x, const Axis& y)
{
    const int plotW = kWidth - kLeft - kRight, plotH = kHeight - kTop - kBottom;
    s << "<text x='" << kLeft + plotW / 2 << "' y='" << y0 + 24 << "' text-anchor='middle' font-size='16'>"
      << Escape(title) << "</text>\n";
    s << "<rect x='" << kLeft << "' y='" << y0 + kTop << "' width='" << plotW << "' height='" << plotH
      << "' fill='none' stroke='#000'/>\n";
    for (double v : x.Ticks()) {
        const std::string px = Number(x.Map(v));
        s << "<line x1='" << px << "' x2='" << px << "' y1='" << y0 + kTop << "' y2='" << y0 + kTop + plotH
          << "' stroke='#ddd'/><text x='" << px << "' y='" << y0 + kTop + plotH + 16
          << "' text-anchor='middle' font-size='11'>" << TickLabel(v, x.log) << "</text>\n";
    }
    for (double v : y.Ticks()) {
        const std::string py = Number(y.Map(v));
        s << "<line x1='" << kLeft << "' x2='" << kLeft + plotW << "' y1='" << py << "' y2='" << py
          << "' stroke='#ddd'/><text x='" << kLeft - 6 << "' y='" << py
          << "' text-anchor='end' dominant-baseline='middle' font-size='11'>" << TickLabel(v, y.log)
          << "</text>\n";
    }
    s << "<text x='" << kLeft + plotW / 2 << "' y='" << y0 + kHeight - 18 << "' text-anchor='middle' font-size='13'>"
      << Escape(xLabel) << "</text>\n";
    s << "<text transform='translate(20," << y0 + kTop + plotH / 2
      << ") rotate(-90)' text-anchor='middle' font-size='13'>" << Escape(yLabel) << "</text>\n";
}

}  // namespace

std::string RenderSvg(const std::vector<Plot>& plots, const std::vector<Heatmap>& heatmaps)
{
    const int total = kHeight * int(plots.size() + heatmaps.size());
    std::ostringstream s;
    s << "<svg xmlns='http://www.w3.org/2000/svg' width='" << kWidth << "' height='" << total
      << "' viewBox='0 0 " << kWidth << ' ' << total << "' font-family='sans-serif'>\n"
      << "<rect width='100%' height='100%' fill='#fff'/>\n";
    int y0 = 0;
    const int plotW = kWidth - kLeft - kRight, plotH = kHeight - kTop - kBottom;
    for (const Plot& p : plots) {
        const Axis x{p.xMin, p.xMax, p.logX, kLeft, kLeft + plotW};
        const Axis y{p.yMin, p.yMax, p.logY, y0 + kTop + plotH, y0 + kTop};
        Frame(s, y0, p.title, p.xLabel, p.yLabel, x, y);
        s << "<clipPath id='c" << y0 << "'><rect x='" << kLeft << "' y='" << y0 + kTop << "' width='" << plotW
          << "' height='" << plotH << "'/></clipPath>\n";
        for (std::size_t i = 0; i < p.series.size(); ++i) {
            const Series& d = p.series[i];
            const char* colour = kColours[i % 10];
            s << "<polyline clip-path='url(#c" << y0 << ")' fill='none' stroke='" << colour
              << "' stroke-width='1.3' points='";
            for (std::size_t k = 0; k < d.x.size(); ++k) {
                if ((p.logX && d.x[k] <= 0) || (p.logY && d.y[k] <= 0) || !std::isfinite(d.y[k])) continue;
                s << Number(x.Map(d.x[k])) << ',' << Number(y.Map(d.y[k])) << ' ';
            }
            s << "'/>\n";
            const int ly = y0 + kTop + 12 + 18 * int(i);
            s << "<line x1='" << kLeft + plotW + 12 << "' x2='" << kLeft + plotW + 34 << "' y1='" << ly << "' y2='"
              << ly << "' stroke='" << colour << "' stroke-width='2'/><text x='" << kLeft + plotW + 40 << "' y='"
              << ly << "' dominant-baseline='middle' font-size='12'>" << Escape(d.label) << "</text>\n";
        }
        y0 += kHeight;
    }
    for (const Heatmap& h : heatmaps) {
        const Axis x{h.xMin, h.xMax, false, kLeft, kLeft + plotW};
        const Axis y{h.yMin, h.yMax, true, y0 + kTop + plotH, y0 + kTop};
        const std::size_t columns = h.cells.size(), rows = columns ? h.cells[0].size() : 0;
        // Cells of one colour level in a row merge into one rectangle.
        auto level = [&](double v) { return int(std::clamp((v - h.vMin) / (h.vMax - h.vMin), 0.0, 1.0) * 31); };
        auto colour = [](int l) {
            const double t = l / 31.0;
            char buf[8];
            std::snprintf(buf, sizeof buf, "#%02x%02x%02x", int(255 * std::min(1.0, 2 * t)),
                          int(255 * std::max(0.0, 2 * t - 1)), int(255 * std::max(0.0, 0.6 - t) / 0.6 * 0.5));
            return std::string(buf);
        };
        const double cw = double(plotW) / std::max<std::size_t>(columns, 1), rh = double(plotH) / std::max<std::size_t>(rows, 1);
        for (std::size_t r = 0; r < rows; ++r) {
            for (std::size_t c = 0; c < columns;) {
                const int l = level(h.cells[c][r]);
                std::size_t e = c + 1;
                while (e < columns && level(h.cells[e][r]) == l) ++e;
                s << "<rect x='" << Number(kLeft + c * cw) << "' y='" << Number(y0 + kTop + plotH - (r + 1) * rh)
                  << "' width='" << Number((e - c) * cw + 0.5) << "' height='" << Number(rh + 0.5) << "' fill='"
                  << colour(l) << "'/>";
                c = e;
            }
            s << '\n';
        }
        Frame(s, y0, h.title, h.xLabel, h.yLabel, x, y);
        for (int l = 0; l < 32; ++l) {
            s << "<rect x='" << kLeft + plotW + 20 << "' y='" << Number(y0 + kTop + plotH - (l + 1) * plotH / 32.0)
              << "' width='16' height='" << Number(plotH / 32.0 + 0.5) << "' fill='" << colour(l) << "'/>";
        }
        s << "<text x='" << kLeft + plotW + 42 << "' y='" << y0 + kTop + 10 << "' font-size='11'>" << h.vMax
          << " dB</text><text x='" << kLeft + plotW + 42 << "' y='" << y0 + kTop + plotH << "' font-size='11'>"
          << h.vMin << " dB</text>\n";
        y0 += kHeight;
    }
    s << "</svg>\n";
    return s.str();
}

}  // namespace kestaudio
