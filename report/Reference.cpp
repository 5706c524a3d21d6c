// Reference: reference curves, from CSV files and results.
#include "Reference.h"

#include <cmath>
#include <optional>
#include <sstream>
#include <string_view>

#include "base/Csv.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Path.h"
#include "base/Shown.h"
#include "base/Text.h"
#include "base/TextFile.h"
#include "rules/BlockSizes.h"
#include "simulation/Frames.h"
#include "simulation/Possible.h"
#include "simulation/ResultFiles.h"

namespace morvik::report {

namespace {

/// What a file of error rates has as CSV.
std::string csvOf(const std::string& fileName)
{
    const bool isJson = base::pathOf(fileName).extension() == ".json";
    return isJson ? csvText(simulation::readResults(fileName)) : base::readText(fileName);
}

class ReferenceReader {
public:
    ReferenceReader(const std::string& fileName, simulation::Axis axis)
        : itsName(fileName), itsAxis(axis), itsText(csvOf(fileName)), itsLines(itsText, fileName, base::largestText)
    {
    }

    std::vector<Curve> read()
    {
        while (itsRow.next()) {
            take(base::trimmed(itsLines.text()));
        }
        if (itsColumns.empty()) {
            throw base::Error(itsName + ": has no header line");
        }
        if (itsRows.empty()) {
            throw base::Error(itsName + ": has no row of error rates");
        }
        return titled(curvesOf(itsRows));
    }

private:
    [[noreturn]] void fail(const std::string& what) const
    {
        itsLines.fail(what);
    }

    [[noreturn]] void refuse(const std::string& column, const std::string& allowed) const
    {
        fail(base::shown(text(column)) + " in the column " + column + " is not allowed, expected " + allowed);
    }

    void take(std::string_view line)
    {
        constexpr std::string_view titleMark = "title:";
        if (line.empty()) {
            return;
        }
        if (line[0] == '#') {
            const std::string_view comment = base::trimmed(line.substr(1));
            if (comment.substr(0, titleMark.size()) == titleMark) {
                itsTitle = base::trimmed(comment.substr(titleMark.size()));
            }
        } else if (itsColumns.empty()) {
            takeColumns(itsRow.fields());
        } else {
            takeRow();
        }
    }

    void takeColumns(const std::vector<std::string_view>& names)
    {
        constexpr std::size_t mostColumns = 1000;
        if (names.size() > mostColumns) {
            fail("names " + std::to_string(names.size()) + " columns, there may be " + std::to_string(mostColumns));
        }
        itsColumns.assign(names.begin(), names.end());
        for (std::size_t i = 0; i < names.size(); ++i) {
            if (!names[i].empty() && indexOf(std::string(names[i])) != i) {
                fail("column " + base::shown(names[i]) + " appears twice");
            }
        }
        nameAlike("fer", "bler");
        nameAlike("frames", "blocks");
        nameAlike("frame_errors", "block_errors");
        if ((!indexOf("ebn0_db") && !indexOf("esn0_db")) || (!indexOf("ber") && !indexOf("bler"))) {
            fail("this line must name the columns, ebn0_db or esn0_db and one of ber, bler and fer among them");
        }
    }

    /// Renames a column to the name used here, unless another column has it.
    void nameAlike(const std::string& other, const std::string& name)
    {
        const auto index = indexOf(other);
        if (index && !indexOf(name)) {
            itsColumns[*index] = name;
        }
    }

    void takeRow()
    {
        const std::size_t fields = itsRow.fields().size();
        if (fields != itsColumns.size()) {
            fail("row of " + std::to_string(fields) + " fields, there are " + std::to_string(itsColumns.size()) +
                 " columns");
        }
        Row row;
        row.setting = setting();
        row.sample = sample();
        checkCounts(row);
        checkRun(row.sample.blocks);
        itsRows.push_back(row);
    }

    Setting setting() const
    {
        Setting setting;
        setting.blockSize = blockSize();
        setting.numPu = numPu();
        setting.algorithm = text("algorithm");
        setting.iterations = static_cast<unsigned>(count("iterations", UINT32_MAX));
        setting.scale = text("scale_option");
        setting.sent = sentText();
        return setting;
    }

