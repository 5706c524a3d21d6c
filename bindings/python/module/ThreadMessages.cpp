// ThreadMessages: the library's messages, kept for the caller instead of written to the process's streams.
#include "ThreadMessages.h"

#include <sstream>
#include <utility>

#include "src/Messages.h"

namespace {

thread_local std::ostringstream outputOfThread;
thread_local std::ostringstream errorOfThread;

/// The texts of the lines since the last call. A line is KIND:COMPONENT:TEXT.
std::vector<std::string> takeTexts(std::ostringstream& stream)
{
    std::istringstream lines(std::exchange(stream, std::ostringstream()).str());
    std::vector<std::string> texts;
    for (std::string line; std::getline(lines, line);) {
        const std::size_t component = line.find(':') + 1;
        texts.push_back(line.substr(line.find(':', component) + 1));
    }
    return texts;
}

}  // namespace

namespace morvik::messages {

std::ostream& output()
{
    return outputOfThread;
}

std::ostream& error()
{
    return errorOfThread;
}

}  // namespace morvik::messages

namespace morvik::python {

Messages takeMessages()
{
    Messages taken;
    taken.warnings = takeTexts(outputOfThread);
    const std::vector<std::string> errors = takeTexts(errorOfThread);
    taken.error = errors.empty() ? std::string() : errors.front();
    return taken;
}

}  // namespace morvik::python
