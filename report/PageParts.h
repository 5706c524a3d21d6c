// PageParts: page.css and page.js, as the build found them.
#ifndef MORVIK_REPORT_PAGEPARTS_H
#define MORVIK_REPORT_PAGEPARTS_H

namespace morvik::report {

extern const char pageStyle[];
extern const char pageScript[];

}  // namespace morvik::report

#endif
