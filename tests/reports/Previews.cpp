#include "reports/Previews.h"

#include "platform/files/files.h"

#include <QFile>
#include <QJsonArray>
#include <QProcess>

namespace kest::test {

using namespace Qt::StringLiterals;

Previews::Previews()
{
    files::makeFolder(u"c:\\wirra32\\report"_s);
    for (const char* name : {"710.html", "720.html", "730.html"})
        putTemplate(name, files::readBytes(QStringLiteral(KEST_SOURCE_DIR "/templates/") + QLatin1String(name)));
}

void Previews::putTemplate(const char* name, const QByteArray& content)
{
    files::writeBytes(u"c:\\wirra32\\report\\"_s + QString::fromLatin1(name), content);
}

QList<QJsonObject> Previews::windows()
{
    QList<QJsonObject> shown;
    const QJsonArray& all = desktop->record().windows;
    for (; seen < all.size(); ++seen)
        shown.append(all[seen].toObject());
    return shown;
}

std::string Previews::shownReports()
{
    QStringList names;
    for (const QJsonObject& window : windows())
        names.append(window[u"name"].toString() + window[u"report"].toVariant().toString());
    return names.join(u' ').toStdString();
}

std::string Previews::cells(const QJsonObject& window, int row, const Text& fields)
{
    const QVariantList names = window[u"table"][u"fields"].toArray().toVariantList();
    QStringList texts;
    for (const QString& field : QString(fields).split(u' ')) {
        EXPECT_TRUE(names.contains(field)) << field.toStdString();
        const QJsonValue value = window[u"table"][u"rows"][row][names.indexOf(field)];
        texts.append(value.isNull() ? u"-"_s : value.toString());
    }
    return texts.join(u'|').toStdString();
}

QString pdfText(const QString& file)
{
    QProcess reader;
    reader.start(u"pdftotext"_s, {u"-layout"_s, u"-enc"_s, u"UTF-8"_s, file, u"-"_s});
    EXPECT_TRUE(reader.waitForFinished());
    EXPECT_EQ(reader.exitCode(), 0);
    return QString::fromUtf8(reader.readAllStandardOutput());
}

}  // namespace kest::test
