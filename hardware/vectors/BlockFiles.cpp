// BlockFiles: the blocks of a set as tables, in one format.
#include "BlockFiles.h"

#include <algorithm>
#include <array>

#include "base/Error.h"
#include "hardware/testbench/SoftBlock.h"
#include "rules/BlockSizes.h"

namespace morvik::vectors {

namespace {

/// The streams as `morvik decode` names them.
constexpr std::array<const char*, 3> streamNames = {"rsc1_sys", "rsc1_par", "rsc2_par"};

tables::Table blocksTable()
{
    return {"blocks",
            {{"block_size", 13, false},
             {"iterations", 4, false},
             {"tag", 32, false},
             {"expected_tag", 32, false},
             {"first_position", 32, false},
             {"first_bit", 32, false}}};
}

/// Refuses a row that cannot belong to a set of blocks.
void checkBlock(const tables::Row& row, std::uint32_t iterations, const std::string& place)
{
    if (rules::findBlockSize(static_cast<std::uint32_t>(row[0])) == nullptr) {
        throw base::Error(place + ": block_size " + std::to_string(row[0]) + " is none of 3GPP TS 36.212");
    }
    if (row[1] != iterations) {
        throw base::Error(place + ": iterations " + std::to_string(row[1]) + ", the manifest says " +
                          std::to_string(iterations));
    }
}

}  // namespace

tables::Table internalTable()
{
    tables::Table table = {"internal", {{"half_iteration", 5, false}, {"step", 13, false}}};
    for (const Signal& signal : passSignals) {
        table.columns.push_back({signal.name, passBits, true});
    }
    return table;
}

Layout::Layout(const tables::Format& format, const Settings& settings)
    : tables({blocksTable()}), streamsAreSeparate(settings.separateStreams && format.name == "memh")
{
    tables::Table together = {"stimulus", {}};
    for (const char* const name : streamNames) {
        const tables::Column column = {name, settings.width, true};
        together.columns.push_back(column);
        if (streamsAreSeparate) {
            tables.push_back({"stimulus_" + std::string(name), {column}});
        }
    }
    if (!streamsAreSeparate) {
        tables.push_back(together);
    }
    const auto add = [this](const tables::Table& table) {
        tables.push_back(table);
        return tables.size() - 1;
    };
    expected = add({"expected", {{"bit", 1, false}}});
    ratios = settings.ratios ? add({"ratios", {{"ratio", passBits, true}}}) : 0;
    internal = settings.internal ? add(internalTable()) : 0;
}

std::set<std::string> filesOfAllTables()
{
    std::set<std::string> names;
    Settings settings;
    settings.ratios = true;
    settings.internal = true;
    for (const bool separate : {false, true}) {
        settings.separateStreams = separate;
        for (const tables::Format& format : tables::formats()) {
            for (const tables::Table& table : Layout(format, settings).tables) {
                const std::vector<std::string> files = format.files(table);
                names.insert(files.begin(), files.end());
            }
        }
    }
    return names;
}

BlockWriter::BlockWriter(const std::string& folder, const tables::Format& format, const Settings& settings)
    : itsLayout(format, settings), itsIterations(settings.iterations), itsRows(itsLayout.tables.size())
{
    for (const tables::Table& table : itsLayout.tables) {
        itsWriters.push_back(format.writer(folder, table));
    }
}

void BlockWriter::add(const Stimulus& stimulus, const Expected& expected)
{
    const auto number = [](std::uint64_t value) {
        return static_cast<std::int64_t>(value);
    };
    addRow(itsLayout.blocks,
           {stimulus.K,
            itsIterations,
            stimulus.tag,
            expected.tag,
            number(itsRows[itsLayout.stimulus]),
            number(itsRows[itsLayout.expected])});
    addStimulus(stimulus);
    for (const std::uint8_t bit : expected.bits) {
        addRow(itsLayout.expected, {bit});
    }
    for (const std::int16_t ratio : expected.ratios) {
        addRow(itsLayout.ratios, {ratio});
    }
    for (const InternalStep& step : expected.internal) {
        tables::Row row = {step.halfIteration, step.step};
        row.insert(row.end(), step.values.begin(), step.values.end());
        addRow(itsLayout.internal, row);
    }
    ++itsBlock;
}

void BlockWriter::addStimulus(const Stimulus& stimulus)
{
    for (std::size_t position = 0; position < stimulus.streams[0].size(); ++position) {
        tables::Row row;
        for (std::size_t stream = 0; stream < stimulus.streams.size(); ++stream) {
            row.push_back(stimulus.streams[stream][position]);
            if (itsLayout.streamsAreSeparate) {
                addRow(itsLayout.stimulus + stream, {row.back()});
            }
        }
        if (!itsLayout.streamsAreSeparate) {
            addRow(itsLayout.stimulus, row);
        }
    }
}

void BlockWriter::finish()
{
    for (const auto& writer : itsWriters) {
        writer->finish();
    }
}

std::vector<KeptTable> BlockWriter::tables() const
{
    std::vector<KeptTable> kept;
    for (std::size_t i = 0; i < itsRows.size(); ++i) {
        kept.push_back({itsLayout.tables[i], itsRows[i]});
    }
    return kept;
}

void BlockWriter::addRow(std::size_t table, const tables::Row& row)
{
    itsWriters[table]->add(itsBlock, row);
    ++itsRows[table];
}

BlockReader::BlockReader(const std::string& folder, const tables::Format& format, const Settings& settings)
    : itsLayout(format, settings), itsIterations(settings.iterations), itsRows(itsLayout.tables.size())
{
    for (const tables::Table& table : itsLayout.tables) {
        itsReaders.push_back(format.reader(folder, table));
    }
}

bool BlockReader::next(Stimulus& stimulus, Expected& expected)
{
    ++itsBlock;
    if (!nextRow(itsLayout.blocks)) {
        expectEnd();
        return false;
    }
    checkBlock(itsRow, itsIterations, itsReaders[itsLayout.blocks]->place());
    expectFirst(4, itsLayout.stimulus);
    expectFirst(5, itsLayout.expected);
    stimulus = Stimulus{};
    stimulus.K = static_cast<std::uint32_t>(itsRow[0]);
    stimulus.tag = static_cast<std::uint32_t>(itsRow[2]);
    expected = Expected{};
    expected.tag = static_cast<std::uint32_t>(itsRow[3]);
    readStimulus(stimulus);
    readExpected(expected, stimulus.K);
    if (itsLayout.internal != 0) {
        readInternal(expected, stimulus.K);
    }
    return true;
}

/// Advances to the next row of a table, which must belong to the block.
bool BlockReader::nextRow(std::size_t table)
{
    const tables::TableReader& reader = *itsReaders[table];
    if (!itsReaders[table]->next(itsRow)) {
        return false;
    }
    if (reader.block().value_or(itsBlock) != itsBlock) {
        throw base::Error(reader.place() + ": block " + std::to_string(*reader.block()) + ", expected a row of block " +
                          std::to_string(itsBlock));
    }
    ++itsRows[table];
    return true;
}

/// Checks that a column of the blocks table gives the block's first row in another table.
void BlockReader::expectFirst(std::size_t column, std::size_t table) const
{
    if (static_cast<std::uint64_t>(itsRow[column]) != itsRows[table]) {
        throw base::Error(itsReaders[itsLayout.blocks]->place() + ": " + blocksTable().columns[column].name + ' ' +
                          std::to_string(itsRow[column]) + ", the block begins at " + std::to_string(itsRows[table]));
    }
}

void BlockReader::readRow(std::size_t table)
{
    if (!nextRow(table)) {
        throw base::Error(itsReaders[table]->place() + ": the rows of " + itsLayout.tables[table].name +
                          " end before the blocks do");
    }
}

void BlockReader::readStimulus(Stimulus& stimulus)
{
    for (std::size_t position = 0; position < stimulus.K + rules::tailPositions; ++position) {
        tables::Row values;
        for (std::size_t table = itsLayout.stimulus; table < itsLayout.expected; ++table) {
            readRow(table);
            values.insert(values.end(), itsRow.begin(), itsRow.end());
        }
        for (std::size_t stream = 0; stream < values.size(); ++stream) {
            tables::checkFits(values[stream], {streamNames[stream], 8, true}, itsReaders[itsLayout.stimulus]->place());
            stimulus.streams[stream].push_back(static_cast<std::int8_t>(values[stream]));
        }
    }
}

void BlockReader::readExpected(Expected& expected, std::uint32_t K)
{
    for (std::uint32_t k = 0; k < K; ++k) {
        readRow(itsLayout.expected);
        expected.bits.push_back(static_cast<std::uint8_t>(itsRow[0]));
        if (itsLayout.ratios != 0) {
            readRow(itsLayout.ratios);
            expected.ratios.push_back(static_cast<std::int16_t>(itsRow[0]));
        }
    }
}

void BlockReader::readInternal(Expected& expected, std::uint32_t K)
{
    for (std::uint32_t i = 0; i < rules::halfIterations(itsIterations) * (K + rules::tailSteps); ++i) {
        readRow(itsLayout.internal);
        InternalStep step;
        step.halfIteration = static_cast<std::uint32_t>(itsRow[0]);
        step.step = static_cast<std::uint32_t>(itsRow[1]);
        std::transform(itsRow.begin() + 2, itsRow.end(), step.values.begin(), [](std::int64_t value) {
            return static_cast<std::int16_t>(value);
        });
        expected.internal.push_back(step);
    }
}

void BlockReader::expectEnd()
{
    for (std::size_t table = 1; table < itsReaders.size(); ++table) {
        if (itsReaders[table]->next(itsRow)) {
            throw base::Error(itsReaders[table]->place() + ": has more rows of " + itsLayout.tables[table].name +
                              " than the blocks need");
        }
    }
}

}  // namespace morvik::vectors
