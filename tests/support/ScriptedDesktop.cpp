#include "support/ScriptedDesktop.h"

#include "support/Test.h"

namespace kest::test {

static QJsonObject parsed(const QByteArray& text)
{
    QJsonParseError error;
    const QJsonDocument document = QJsonDocument::fromJson(text, &error);
    if (!document.isObject())
        throw std::invalid_argument("the test's script is no JSON object: " + error.errorString().toStdString());
    return document.object();
}

ScriptedDesktop::ScriptedDesktop(const QByteArray& json) : script(std::make_shared<desktop::Script>(parsed(json)))
{
    for (const QString& window : {u"frmPrintPreview"_s, u"frmSubletAuth"_s, u"frmViewPDF"_s})
        script->recordAndClose(window);
    desktop::useScript(script);
}

ScriptedDesktop::~ScriptedDesktop()
{
    desktop::useScript(nullptr);
    EXPECT_NO_THROW(desktop::throwKept());
}

QStringList ScriptedDesktop::boxTexts() const
{
    QStringList texts;
    for (const QJsonValue box : record().boxes)
        texts.append(box[u"text"_s].toString());
    return texts;
}

QStringList ScriptedDesktop::boxes() const
{
    QStringList result;
    for (const QJsonValue box : record().boxes)
        result.append(QStringList{box[u"icon"_s].toString(), box[u"title"_s].toString(), box[u"text"_s].toString(),
                                  box[u"answer"_s].toString()}
                          .join(u'|'));
    return result;
}

QJsonValue ScriptedDesktop::read(const QString& control, const QString& what) const
{
    for (qsizetype at = record().reads.size(); at-- > 0;) {
        const QJsonValue seen = record().reads[at][u"values"_s][control];
        if (seen.isObject())
            return seen[what];
    }
    return QJsonValue::Null;
}

}  // namespace kest::test
