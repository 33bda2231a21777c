// Parses numbers and dates for the conversions of values.h.
#pragma once

#include <QString>

#include <limits>
#include <optional>

namespace kest {

inline bool isBlank(QChar c)
{
    return c == u' ' || c == u'\t' || c == u'\r' || c == u'\n';
}

inline QStringView withoutBlanks(QStringView text)
{
    while (!text.isEmpty() && isBlank(text.front()))
        text = text.sliced(1);
    while (!text.isEmpty() && isBlank(text.back()))
        text.chop(1);
    return text;
}

inline bool isDigit(QChar c)
{
    return c >= u'0' && c <= u'9';
}

/// Reads a text from left to right. A step that does not match leaves the position unchanged.
class TextReader {
public:
    explicit TextReader(QStringView source) : text(source) {}

    bool atEnd() const { return position == text.size(); }

    bool take(char16_t c)
    {
        if (atEnd() || text[position] != QChar(c))
            return false;
        ++position;
        return true;
    }

    bool takeAnyOf(QStringView choice)
    {
        if (atEnd() || !choice.contains(text[position]))
            return false;
        ++position;
        return true;
    }

    void skipBlanks()
    {
        while (!atEnd() && isBlank(text[position]))
            ++position;
    }

    /// Reads all digits at this position, at most `most`.
    QStringView digits(qsizetype most = std::numeric_limits<qsizetype>::max())
    {
        const qsizetype start = position;
        while (!atEnd() && position - start < most && isDigit(text[position]))
            ++position;
        return text.sliced(start, position - start);
    }

    /// Reads a whole number of `least` to `most` digits.
    std::optional<int> number(int least, int most)
    {
        const QStringView found = digits(most);
        if (found.size() < least)
            return {};
        return found.toInt();
    }

private:
    QStringView text;
    qsizetype position = 0;
};

}  // namespace kest
