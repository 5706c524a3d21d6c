// Series: what of the curves can be drawn, and how series look: the same in plots and on pages.
#ifndef MORVIK_REPORT_SERIES_H
#define MORVIK_REPORT_SERIES_H

#include <cstddef>
#include <string>
#include <vector>

#include "Curves.h"

namespace morvik::report {

/// One of the two rates of a sample.
struct Rate {
    double value;
    double low;
    double high;
    bool below;

    /// There is a place for it on a logarithmic axis: of a rate that is not zero, or of a bound that it is below.
    bool canBeDrawn() const;

    /// The interval is known.
    bool hasInterval() const;
};

/// A quantity that curves show.
struct Quantity {
    const char* name;   // "BER"
    const char* title;  // "Bit error rate"
    Rate (*of)(const Sample& sample);
};

extern const Quantity bitErrorRate;
extern const Quantity blockErrorRate;

/// What curves are drawn against.
struct Axis {
    const char* name;   // "ebn0"
    const char* title;  // "Eb/N0"
    const char* label;  // the title and its unit, for gnuplot
    bool isWhole;       // there are whole numbers alone
    double (*of)(const Sample& sample);
};

extern const Axis ebn0Axis;
extern const Axis iterationAxis;

/// Curves that are drawn together.
struct View {
    const Axis* axis;
    std::vector<Curve> curves;  // in order
};

/// The curves against Eb/N0 and, where some were counted after several iterations, against these, too. More curves than
/// can be told apart are no view against iterations.
std::vector<View> viewsOf(const std::vector<Curve>& curves);

/// Colours that tell series apart on white paper and on dark screens, for colour-blind eyes, too: those of M. Okabe and
/// K. Ito, without the yellow, which white swallows. Series of the same colour differ in marker, whose number is not a
/// multiple of that of colours, and in dash. References are grey.
struct Colour {
    std::string onLight;
    std::string onDark;
};
extern const std::vector<Colour> colours;
extern const Colour referenceColour;

/// The number of markers: circle, square, triangle, diamond, pentagon. References have them open.
constexpr std::size_t markers = 5;

/// The number of dashes, the first of which is solid. References are never solid.
constexpr std::size_t dashes = 4;

/// A family of at least so many curves has colours that run from one to another, from bright to dark on paper and from
/// dark to bright on screens. Neighbours are alike in them, so that marker and dash together tell 20 curves apart.
constexpr std::size_t smallestRun = 4;

/// How a curve is drawn.
struct Look {
    Colour colour;
    std::size_t marker;
    std::size_t dash;   // 0 is solid
    std::size_t layer;  // how many of the curves drawn later cover it: it is broader, to show on both sides of them
};
Look lookOf(const std::vector<Curve>& curves, std::size_t curve, const Axis& axis = ebn0Axis);

/// The curves with the references behind the others.
std::vector<Curve> inOrder(const std::vector<Curve>& curves);

}  // namespace morvik::report

#endif
