#include "support/Cases.h"

#include "support/Test.h"

namespace kest::test {

static QString unquoted(const QString& text)
{
    return text.size() > 1 && text.startsWith(u'"') && text.endsWith(u'"') ? text.sliced(1).chopped(1) : text;
}

QByteArray dataFile(const std::string& name)
{
    QFile file(checkoutFile(u"tests/data/"_s + QString::fromStdString(name)));
    if (!file.open(QIODevice::ReadOnly))
        throw std::runtime_error("no file " + name);
    return file.readAll();
}

QStringList linesOf(const std::string& name)
{
    QStringList lines = QString::fromUtf8(dataFile(name)).split(u'\n', Qt::SkipEmptyParts);
    lines.removeIf([](const QString& line) { return line.startsWith(u'#'); });
    if (lines.isEmpty())
        throw std::runtime_error("no lines in " + name);
    return lines;
}

QStringList cellsOf(const QString& line)
{
    static const QRegularExpression bar(u"(?<!\\S)\\|(?!\\S)"_s);
    QStringList cells = line.split(bar);
    for (QString& cell : cells)
        cell = unquoted(cell.trimmed());
    return cells;
}

QList<QStringList> rowsIn(const std::string& name)
{
    QList<QStringList> rows;
    for (const QString& line : linesOf(name)) {
        QStringList row = cellsOf(line);
        for (QString& cell : row) {
            const QString json = u"[\"%1\"]"_s.arg(cell.replace(u'"', u"\\\""_s));
            const QJsonArray read = QJsonDocument::fromJson(json.toUtf8()).array();
            if (read.size() != 1)
                throw std::runtime_error(name + " has a cell that can't be read: " + json.toStdString());
            cell = read[0].toString();
        }
        rows.append(row);
    }
    return rows;
}

std::vector<std::pair<QString, QString>> pairsIn(const QString& cell)
{
    static const QRegularExpression pair(u"([\\w/]+)=(\"[^\"]*\"|.*?)(?= +[\\w/]+=|$)"_s,
                                         QRegularExpression::DotMatchesEverythingOption);
    std::vector<std::pair<QString, QString>> pairs;
    for (const QRegularExpressionMatch& match : pair.globalMatch(cell))
        pairs.emplace_back(match.captured(1), unquoted(match.captured(2)));
    return pairs;
}

}  // namespace kest::test
