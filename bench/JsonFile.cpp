// JsonFile: the figures of all repetitions, for other programs.
#include "JsonFile.h"

#include <cstddef>
#include <sstream>

namespace morvik::bench {

namespace {

constexpr struct {
    const char* name;
    double Figures::*figure;
} members[] = {{"Mbit/s", &Figures::megabitsPerSecond},
               {"cycles/bit/iteration", &Figures::cyclesPerBitAndIteration},
               {"latency_us", &Figures::latency},
               {"ratio_to_probe", &Figures::ratio},
               {"bit_error_rate", &Figures::bitErrorRate}};

}  // namespace

JsonFile::JsonFile(const std::string& name) : itsFile(name)
{
    itsFile.write("{\"benchmarks\": [");
}

void JsonFile::add(const Work& work, const std::vector<Figures>& repetitions)
{
    for (std::size_t i = 0; i < repetitions.size(); ++i) {
        std::ostringstream text;
        text << (itsBegun ? ",\n" : "\n") << R"({"name": ")" << work.name() << R"(", "repetition": )" << i;
        for (const auto& member : members) {
            text << ", \"" << member.name << "\": " << repetitions[i].*member.figure;
        }
        itsFile.write(text.str() + '}');
        itsBegun = true;
    }
}

void JsonFile::finish()
{
    itsFile.write("\n]}\n");
    itsFile.commit();
}

}  // namespace morvik::bench
