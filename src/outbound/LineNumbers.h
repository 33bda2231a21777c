// Gives the lines of a quote document their numbers.
#pragma once

#include <QString>

#include <vector>

namespace kest {

/// The line numbers of one document: 16-bit, unique over all its sections.
class LineNumbers {
public:
    LineNumbers();

    /// The number that the line already has, or 1 where it has none; the next free one above where that is taken.
    /// Throws Overflow past 32767.
    int NextDocumentLine(const QString& seq);

private:
    std::vector<int> freeFrom;  // a number, or where the search for a free one goes on
};

}  // namespace kest
