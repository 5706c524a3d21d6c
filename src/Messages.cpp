// Messages: composes and writes lines.
#include "Messages.h"

namespace morvik::messages {

void LineBuffer::add(std::string_view text)
{
    if (text.size() > sizeof itsText - itsSize) {
        writeOut();
    }
    if (text.size() > sizeof itsText) {
        itsStream.write(text.data(), static_cast<std::streamsize>(text.size()));
        return;
    }
    itsSize += text.copy(itsText + itsSize, text.size());
}

void LineBuffer::end()
{
    add("\n");
    writeOut();
    itsStream.flush();
}

void LineBuffer::writeOut()
{
    itsStream.write(itsText, static_cast<std::streamsize>(itsSize));
    itsSize = 0;
}

}  // namespace morvik::messages
