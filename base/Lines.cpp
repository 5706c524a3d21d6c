// Lines: a text taken line by line, whatever it is and however long.
#include "Lines.h"

#include "Csv.h"

namespace morvik::base {

Lines::Lines(std::istream& input, std::size_t longest)
    : itsInput(input),
      itsLongest(longest),
      itsBuffer(byteOrderMark.size() + longest + 2)  // \r, and the null that getline() adds
{
}

Lines::Found Lines::next()
{
    itsText = {};
    itsInput.getline(itsBuffer.data(), static_cast<std::streamsize>(itsBuffer.size()));
    if (itsInput.bad()) {
        return Found::unreadable;
    }
    auto length = static_cast<std::size_t>(itsInput.gcount());
    if (itsInput.eof() && length == 0) {
        return Found::end;
    }
    if (itsInput.good()) {
        --length;  // gcount() includes the \n
    }
    itsText = std::string_view(itsBuffer.data(), length);
    if (itsIsFirst) {
        itsText = withoutMark(itsText);
        itsIsFirst = false;
    }
    if (!itsText.empty() && itsText.back() == '\r') {
        itsText.remove_suffix(1);
    }
    const bool isWhole = itsInput.eof() || itsInput.good();
    return isWhole && itsText.size() <= itsLongest ? Found::line : Found::tooLong;
}

}  // namespace morvik::base
