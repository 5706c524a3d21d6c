// CommaLocale: a global locale with a different number format.
#ifndef MORVIK_TESTS_SUPPORT_COMMALOCALE_H
#define MORVIK_TESTS_SUPPORT_COMMALOCALE_H

#include <locale>
#include <string>

/// The number punctuation of a locale that writes 1.234,5.
class CommaPunctuation : public std::numpunct<char> {
protected:
    char do_decimal_point() const override
    {
        return ',';
    }

    char do_thousands_sep() const override
    {
        return '.';
    }

    std::string do_grouping() const override
    {
        return "\3";
    }
};

/// Gives the global locale CommaPunctuation for the lifetime of the object.
class CommaLocale {
public:
    CommaLocale() : itsPrevious(std::locale::global(std::locale(std::locale(), new CommaPunctuation))) {}

    ~CommaLocale()
    {
        std::locale::global(itsPrevious);
    }

    CommaLocale(const CommaLocale&) = delete;
    CommaLocale& operator=(const CommaLocale&) = delete;

private:
    std::locale itsPrevious;
};

#endif
