// LinkWords: how blocks are sent and received, in words for tables, legends and messages.
#include "LinkWords.h"

#include "base/Text.h"
#include "base/Thousandths.h"

namespace morvik::simulation {

std::string sentText(const Point& point)
{
    const LinkFormat& link = point.link;
    if (!link.hasTransportBlocks()) {
        return shortSentText(point);
    }
    return (link.mcs ? shortSentText(point) + ", " : "") + "A = " + std::to_string(link.transportBlockSize) +
           ", G = " + std::to_string(link.codedBits) + ", " + std::string(nameOf(link.modulation));
}

std::string shortSentText(const Point& point)
{
    const LinkFormat& link = point.link;
    if (link.mcs) {
        return "MCS " + mcsText(link.mcs);
    }
    if (link.hasTransportBlocks()) {
        return sentText(point);
    }
    const std::string size = "K = " + std::to_string(point.blockSize);
    return link.isPlainBpsk() ? size : size + ", " + std::string(nameOf(link.modulation));
}

std::string receivedText(const LinkFormat& link)
{
    std::string text;
    const auto append = [&text](bool isTold, const std::string& words) {
        text += isTold ? ", " + words : "";
    };
    const std::string versions = versionsText(link.versions, ',');
    append(link.fading != link::Fading::none, std::string(nameOf(link.fading)));
    append(link.demapper != link::Demapper::maxLog, std::string(nameOf(link.demapper)) + " demapper");
    append(link.versions.size() > 1, "versions " + versions);
    append(link.versions.size() == 1 && link.versions[0] > 0, "version " + versions);
    append(link.softBufferBits > 0, "soft buffer of " + std::to_string(link.softBufferBits) + " bits");
    append(link.softBufferSize > 0, "N_IR = " + std::to_string(link.softBufferSize));
    append(link.stopsEarly, "early stop");
    return text;
}

std::string curveText(const Point& point)
{
    return sentText(point) + receivedText(point.link) + ", " + std::to_string(point.numPu) + " units, " +
           algorithmName(point.algorithm) + ", scale " + scaleOptionText(point.scaleOption) + ", " +
           base::counted(point.iterations, "iteration");
}

std::string placeText(const Point& point)
{
    const std::string axis = point.axis == Axis::ebn0 ? "Eb/N0 " : "Es/N0 ";
    return axis + base::thousandthsText(placeOf(point)) + " dB";
}

}  // namespace morvik::simulation
