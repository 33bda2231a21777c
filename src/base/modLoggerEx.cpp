#include "base/modLoggerEx.h"

#include "base/Helpers.h"
#include "platform/Prompt.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QDateTime>
#include <QLocale>

#include <optional>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr qint64 fullAt = 1'048'576;  // bytes
constexpr auto lineBreak = "\r\n"_L1;

QString record(int line, const QString& source, const QString& number, const QString& description)
{
    const QString now = QLocale::c().toString(QDateTime::currentDateTime(), u"dd/MM/yyyy h:mm:ss AP"_s);
    return now + u": Line No: "_s + QString::number(line) + lineBreak +  //
           u"\t\tSource: "_s + source + lineBreak +                      //
           u"\t\tError Number: "_s + number + lineBreak +                //
           u"\t\tDescription: "_s + description + lineBreak;
}

void addRecord(const QString& text)
{
    if (LogIsFull(errorLogPath()))
        files::write(errorLogPath(), text);
    else
        files::append(errorLogPath(), text);
}

}  // namespace

void LogError(int line, const QString& source, const QString& number, const QString& description, const QString& title,
              int mode)
{
    QString text = u"Line No: "_s + QString::number(line) + lineBreak + u"Source: "_s + source + lineBreak +
                   u"Error Number: "_s + number + lineBreak + u"Description: "_s + description;
    std::optional<RuntimeError> unwritten;
    if (mode == BoxAndFile) {
        try {
            addRecord(record(line, source, number, description));
        } catch (const RuntimeError& error) {
            unwritten = error;
            text += lineBreak + u"The error log can't be written: "_s + error.description();
        }
    }
    if (mode == BoxOnly || mode == BoxAndFile)
        desktop::msgBox(text, desktop::Icon::Critical, title);
    if (unwritten)
        throw unwritten->asTold();
}

void LogError(const RuntimeError& error, const QString& source, const QString& title)
{
    if (error.isTold())
        throw error;
    LogError(0, source, QString::number(error.number()), error.description(), title, BoxAndFile);
}

void logFailure(const RuntimeError& error, const QString& source)
{
    addRecord(record(0, source, QString::number(error.number()), error.description()));
}

bool LogIsFull(const QString& path)
{
    return files::exists(path) && files::size(path) >= fullAt;
}

QString errorLogPath()
{
    return profile::componentFolder() + u"/kest2error.log"_s;
}

QString lastLogRecord()
{
    if (!files::exists(errorLogPath()))
        return {};
    const QString log = files::read(errorLogPath());
    const qsizetype mark = log.lastIndexOf(u": Line No: "_s);
    return mark < 0 ? QString() : log.mid(log.lastIndexOf(u'\n', mark) + 1).trimmed();
}

QString QuoteClean(const QString& text)
{
    return trimBlanks(text).replace(u'"', u'\'');
}

}  // namespace kest
