// Numbers the lines of a quote document.
#pragma once

#include <QString>

#include <vector>

namespace kest {

/// The line numbers of a document: 16-bit numbers, unique in all its sections.
class LineNumbers {
public:
    LineNumbers();

    /// Returns the number that the line already has, or 1 if it has none. If that number is taken, returns the next
    /// free one above it. Throws Overflow above 32767.
    int NextDocumentLine(const QString& seq);

private:
    std::vector<int> freeFrom;  // for each number itself if it is free, otherwise where to continue the search
};

}  // namespace kest
