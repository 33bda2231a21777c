#include "platform/print/OutputFolder.h"

#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/print/Pages.h"

#include <QDir>
#include <QJsonDocument>

#include <cstdio>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

QString outputFolder;
int written = 0;

}  // namespace

void setOutputFolder(const QString& folder)
{
    outputFolder = folder.isEmpty() ? folder : QDir::cleanPath(QDir().absoluteFilePath(folder));
    written = 0;
    if (!outputFolder.isEmpty())
        files::makeFolder(outputFolder);
}

void writeOutput(int number, const Report& report, const QJsonObject& shown)
{
    if (outputFolder.isEmpty())
        return;
    const QString path = u"%1/%2-%3"_s.arg(outputFolder).arg(++written).arg(number);
    try {
        writePdf(report, path + u".pdf"_s);
        files::writeBytes(path + u".json"_s, QJsonDocument(shown).toJson());
    } catch (const RuntimeError& error) {
        const QString line = u"The report %1 can't be written: %2\n"_s.arg(path, error.description());
        std::fputs(line.toLocal8Bit().constData(), stderr);
    }
}

}  // namespace kest::report
