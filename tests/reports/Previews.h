// Sets the report templates of a test's shop, and reads the reports that were shown.
#pragma once

#include "platform/print/OutputFolder.h"
#include "reports/PrintXML.h"
#include "support/Shop.h"

#include <QPdfDocument>

namespace kest::test {

class Previews : public Shop {
protected:
    Previews()
    {
        for (const int report : {710, 720, 730})
            Shop::putTemplate(report);
    }
    ~Previews() override { report::setOutputFolder({}); }

    static void putTemplate(const char* name, const QByteArray& content)
    {
        files::writeBytes(u"c:\\wirra32\\report\\"_s + QString::fromLatin1(name), content);
    }
    /// Returns the windows that were shown since the last call.
    QList<QJsonObject> windows()
    {
        QList<QJsonObject> shown;
        for (; seen < desktop->record().windows.size(); ++seen)
            shown.append(desktop->record().windows[seen].toObject());
        return shown;
    }
    static void print(const Text& message, bool reprint = true)
    {
        gsListFolder = gsReadPath;
        files::write(gsReadPath + u"message.xml"_s, message);
        PrintXML(u"message.xml"_s, reprint);
    }
    QJsonObject onlyWindow()
    {
        const QList<QJsonObject> all = windows();
        EXPECT_EQ(all.size(), 1);
        return all.value(0);
    }
    QJsonObject printed(const Text& message, bool reprint = false)
    {
        print(message, reprint);
        return onlyWindow();
    }
    /// Returns their names and report numbers, separated by blanks.
    std::string shownReports()
    {
        QStringList names;
        for (const QJsonObject& window : windows())
            names.append(window[u"name"].toString() + window[u"report"].toVariant().toString());
        return names.join(u' ').toStdString();
    }
    /// Returns the cells of a row in the table of a recorded window, with "-" for a field that was never set.
    static std::string cells(const QJsonObject& window, int row, const Text& fields, QChar between = u'|')
    {
        const QVariantList names = window[u"table"][u"fields"].toArray().toVariantList();
        QStringList texts;
        for (const QString& field : QString(fields).split(u' ')) {
            EXPECT_TRUE(names.contains(field)) << field.toStdString();
            const QJsonValue value = window[u"table"][u"rows"][row][names.indexOf(field)];
            texts.append(value.isNull() ? u"-"_s : value.toString());
        }
        return texts.join(between).toStdString();
    }
    /// Returns a field of all rows.
    static std::string column(const QJsonObject& window, const Text& field)
    {
        std::string texts;
        for (int row = 0; row < window[u"table"][u"rows"].toArray().size(); ++row)
            texts += (row > 0 ? ", " : "") + cells(window, row, field);
        return texts;
    }

private:
    qsizetype seen = 0;
};

/// Returns the text of a PDF file, with form feeds between the pages.
inline QString pdfText(const QString& file)
{
    QProcess reader;
    reader.start(u"pdftotext"_s, {u"-layout"_s, u"-enc"_s, u"UTF-8"_s, file, u"-"_s});
    EXPECT_TRUE(reader.waitForFinished());
    EXPECT_EQ(reader.exitCode(), 0);
    return QString::fromUtf8(reader.readAllStandardOutput());
}

/// Returns the value of a PDF file that its title or its author is.
inline QString pdfValue(const QString& file, QPdfDocument::MetaDataField field = QPdfDocument::MetaDataField::Title)
{
    QPdfDocument document;
    EXPECT_EQ(document.load(file), QPdfDocument::Error::None);
    return document.metaData(field).toString();
}

}  // namespace kest::test
