// Notice: prints text with control characters made visible.
#include "Notice.h"

#include <iostream>

#include "base/Error.h"
#include "base/Printable.h"

namespace morvik {

void notice(const std::string& line)
{
    std::cerr << base::visible(line) << std::endl;
}

void print(const std::string& text)
{
    if (!(std::cout << base::visibleLines(text) << std::flush)) {
        throw base::fileError("<stdout>", "written");
    }
}

}  // namespace morvik
