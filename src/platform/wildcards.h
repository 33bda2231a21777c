// Compares texts with patterns that have a wildcard.
#pragma once

#include <QStringView>

namespace kest {

/// Returns true if the whole text matches the pattern, in which `any` stands for any text, the empty one included. Each
/// other element of the pattern matches one character: `lengthOf` returns the length of the element at the start of a
/// pattern that is not empty, and `fits` whether a character matches an element.
///
/// The time is limited by the product of the lengths: after a mismatch it is enough to extend the match of the last
/// `any` by a character.
template <class LengthOf, class Fits>
bool matchesWildcards(QStringView text, QStringView pattern, QChar any, LengthOf&& lengthOf, Fits&& fits)
{
    qsizetype t = 0;
    qsizetype p = 0;
    qsizetype retryText = -1;
    qsizetype retryPattern = -1;
    while (t < text.size()) {
        const bool isAtEnd = p == pattern.size();
        const qsizetype length = isAtEnd ? 0 : lengthOf(pattern.sliced(p));
        if (!isAtEnd && pattern[p] == any) {
            retryPattern = ++p;
            retryText = t;
        } else if (!isAtEnd && fits(pattern.sliced(p, length), text[t])) {
            p += length;
            ++t;
        } else if (retryPattern >= 0) {
            p = retryPattern;
            t = ++retryText;
        } else {
            return false;
        }
    }
    while (p < pattern.size() && pattern[p] == any)
        ++p;
    return p == pattern.size();
}

}  // namespace kest
