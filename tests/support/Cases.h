// Reads tables of test cases from the text files in tests/data.
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

/// Reads a file of tests/data.
QByteArray dataFile(const std::string& name);

/// Returns the lines of a file of tests/data without its comments, which begin with "#".
QStringList linesOf(const std::string& name);

/// Returns the cells of a line, which are separated by "|". Blanks around a cell are ignored unless it is in double
/// quotes.
QStringList cellsOf(const QString& line);

/// Returns the rows of a table. Cells can contain characters in the form of JSON: "\n", "\\", "\u20ac".
QList<QStringList> rowsIn(const std::string& name);

/// Returns the pairs in a cell such as "column=value path/to=value". A value that begins or ends with a blank is in
/// quotes.
std::vector<std::pair<QString, QString>> pairsIn(const QString& cell);

/// Sets the columns of a row to the pairs in a cell. "-" is Null.
template <class Row>
Row& fill(Row&& row, const Text& columns)
{
    for (const auto& [column, value] : pairsIn(columns))
        row.set(column, value == QStringLiteral("-") ? Value(nullptr) : Value(value));
    return row;
}

/// Returns the rows of a table with `Columns` cells each.
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
