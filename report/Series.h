// Series: which curves can be drawn, and how they look, in plots and on pages alike.
#ifndef MORVIK_REPORT_SERIES_H
#define MORVIK_REPORT_SERIES_H

#include <cstddef>
#include <string>
#include <vector>

#include "Curves.h"

namespace morvik::report {

/// A figure of a sample: one of its rates, or its throughput.
struct Rate {
    double value;
    double low;
    double high;
    bool below;
    bool isLinear = false;

    /// It can be drawn on its axis: on a logarithmic one, a non-zero rate, or the upper bound of one.
    bool canBeDrawn() const;

    /// The interval is known.
    bool hasInterval() const;
};

/// A quantity that curves show.
struct Quantity {
    const char* name;   // "BER"
    const char* title;  // "Bit error rate"
    Rate (*of)(const Sample& sample);
    bool isLinear = false;  // its axis; otherwise it is logarithmic
};

extern const Quantity bitErrorRate;
extern const Quantity blockErrorRate;
extern const Quantity throughput;

/// The two that a plot shows: bit and block error rates or, where a throughput is known, this and block error rates.
std::vector<const Quantity*> quantitiesOf(const std::vector<Curve>& curves);

/// The horizontal axis of curves.
struct Axis {
    const char* name;   // "ebn0"
    const char* title;  // "Eb/N0"
    const char* label;  // title and unit, for gnuplot
    bool isWhole;       // integers only
    double (*of)(const Sample& sample);
};

extern const Axis ebn0Axis;
extern const Axis esn0Axis;
extern const Axis iterationAxis;

/// Curves that are drawn together.
struct View {
    const Axis* axis;
    std::vector<Curve> curves;  // in order
};

/// The curves against Es/N0, where it is known of any that is no reference, or Eb/N0, and, if some were counted after
/// several iterations, against iterations, too. There is no view against iterations if it would have too many curves to
/// tell apart.
std::vector<View> viewsOf(const std::vector<Curve>& curves);

/// Colours that distinguish series on white paper and on dark screens, for colour-blind eyes, too: those of M. Okabe
/// and K. Ito, without yellow, which is hard to see on white. Series of the same colour differ in marker, as the number
/// of markers is not a multiple of the number of colours, and in dash. References are grey.
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

/// A family of at least this many curves is coloured along a gradient, from bright to dark on paper and from dark to
/// bright on screens. Neighbours have similar colours, so marker and dash together distinguish 20 curves.
constexpr std::size_t smallestRun = 4;

/// How a curve is drawn.
struct Look {
    Colour colour;
    std::size_t marker;
    std::size_t dash;   // 0 is solid
    std::size_t layer;  // number of later curves that cover it: it is drawn broader, to show on both sides of them
};
Look lookOf(const std::vector<Curve>& curves, std::size_t curve, const Axis& axis = ebn0Axis);

/// The curves, references last.
std::vector<Curve> inOrder(const std::vector<Curve>& curves);

}  // namespace morvik::report

#endif
