// Drawing: a picture of rectangles, arrows and words, in the formats of the plots.
#ifndef MORVIK_REPORT_DRAWING_H
#define MORVIK_REPORT_DRAWING_H

#include <string>
#include <vector>

namespace morvik::report {

/// Places are in points from the upper left corner; a picture is 1000 points wide. Colours are "#rrggbb".
class Drawing {
public:
    Drawing(int height, std::string title, std::string description);

    void rectangle(double x, double y, double width, double height, const std::string& colour);
    void arrow(double fromX, double fromY, double toX, double toY, const std::string& colour);

    /// What comes at the place: the words' beginning, middle or end.
    enum class Anchor { left, centre, right };

    /// The words stand around the height y.
    void text(double x, double y, const std::string& words, double points, Anchor anchor, const std::string& colour);

    const std::string& title() const;

    /// What those read who do not see the picture.
    const std::string& description() const;

    /// What gnuplot is told; the suffix is .svg, .png or .pdf.
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
