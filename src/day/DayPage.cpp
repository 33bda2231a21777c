#include "day/DayPage.h"

#include "platform/files/files.h"

#include <QDir>
#include <QMap>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

/// Returns what happens in a step, by its number.
QString storyOf(const QString& step)
{
    static const QMap<QString, QString> stories{
        {u"00"_s, u"The shop opens. KESTWeb carries files between the shop and the insurer."_s},
        {u"01"_s, u"Requests have arrived from the insurer. They are loaded and become quotes."_s},
        {u"02"_s, u"The estimator writes the lines of the quotes in the host."_s},
        {u"03"_s,
         u"Quote 1029 is sent. The insurer has asked for extra information, which a window collects. It can't be sent twice."_s},
        {u"04"_s, u"The insurer has given the quote its number."_s},
        {u"05"_s,
         u"The quote is authorised: the insurer's changes, the sublet documents, and a job for the workshop."_s},
        {u"06"_s, u"The insurer wants the quote revised."_s},
        {u"07"_s, u"The estimator adds what the assessor has asked for."_s},
        {u"08"_s, u"The revised quote is sent."_s},
        {u"09"_s, u"The insurer has given it a new number."_s},
        {u"10"_s, u"The revised quote is authorised."_s},
        {u"11"_s, u"Another part turns out to be broken: the estimator writes an additional."_s},
        {u"12"_s, u"The additional is sent."_s},
        {u"13"_s, u"The insurer takes an assessment back."_s},
        {u"14"_s, u"The insurer rejects the additional. The read messages show it, and its report is printed again."_s},
        {u"15"_s, u"Quote 1030 is sent."_s},
        {u"16"_s, u"A quote that the insurer has written itself is loaded."_s},
        {u"17"_s, u"The insurer cancels the request of quote 1030."_s},
        {u"18"_s, u"The cancellation is taken back."_s},
        {u"19"_s, u"A notice about a quote that was sent twice is loaded."_s},
        {u"20"_s, u"With the password of the day, \"Utilities\" repairs the state of a quote."_s}};
    return stories.value(step.first(2), step);
}

QString boxesOf(const desktop::Record& shown)
{
    QString html;
    for (const QJsonValue box : shown.boxes)
        html +=
            u"<p class=\"box\">"_s + box[u"text"].toString().toHtmlEscaped().replace(u'\n', u"<br>"_s) + u"</p>\n"_s;
    return html;
}

}  // namespace

void DayPage::add(const QString& step, const desktop::Record& shown)
{
    steps += u"<h2>%1</h2>\n<p>%2</p>\n"_s.arg(step.section(u'.', 0, 0), storyOf(step)) + boxesOf(shown);
    for (const QString& picture : QDir(folder).entryList({step.first(2) + u"-*.png"_s}, QDir::Files, QDir::Name)) {
        const QString caption = picture.mid(3).section(u'.', 0, 0).replace(u'-', u' ');
        steps += u"<figure><img src=\"%1\" alt=\"%2\"><figcaption>%2</figcaption></figure>\n"_s.arg(picture, caption);
    }
    const QString page =
        u"<!DOCTYPE html>\n<html lang=\"en\"><head><meta charset=\"utf-8\"><title>A day in the demo shop</title>\n"
        "<style>body{font-family:sans-serif;max-width:60em;margin:auto;padding:1em}img{max-width:100%;border:1px solid "
        "#999}figure{margin:1em 0}.box{border-left:4px solid #2f6f8f;padding:.3em .8em;background:#eef3f6}</style>\n"
        "</head><body>\n<h1>A day in the demo shop</h1>\n%1</body></html>\n"_s.arg(steps);
    files::writeBytes(folder + u"/index.html"_s, page.toUtf8());
}

}  // namespace kest::app
