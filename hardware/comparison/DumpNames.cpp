// DumpNames: the names in a dump, whatever they stand for.
#include "DumpNames.h"

#include <algorithm>

#include "DumpFile.h"
#include "VcdWords.h"
#include "base/Csv.h"
#include "base/Numbers.h"

namespace morvik::comparison {

namespace {

constexpr std::size_t mostNames = 1U << 20;  // more than any design has

void addName(DumpNames& names, const DumpName& name, const DumpFile& file)
{
    if (names.names.size() == mostNames) {
        file.fail("more than " + std::to_string(mostNames) + " names");
    }
    names.names.insert(name);
}

/// The forms of the values seen so far.
struct Forms {
    bool anyLetter = false;
    bool anyOther = false;

    void take(std::string_view value)
    {
        const bool isHexadecimal = value.find_first_not_of("0123456789abcdefABCDEFxXzZ") == std::string_view::npos;
        anyOther = anyOther || !isHexadecimal;
        anyLetter = anyLetter || (isHexadecimal && value.find_first_of("abcdefABCDEF") != std::string_view::npos);
    }
};

}  // namespace

DumpNames namesOfCsv(std::istream& input, const std::string& name)
{
    DumpFile file(input, name);
    base::CsvReader row(file);
    if (!row.next()) {
        file.fail("no header");
    }
    DumpNames names;
    const auto signal = row.find("signal");
    const auto value = row.find("value");
    names.hasRows = signal.has_value() && value.has_value();
    for (const std::string_view column : names.hasRows ? std::vector<std::string_view>() : row.fields()) {
        addName(names, {std::string(column), 0}, file);
    }
    Forms forms;
    while (file.nextFilled()) {
        row.takeLine();
        const auto& fields = row.fields();
        for (std::size_t i = 0; i < fields.size(); ++i) {
            if (!names.hasRows || i == *value) {
                forms.take(fields[i]);
            } else if (i == *signal) {
                addName(names, {std::string(fields[i]), 0}, file);
            }
        }
    }
    names.isHexadecimal = forms.anyLetter && !forms.anyOther;
    return names;
}

DumpNames namesOfVcd(std::istream& input, const std::string& name)
{
    VcdWords file(input, name);
    DumpNames names;
    unsigned inPackage = 0;  // depth of scopes in that of the model's package, whose constants are named as signals
    while (file.nextWord() && file.word() != "$enddefinitions") {
        if (file.word() == "$scope") {
            file.expectWord("the kind of a scope");
            inPackage += inPackage > 0 || file.expectWord("the name of a scope") == "morvik_pkg" ? 1U : 0U;
        } else if (file.word() == "$upscope") {
            inPackage -= inPackage > 0 ? 1U : 0U;
        } else if (file.word() == "$var") {
            file.goOn();
            const std::string kind = file.expectWord("the kind of a variable");
            const std::string width = file.expectWord("the width of a variable");
            file.expectWord("the identifier of a variable");
            const std::string variable = file.nameOfVariable();
            if (kind != "parameter" && inPackage == 0) {
                const unsigned bits = kind == "real" ? 0 : base::parseNumber<unsigned>(width).value_or(0);
                addName(names, {variable, bits}, file);
            }
        }
    }
    return names;
}

}  // namespace morvik::comparison
