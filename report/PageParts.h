// PageParts: page.css, coverage.css and page.js, embedded by the build.
#ifndef MORVIK_REPORT_PAGEPARTS_H
#define MORVIK_REPORT_PAGEPARTS_H

namespace morvik::report {

extern const char pageStyle[];
extern const char coverageStyle[];
extern const char pageScript[];

}  // namespace morvik::report

#endif
