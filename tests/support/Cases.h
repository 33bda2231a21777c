// Cases of one rule as a table in a text file of tests/data.
#pragma once

#include "support/Text.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <algorithm>
#include <array>
#include <stdexcept>
#include <utility>
#include <vector>

namespace kest::test {

/// A file of tests/data.
QByteArray dataFile(const std::string& name);

/// The lines of a file of tests/data, without its comments: those that begin with "#".
QStringList linesOf(const std::string& name);

/// The cells of a line, with "|" and blanks between them. Blanks around a cell don't count, unless it stands in double
/// quotes.
QStringList cellsOf(const QString& line);

/// The rows of a table, whose cells write characters as JSON does: "\n", "\\", "\u20ac".
QList<QStringList> rowsIn(const std::string& name);

/// What stands in a cell as "column=value path/to=value"; a value that begins or ends with a blank stands in quotes.
std::vector<std::pair<QString, QString>> pairsIn(const QString& cell);

/// Sets the columns of a row that a cell names as `pairsIn` reads it; "-" is Null.
template <class Row>
Row& fill(Row&& row, const Text& columns)
{
    for (const auto& [column, value] : pairsIn(columns))
        row.set(column, value == QStringLiteral("-") ? Value(nullptr) : Value(value));
    return row;
}

/// The rows of a table, each of `Columns` cells.
template <std::size_t Columns>
std::vector<std::array<QString, Columns>> casesIn(const std::string& name)
{
    std::vector<std::array<QString, Columns>> rows;
    for (const QString& line : linesOf(name)) {
        const QStringList cells = cellsOf(line);
        if (cells.size() != Columns)
            throw std::runtime_error(name + " has another number of cells in: " + line.toStdString());
        std::ranges::copy(cells, rows.emplace_back().begin());
    }
    return rows;
}

}  // namespace kest::test
