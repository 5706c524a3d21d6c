// TableTrace: a trace as rows of integers, one for each trellis step.
#include <utility>

#include "TraceWriter.h"

namespace morvik::trace {

namespace {

class TableTrace : public TraceWriter {
public:
    TableTrace(std::unique_ptr<tables::TableWriter> table, std::uint32_t block, Selection selection)
        : itsTable(std::move(table)), itsBlock(block), itsSelection(std::move(selection))
    {
    }

    void add(const Passes& passes, std::uint32_t halfIteration) override
    {
        const rules::Cut& cut = passes.cut();
        for (std::uint32_t step = 0; step < cut.K() + rules::tailSteps; ++step) {
            const rules::StepPlace place = cut.placeOf(step);
            if (!itsSelection.showsUnit(place.unit)) {
                continue;
            }
            itsRow = {halfIteration,
                      constituentCode(halfIteration),
                      step,
                      place.segment,
                      place.row,
                      place.unit,
                      place.thread};
            for (const unsigned signal : itsSelection.signals) {
                itsRow.push_back(passes.isComputed(signal, step) ? passes.value(signal, step) : 0);
            }
            itsTable->add(itsBlock, itsRow);
        }
    }

    void finish() override
    {
        itsTable->finish();
    }

private:
    std::unique_ptr<tables::TableWriter> itsTable;
    std::uint32_t itsBlock;
    Selection itsSelection;
    tables::Row itsRow;
};

}  // namespace

tables::Table traceTable(const Selection& selection)
{
    tables::Table table = {"trace",
                           {{"half_iteration", 5, false},
                            {"code", 2, false},
                            {"step", 13, false},
                            {"segment", 5, false},
                            {"window", 4, false},
                            {"unit", 3, false},
                            {"thread", 2, false}}};
    for (const unsigned signal : selection.signals) {
        table.columns.push_back({passSignals[signal].name, passBits, true});
    }
    return table;
}

std::unique_ptr<TraceWriter> tableTrace(std::unique_ptr<tables::TableWriter> table,
                                        std::uint32_t block,
                                        const Selection& selection)
{
    return std::make_unique<TableTrace>(std::move(table), block, selection);
}

}  // namespace morvik::trace
