// Reads the lines of a message's quote body, for the load and for the comparison, which must agree on them.
#pragma once

#include "platform/xml/xml.h"

#include <QList>
#include <QString>

namespace kest {

enum class LineSection { Labour, Part, Paint, Sublet };
/// In the order in which they are loaded and compared.
inline constexpr LineSection lineSections[] = {LineSection::Labour, LineSection::Part, LineSection::Paint,
                                               LineSection::Sublet};

/// What is to happen to the shop's line. A line is also added if no line of its section has said anything so far.
enum class LineChange { Add, Insert, Alter, Keep, Delete, Unknown };

struct MessageLine {
    xml::Node node;
    QString indicator;  // its own, or that of the line before it

    LineChange change() const;

    /// Returns the text of an element, or an empty text if the line has none. A line that is to be deleted has nothing
    /// but its number, whatever the message says.
    QString text(QLatin1StringView element) const;
    /// The same, but throws NoObject if the element is missing.
    QString requiredText(QLatin1StringView element) const;

private:
    bool has(QLatin1StringView element) const;
};

/// Returns the lines of a section. A line without a change indicator has that of the line before it.
QList<MessageLine> messageLines(const xml::Node& body, LineSection section);

}  // namespace kest
