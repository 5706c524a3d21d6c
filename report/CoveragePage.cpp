// CoveragePage: which situations of the arithmetic have been met, as one self-contained HTML file.
#include "CoveragePage.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <locale>
#include <sstream>

#include "PageParts.h"
#include "Wording.h"
#include "base/OutputFile.h"

namespace morvik::report {

namespace {

constexpr char coverageTitle[] = "Situations of the arithmetic";

const char* kindOf(const CoverageRow& row)
{
    return !row.whyImpossible.empty() ? "impossible" : row.count == 0 ? "missing" : "met";
}

/// The length of a bar in percent: counts differ by powers of ten, so it is logarithmic.
long lengthOf(std::uint64_t count, std::uint64_t most)
{
    constexpr double whole = 100;
    return std::lround(whole * std::log1p(static_cast<double>(count)) / std::log1p(static_cast<double>(most)));
}

std::string resultOf(const CoverageRow& row, std::uint64_t most)
{
    if (!row.whyImpossible.empty()) {
        return "<td colspan=\"2\" class=\"why\">cannot occur: " + escaped(row.whyImpossible) + "</td>";
    }
    if (row.count == 0) {
        return "<td class=\"count\">missing</td><td></td>";
    }
    return "<td class=\"count\">" + grouped(row.count) +
           "</td><td class=\"bar\"><span style=\"width: " + std::to_string(lengthOf(row.count, most)) +
           "%\"></span></td>";
}

/// The rows of one rule, [first, last).
void writeRule(std::ostream& page, const CoverageRow* first, const CoverageRow* last, std::uint64_t most)
{
    const auto possible = std::count_if(first, last, [](const CoverageRow& row) { return row.whyImpossible.empty(); });
    const auto met = std::count_if(first, last, [](const CoverageRow& row) { return row.count > 0; });
    page << "<tbody class=\"" << (met < possible ? "lacking" : "whole")
         << "\">\n<tr><th scope=\"rowgroup\" colspan=\"2\">Rule " << first->rule
         << "</th><td class=\"count\" colspan=\"2\">" << met << " of " << possible << "</td></tr>\n";
    for (const CoverageRow* row = first; row != last; ++row) {
        page << "<tr class=\"" << kindOf(*row) << "\"><td><code>" << escaped(row->name)
             << "</code></td><td class=\"text\">" << escaped(row->text) << "</td>" << resultOf(*row, most) << "</tr>\n";
    }
    page << "</tbody>\n";
}

void writeTable(std::ostream& page, const std::vector<CoverageRow>& rows)
{
    std::uint64_t most = 1;
    for (const CoverageRow& row : rows) {
        most = std::max(most, row.count);
    }
    page << "<section>\n<h2 id=\"situations\">Situations</h2>\n"
            "<label class=\"check\"><input type=\"checkbox\" id=\"only\" autocomplete=\"off\">Show only what is "
            "missing</label>\n"
            "<div class=\"scroll\">\n<table class=\"situations\" aria-labelledby=\"situations\">\n"
            "<thead><tr><th scope=\"col\">Situation</th><th scope=\"col\">What it is</th>"
            "<th scope=\"col\" colspan=\"2\">Times met</th></tr></thead>\n";
    const CoverageRow* const end = rows.data() + rows.size();
    const CoverageRow* first = rows.data();
    while (first != end) {
        const CoverageRow* const last =
            std::find_if(first, end, [first](const CoverageRow& row) { return row.rule != first->rule; });
        writeRule(page, first, last, most);
        first = last;
    }
    page << "</table>\n</div>\n</section>\n";
}

void writeCores(std::ostream& page, const CoverageDescription& coverage)
{
    page << "<section>\n<h2 id=\"cores\">Cores</h2>\n<table class=\"parameters\" aria-labelledby=\"cores\">\n";
    for (const auto& [core, blocks] : coverage.cores) {
        page << "<tr><th scope=\"row\">" << escaped(core) << "</th><td>" << grouped(blocks)
             << (blocks == 1 ? " block" : " blocks") << "</td></tr>\n";
    }
    page << "</table>\n</section>\n";
}

}  // namespace

void writeCoveragePage(const std::string& fileName, const CoverageDescription& coverage)
{
    std::ostringstream page;
    page.imbue(std::locale::classic());
    page << "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
            "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; style-src 'unsafe-inline'; "
            "base-uri 'none'; form-action 'none'\">\n"
            "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n<title>"
         << coverageTitle << "</title>\n<style>\n"
         << pageStyle << coverageStyle << "</style>\n</head>\n<body>\n<main>\n<h1>" << coverageTitle
         << "</h1>\n<p class=\"lead\">" << escaped(coverage.lead) << "</p>\n";
    writeTable(page, coverage.rows);
    writeCores(page, coverage);
    page << "<footer>The rules are those of docs/arithmetic.md. Bars are "
            "logarithmic.</footer>\n</main>\n</body>\n</html>\n";
    base::writeFile(fileName, page.str());
}

}  // namespace morvik::report
