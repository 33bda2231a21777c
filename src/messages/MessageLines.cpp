#include "messages/MessageLines.h"

#include <utility>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr std::pair<QLatin1StringView, LineChange> changes[] = {
    {""_L1, LineChange::Add},   {"I"_L1, LineChange::Insert}, {"C"_L1, LineChange::Alter},
    {"N"_L1, LineChange::Keep}, {"D"_L1, LineChange::Delete},
};

QString pathOf(LineSection section)
{
    switch (section) {
        case LineSection::Labour:
            return u"rootns:labours/*"_s;
        case LineSection::Part:
            return u"rootns:parts/*"_s;
        case LineSection::Paint:
            return u"rootns:paints/*"_s;
        case LineSection::Sublet:
            break;
    }
    return u"rootns:sublets/*"_s;
}

}  // namespace

LineChange MessageLine::change() const
{
    for (const auto& [known, change] : changes)
        if (known == indicator)
            return change;
    return LineChange::Unknown;
}

bool MessageLine::has(QLatin1StringView element) const
{
    return change() != LineChange::Delete || element == "quoteLineNumber"_L1;
}

QString MessageLine::text(QLatin1StringView element) const
{
    return has(element) ? node.textOrEmptyOf(u"rootns:"_s + element) : QString();
}

QString MessageLine::requiredText(QLatin1StringView element) const
{
    return has(element) ? node.textOf(u"rootns:"_s + element) : QString();
}

QList<MessageLine> messageLines(const xml::Node& body, LineSection section)
{
    QList<MessageLine> lines;
    QString indicator;
    for (const xml::Node& node : body.selectNodes(pathOf(section))) {
        if (const xml::Node own = node.selectSingleNode(u"rootns:quoteLineChangeIndicator"_s))
            indicator = own.text();
        lines.append({node, indicator});
    }
    return lines;
}

}  // namespace kest
