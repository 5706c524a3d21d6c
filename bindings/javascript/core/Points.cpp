// Points: the points that JavaScript asks about, and the decoders and frames that serve them.
#include "Points.h"

#include <map>
#include <memory>
#include <tuple>
#include <utility>

#include "base/Thousandths.h"

namespace morvik::javascript {

namespace {

struct DestroyState {
    void operator()(veltra_ip_morvik_v1_0_state* state) const
    {
        veltra_ip_morvik_v1_0_destroy_state(state);
    }
};

using State = std::unique_ptr<veltra_ip_morvik_v1_0_state, DestroyState>;

auto numbersOf(const Point& point)
{
    return std::make_tuple(point.K, point.milliDecibels, point.milliScale, point.seed());
}

}  // namespace

double Point::scale() const
{
    return base::fromThousandths(milliScale);
}

const link::Frames& framesOf(const Point& point, std::uint64_t first, unsigned count)
{
    // The distribution takes longer than a block: that of the last point is kept.
    static decltype(numbersOf(point)) of;
    static std::unique_ptr<link::FrameSource> source;
    static link::Frames frames;
    if (!source || of != numbersOf(point)) {
        source = std::make_unique<link::FrameSource>(point.K, point.milliDecibels, point.scale(), point.seed());
        of = numbersOf(point);
    }
    source->make(first, count, frames);
    return frames;
}

veltra_ip_morvik_v1_0_state* decoderOf(unsigned units, unsigned algorithm)
{
    static std::map<std::pair<unsigned, unsigned>, State> states;
    State& state = states[{units, algorithm}];
    if (!state) {
        veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
        generics.C_NUM_PU = static_cast<std::int32_t>(units);
        generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(algorithm);
        state.reset(veltra_ip_morvik_v1_0_create_state(generics));
    }
    return state.get();
}

}  // namespace morvik::javascript