    /// What is sent, if it is not plain code blocks over BPSK.
    std::string sentText() const
    {
        if (!text("mcs").empty()) {
            return "MCS " + text("mcs");
        }
        const std::string modulation = text("modulation");
        const std::uint64_t A = count("transport_block_size", UINT32_MAX);
        if (A > 0) {
            const std::uint64_t G = count("coded_bits", UINT32_MAX);
            return "A = " + std::to_string(A) + (G > 0 ? ", G = " + std::to_string(G) : "") +
                   (modulation.empty() ? "" : ", " + modulation);
        }
        return modulation.empty() || modulation == "bpsk" ? "" : "K = " + text("block_size") + ", " + modulation;
    }

    unsigned blockSize() const
    {
        const auto K = static_cast<unsigned>(count("block_size", UINT32_MAX));
        if (!text("block_size").empty() && rules::findBlockSize(K) == nullptr) {
            refuse("block_size", "a block size of 3GPP TS 36.212, 40 to 6144");
        }
        return K;
    }

    unsigned numPu() const
    {
        const auto units = static_cast<unsigned>(count("num_pu", UINT32_MAX));
        if (!text("num_pu").empty() && units != 2 && units != 4 && units != 8) {
            refuse("num_pu", "2, 4 and 8");
        }
        return units;
    }

    /// Checks what is not drawn, but tells that a file of results was damaged.
    void checkRun(std::uint64_t blocks) const
    {
        const std::string seconds = text("seconds");
        if (!seconds.empty() && !simulation::isPossibleTime(base::parseNumber<double>(seconds).value_or(-1))) {
            refuse("seconds", "a number from 0 to 1e+12");
        }
        count("seed", UINT64_MAX);
        const std::string frames = text("frames");
        if (frames.empty() || base::parseNumber<std::uint64_t>(frames)) {
            return;
        }
        const auto ranges = simulation::FrameSet::parse(frames);
        if (!ranges || (blocks > 0 && ranges->size() != blocks)) {
            refuse("frames", "a number, or ranges FROM:TO with as many frames as there are blocks");
        }
    }

    Sample sample() const
    {
        Sample sample;
        sample.ebn0 = number("ebn0_db", -1000, 1000);
        sample.esn0 = number("esn0_db", -1000, 1000);
        place(sample);
        sample.throughput = number("throughput", 0, 1000);
        sample.ber = number("ber", 0, 1);
        sample.berLow = number("ber_low", 0, 1);
        sample.berHigh = number("ber_high", 0, 1);
        sample.bler = number("bler", 0, 1);
        sample.blerLow = number("bler_low", 0, 1);
        sample.blerHigh = number("bler_high", 0, 1);
        sample.clipped = number("clipped_fraction", 0, 1);
        sample.blocks = count("blocks", UINT64_MAX);
        sample.bitErrors = count("bit_errors", UINT64_MAX);
        sample.blockErrors = count("block_errors", UINT64_MAX);
        sample.berBelow = sample.ber == 0 && sample.berHigh > 0;
        sample.blerBelow = sample.bler == 0 && sample.blerHigh > 0;
        checkBounds("ber", sample.ber, sample.berLow, sample.berHigh);
        checkBounds("bler", sample.bler, sample.blerLow, sample.blerHigh);
        return sample;
    }

    /// Puts the sample on the axis of the pictures, from the other one if need be.
    void place(Sample& sample) const
    {
        const bool isOnEsn0 = itsAxis == simulation::Axis::esn0;
        double& own = isOnEsn0 ? sample.esn0 : sample.ebn0;
        double& other = isOnEsn0 ? sample.ebn0 : sample.esn0;
        if (std::isnan(own) && std::isnan(other)) {
            fail(std::string("row without a value in the column ") + (indexOf("ebn0_db") ? "ebn0_db" : "esn0_db"));
        }
        if (std::isnan(own)) {
            const double perSymbol = 10 * std::log10(bitsPerSymbol());
            own = isOnEsn0 ? other + perSymbol : other - perSymbol;
        }
        if (!std::isfinite(own)) {
            fail(std::string("row without ") + (isOnEsn0 ? "Es/N0" : "Eb/N0") +
                 ", over which curves are drawn here; it could be computed with block_size, or with "
                 "transport_block_size, coded_bits and modulation");
        }
        if (!isOnEsn0) {
            other = unknown;
        }
    }

