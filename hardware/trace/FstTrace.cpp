// FstTrace: a trace as a compact waveform, which GTKWave's vcd2fst makes of a value change dump.
#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include "TraceWriter.h"
#include "base/ChildProcess.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Path.h"
#include "base/System.h"

namespace morvik::trace {

namespace {

/// A folder for temporary files, removed with them.
class Workplace {
public:
    Workplace() : itsPath(base::system::makeTemporaryFolder("morvik-trace-"))
    {
        if (itsPath.empty()) {
            throw base::fileError("the folder for temporary files", "written");
        }
    }

    Workplace(const Workplace&) = delete;
    Workplace& operator=(const Workplace&) = delete;

    ~Workplace()
    {
        std::error_code ignored;
        std::filesystem::remove_all(base::pathOf(itsPath), ignored);
    }

    std::string file(const std::string& name) const
    {
        return itsPath + '/' + name;
    }

private:
    std::string itsPath;
};

/// As vcd2fst overwrites what it has written, it gets a file of its own, which is copied when it is complete.
class FstTrace : public TraceWriter {
public:
    FstTrace(base::OutputFile file, const rules::Cut& cut, const Selection& selection)
        : itsFile(std::move(file)), itsVcd(vcdTrace(base::OutputFile(itsPlace.file("trace.vcd")), cut, selection))
    {
    }

    void add(const Passes& passes, std::uint32_t halfIteration) override
    {
        itsVcd->add(passes, halfIteration);
    }

    void finish() override
    {
        itsVcd->finish();
        const std::string made = itsPlace.file("trace.fst");
        convert(itsPlace.file("trace.vcd"), made);
        std::ifstream input = base::openFile(made);
        std::vector<char> part(std::size_t{1} << 16);
        do {
            input.read(part.data(), static_cast<std::streamsize>(part.size()));
            itsFile.write({part.data(), static_cast<std::size_t>(input.gcount())});
        } while (input);
        itsFile.commit();
    }

private:
    static void convert(const std::string& vcd, const std::string& fst)
    {
        base::Outcome outcome;
        try {
            outcome = base::runProgram({"vcd2fst", vcd, fst}, "");
        } catch (const std::system_error& error) {
            throw base::Error("vcd2fst, which writes FST waveforms (Debian package gtkwave), cannot be started: " +
                              error.code().message());
        }
        if (!outcome.succeeded) {
            throw base::Error("vcd2fst cannot write the waveform: " + outcome.firstMessage());
        }
    }

    Workplace itsPlace;
    base::OutputFile itsFile;
    std::unique_ptr<TraceWriter> itsVcd;
};

}  // namespace

std::unique_ptr<TraceWriter> fstTrace(base::OutputFile file, const rules::Cut& cut, const Selection& selection)
{
    return std::make_unique<FstTrace>(std::move(file), cut, selection);
}

}  // namespace morvik::trace
