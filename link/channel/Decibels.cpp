// Decibels: ratios of energies in thousandths of a decibel.
#include "Decibels.h"

namespace morvik::link {

namespace {

/// Entry d of row i is 10^(d / 10^(i + 1)): tenths, hundredths and so on of a decade.
constexpr double fractions[4][10] = {
    {1,
     1.2589254117941672104,
     1.5848931924611134852,
     1.9952623149688796014,
     2.5118864315095801111,
     3.162277660168379332,
     3.9810717055349725077,
     5.01187233627272285,
     6.3095734448019324943,
     7.9432823472428150207},
    {1,
     1.023292992280754131,
     1.0471285480508995335,
     1.0715193052376064174,
     1.0964781961431850131,
     1.1220184543019634356,
     1.1481536214968827515,
     1.1748975549395295417,
     1.2022644346174129058,
     1.2302687708123815342},
    {1,
     1.0023052380778996719,
     1.0046157902783951424,
     1.0069316688518041699,
     1.0092528860766844119,
     1.0115794542598985244,
     1.013911385736679412,
     1.0162486928706956277,
     1.0185913880541169241,
     1.0209394837076799554},
    {1,
     1.0002302850208247527,
     1.0004606230728403216,
     1.0006910141682589957,
     1.0009214583192958761,
     1.001151955538168877,
     1.0013825058370987261,
     1.0016131092283089654,
     1.0018437657240259518,
     1.0020744753364788578},
};

constexpr int decade = 10000;  // thousandths of a decibel

}  // namespace

double ratioOf(int milliDecibels)
{
    const int rest = (milliDecibels % decade + decade) % decade;
    const double ratio = fractions[0][rest / 1000] * fractions[1][rest / 100 % 10] * fractions[2][rest / 10 % 10] *
                         fractions[3][rest % 10];
    // Powers of ten up to 10^22 are exact.
    double power = 1;
    int decades = milliDecibels / decade - (milliDecibels % decade < 0 ? 1 : 0);
    const bool isSmall = decades < 0;
    for (decades = isSmall ? -decades : decades; decades > 0; --decades) {
        power *= 10;
    }
    return isSmall ? ratio / power : ratio * power;
}

int milliDecibelsOf(double ratio)
{
    int low = -300 * decade;
    int high = 300 * decade;
    while (low + 1 < high) {  // ratioOf(low) <= ratio < ratioOf(high)
        const int middle = low + (high - low) / 2;
        (ratioOf(middle) <= ratio ? low : high) = middle;
    }
    // On the logarithmic scale, the middle between two neighbours is their geometric mean.
    return ratio * ratio < ratioOf(low) * ratioOf(high) ? low : high;
}

}  // namespace morvik::link