    /// Information bits of a symbol, if the row tells what is sent; otherwise unknown.
    double bitsPerSymbol() const
    {
        simulation::LinkFormat format;
        format.transportBlockSize = static_cast<unsigned>(count("transport_block_size", UINT32_MAX));
        format.codedBits = static_cast<unsigned>(count("coded_bits", UINT32_MAX));
        const std::string name = text("modulation");
        const auto modulation =
            name.empty() && format.transportBlockSize == 0 ? link::Modulation::bpsk : link::modulationOf(name);
        format.modulation = modulation.value_or(link::Modulation::bpsk);
        const unsigned K = blockSize();
        const bool isKnown = modulation && (format.hasTransportBlocks() ? format.codedBits > 0 : K > 0);
        return isKnown ? simulation::bitsPerSymbolOf(format, K) : unknown;
    }

    /// An unknown value matches anything.
    void checkBounds(const std::string& column, double rate, double low, double high) const
    {
        if (low > rate || rate > high || low > high) {
            fail("the bounds " + column + "_low and " + column + "_high are not around " + column);
        }
    }

    void checkCounts(const Row& row) const
    {
        const Sample& sample = row.sample;
        if (sample.blocks == 0) {
            return;  // unknown
        }
        if (sample.blockErrors > sample.blocks) {
            fail("block_errors " + std::to_string(sample.blockErrors) + " cannot be, of " +
                 std::to_string(sample.blocks) + " blocks");
        }
        // A transport block may have several code blocks of K bits.
        const unsigned K = count("transport_block_size", UINT32_MAX) > 0 ? 0 : row.setting.blockSize;
        if (K > 0 && sample.bitErrors > 0 && (sample.bitErrors - 1) / K >= sample.blocks) {
            fail("bit_errors " + std::to_string(sample.bitErrors) + " cannot be, of " + std::to_string(sample.blocks) +
                 " blocks of " + std::to_string(K) + " bits");
        }
    }

    std::optional<std::size_t> indexOf(const std::string& column) const
    {
        for (std::size_t i = 0; i < itsColumns.size(); ++i) {
            if (itsColumns[i] == column) {
                return i;
            }
        }
        return std::nullopt;
    }

    /// The row's field in a column; empty if there is no such column.
    std::string text(const std::string& column) const
    {
        const auto index = indexOf(column);
        return index ? std::string(itsRow.fields()[*index]) : std::string();
    }

    double number(const std::string& column, double min, double max) const
    {
        const std::string field = text(column);
        if (field.empty()) {
            return unknown;
        }
        const auto value = base::parseNumber<double>(field);
        if (!value || !(*value >= min && *value <= max)) {
            refuse(column, "a number from " + base::numberText(min) + " to " + base::numberText(max));
        }
        return *value;
    }

    std::uint64_t count(const std::string& column, std::uint64_t max) const
    {
        const std::string field = text(column);
        if (field.empty()) {
            return 0;
        }
        const auto value = base::parseNumber<std::uint64_t>(field);
        if (!value || *value > max) {
            refuse(column, "an integer from 0 to " + std::to_string(max));
        }
        return *value;
    }

    /// The curves as references, with the file name in their titles.
    std::vector<Curve> titled(std::vector<Curve> curves) const
    {
        const std::string name = itsTitle.empty() ? base::pathOf(itsName).stem().u8string() : std::string(itsTitle);
        for (Curve& curve : curves) {
            for (std::string* const title : {&curve.title, &curve.family}) {
                *title = title->empty() ? name : name + ": " + *title;
            }
            curve.reference = true;
        }
        return curves;
    }

    std::string itsName;
    simulation::Axis itsAxis;
    std::istringstream itsText;
    base::LineReader itsLines;
    base::CsvReader itsRow{itsLines};
    std::string itsTitle;
    std::vector<std::string> itsColumns;
    std::vector<Row> itsRows;
};

}  // namespace

std::vector<Curve> readReference(const std::string& fileName, simulation::Axis axis)
{
    return ReferenceReader(fileName, axis).read();
}

}  // namespace morvik::report
