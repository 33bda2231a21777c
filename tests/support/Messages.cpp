#include "support/Messages.h"

#include "messages/Envelope.h"
#include "support/Test.h"

namespace kest::test {

static QString textOfSample(const QString& name)
{
    return QString::fromUtf8(dataFile("messages/" + name.toStdString() + ".xml"));
}

static QString pathTo(const QString& path)
{
    return u"p754:"_s + QString(path).replace(u"/"_s, u"/p754:"_s);
}

Fields fieldsIn(const QString& cell)
{
    const auto pairs = pairsIn(cell);
    return {pairs.begin(), pairs.end()};
}

Message::Message(const QString& text)
{
    SetupDocument(document);
    if (!document.loadXML(text))
        throw std::runtime_error("a test's message does not parse: " + document.parseError().reason.toStdString());
}

Message Message::sample(const Text& name)
{
    return Message(textOfSample(name));
}

Message::Message(const Text& code, const Text& root)
    : Message(u"<p754:%1 xmlns:p754=\"%2\"/>"_s.arg(QString(root), GetNamespaceURI()))
{
    if (!QString(code).isEmpty())
        document.documentElement()
            .appendChild(document.createNode(xml::NodeType::Element, u"messageType"_s))
            .setText(code);
}

xml::Node Message::add(xml::Node parent, const QString& name)
{
    return parent.appendChild(document.createNode(xml::NodeType::Element, u"p754:"_s + name, GetNamespaceURI()));
}

xml::Node Message::at(const QString& path)
{
    if (const xml::Node found = document.selectSingleNode(pathTo(path)))
        return found;
    const qsizetype cut = path.lastIndexOf(u'/');
    return add(cut < 0 ? document.documentElement() : at(path.left(cut)), path.mid(cut + 1));
}

Message& Message::set(const Text& path, const Text& text)
{
    at(path).setText(text);
    return *this;
}

Message& Message::setFirst(std::initializer_list<Text> paths, const Text& text)
{
    for (const Text& path : paths)
        if (document.selectSingleNode(pathTo(path)))
            return set(path, text);
    return set(*paths.begin(), text);
}

Message& Message::without(const Text& path)
{
    const xml::Node nowhere = document.createNode(xml::NodeType::Element, u"nowhere"_s);
    for (const xml::Node& element : document.selectNodes(pathTo(path)))
        nowhere.appendChild(element);
    return *this;
}

Message& Message::with(const Text& elements)
{
    for (const auto& [path, value] : pairsIn(elements))
        value == u"-"_s ? without(path) : set(path, value);
    return *this;
}

Message Message::told(const Text& text)
{
    const QStringList lines = QString(text).split(u'\n', Qt::SkipEmptyParts);
    Message message = sample(lines.value(0).section(u' ', 0, 0)).with(lines.value(0).section(u' ', 1));
    for (const QString& line : lines.mid(1))
        message.line(line);
    return message;
}

Message& Message::images(std::initializer_list<Text> ids)
{
    const xml::Node list = at(u"quoteRequestImageIds"_s);
    for (const Text& id : ids)
        add(list, u"quoteRequestImageId"_s).setText(id);
    return *this;
}

Message& Message::line(const Text& kind, int number, const Text& change, const Fields& fields)
{
    static const Message lines = sample("lines");
    const xml::Node line = add(at(u"quoteBody/%1s"_s.arg(QString(kind))), kind);
    if (!QString(change).isEmpty())
        add(line, u"quoteLineChangeIndicator"_s).setText(change);
    add(line, u"quoteLineNumber"_s).setText(QString::number(number));
    if (QString(change) != u"D"_s)
        for (const xml::Node& usual : lines.document.selectNodes(pathTo(kind) + u"/*"_s))
            add(line, usual.nodeName().section(u':', -1)).setText(usual.text());
    for (const auto& [name, value] : fields) {
        xml::Node usual = line.selectSingleNode(pathTo(name));
        (usual ? usual : add(line, name)).setText(value);
    }
    return *this;
}

Message& Message::line(const QString& told)
{
    const QStringList words = told.split(u' ');
    if (!QStringList{u"labour"_s, u"part"_s, u"paint"_s, u"sublet"_s}.contains(words[0]))
        throw std::runtime_error("not a line: " + told.toStdString());
    return line(words[0], words.value(1).toInt(), words.value(2).remove(u'-'), fieldsIn(told.section(u' ', 3)));
}

QString marker(const Text& quoteNumber, const Text& subquote, const Text& action)
{
    return textOfSample(u"marker"_s).arg(QString(quoteNumber), QString(subquote), QString(action));
}

QString sentDocument(const Text& reference)
{
    return textOfSample(u"sent"_s).arg(QString(reference));
}

}  // namespace kest::test
