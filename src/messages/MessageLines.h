// Reads the lines of a message's quote body, for the load and for the comparison, which must agree on them.
#pragma once

#include "platform/xml/xml.h"

#include <QList>
#include <QString>

namespace kest {

/// The section of a line.
enum class LineSection { Labour, Part, Paint, Sublet };
/// The sections in the order in which they are loaded and compared.
inline constexpr LineSection lineSections[] = {LineSection::Labour, LineSection::Part, LineSection::Paint,
                                               LineSection::Sublet};

/// How a line changes that of the shop. A line is also added if neither it nor a line before it in its section has an
/// indicator.
enum class LineChange { Add, Insert, Alter, Keep, Delete, Unknown };

/// A line of a message.
struct MessageLine {
    xml::Node node;
    QString indicator;  // its own, or that of the line before it

    /// Returns how the line changes that of the shop.
    LineChange change() const;

    /// Returns the text of an element, or an empty text if the line does not have it. A deleted line has only its
    /// number, even if the message has more.
    QString text(QLatin1StringView element) const;
    /// The same, but throws NoObject if the element is missing.
    QString requiredText(QLatin1StringView element) const;

private:
    bool has(QLatin1StringView element) const;
};

/// Returns the lines of a section. A line without a change indicator has that of the line before it.
QList<MessageLine> messageLines(const xml::Node& body, LineSection section);

}  // namespace kest
