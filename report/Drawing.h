// Drawing: a picture of rectangles, arrows and text, in the formats of the plots.
#ifndef MORVIK_REPORT_DRAWING_H
#define MORVIK_REPORT_DRAWING_H

#include <string>
#include <vector>

namespace morvik::report {

/// Coordinates are in points from the upper left corner; a picture is 1000 points wide. Colours are "#rrggbb".
class Drawing {
public:
    Drawing(int height, std::string title, std::string description);

    void rectangle(double x, double y, double width, double height, const std::string& colour);
    void arrow(double fromX, double fromY, double toX, double toY, const std::string& colour);

    /// Which part of the text is at the coordinates: its beginning, middle or end.
    enum class Anchor { left, centre, right };

    /// The text is centred vertically on y.
    void text(double x, double y, const std::string& words, double points, Anchor anchor, const std::string& colour);

    const std::string& title() const;

    /// Text alternative for readers who cannot see the picture.
    const std::string& description() const;

    /// The gnuplot script; the suffix is .svg, .png or .pdf.
    std::string script(const std::string& suffix) const;

private:
    struct Words {
        double x, y;
        std::string words;
        double points;
        Anchor anchor;
        std::string colour;
    };

    int itsHeight;
    std::string itsTitle;
    std::string itsDescription;
    std::string itsShapes;
    std::vector<Words> itsWords;
};

}  // namespace morvik::report

#endif
