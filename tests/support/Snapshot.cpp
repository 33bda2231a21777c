#include "support/Snapshot.h"

#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/modLoadXML.h"
#include "support/Test.h"

namespace kest::test {

constexpr const char* tables[] = {"QUOTE1", "QUOTE2",          "QUOTE3", "CAR",   "CUSTOMER", "INSURER",     "CINFO",
                                  "VENDOR", "ALLMODEL",        "MODEL",  "BODY2", "JOBSTAGE", "KESTColours", "SUBLET",
                                  "DEBTOR", "ReportDefinition"};

static QString driveC()
{
    return profile::root() + u"/drive_c"_s;
}

static QMap<QString, QByteArray> filesOnDisk()
{
    QMap<QString, QByteArray> found;
    QDirIterator walk(driveC(), QDir::Files | QDir::Hidden, QDirIterator::Subdirectories);
    while (walk.hasNext()) {
        QFile file(walk.next());
        if (file.open(QIODevice::ReadOnly))
            found.insert(file.fileName(), file.readAll());
    }
    return found;
}

std::string holdings()
{
    QStringList lines;
    for (const char* table : tables) {
        const QString name = QString::fromLatin1(table);
        QStringList ofTable;
        for (const QSqlRecord& row : plainRows(u"SELECT * FROM "_s + name)) {
            QStringList values{name};
            for (int i = 0; i < row.count(); ++i)
                if (row.fieldName(i) != u"itemid"_s)  // a line that is stored again gets another one
                    values += row.fieldName(i) + u'=' + (row.isNull(i) ? u"Null"_s : plainText(row.value(i)));
            ofTable += values.join(u' ');
        }
        ofTable.sort();
        lines += ofTable;
    }
    const QMap<QString, QByteArray> files = filesOnDisk();
    for (auto file = files.begin(); file != files.end(); ++file)
        lines += file.key().sliced(driveC().size()) + u": "_s + QString::fromLatin1(file.value());
    return lines.join(u'\n').toStdString();
}

std::string difference(const std::string& expected, const std::string& found)
{
    const QStringList before = QString::fromStdString(expected).split(u'\n');
    const QStringList after = QString::fromStdString(found).split(u'\n');
    QStringList lines;
    for (const QString& line : before + after)
        if (before.contains(line) != after.contains(line))
            lines += (before.contains(line) ? u"- "_s : u"+ "_s) + line;
    return '\n' + lines.join(u'\n').toStdString();
}

Snapshot::Snapshot() : files_(filesOnDisk()) {}

void Snapshot::restore() const
{
    restoreShopDatabase(database_);
    const QMap<QString, QByteArray> now = filesOnDisk();
    for (const QString& file : now.keys())
        QFile::remove(file);
    for (auto file = files_.begin(); file != files_.end(); ++file)
        files::writeBytes(file.key(), file.value());
    gsMatchedQTNNO.clear();
    gsDeletedQTNNO.clear();
    gsDeletedSubquote.clear();
}

}  // namespace kest::test
