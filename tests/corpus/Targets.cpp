#include "corpus/Targets.h"

#include "base/Helpers.h"
#include "base/QuoteKey.h"
#include "inbound/modLoadXML.h"
#include "loopback/InsurerRules.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "messages/MessageTypes.h"
#include "outbound/QuoteImages.h"
#include "platform/files/CodePage.h"
#include "platform/print/Pages.h"
#include "platform/print/Report.h"
#include "platform/settings/RegistryFile.h"
#include "quotedata/NoteChain.h"
#include "sublets/PdfViewer.h"
#include "sublets/SubletDocuments.h"
#include "support/Shop.h"
#include "utilities/ExactTextEdit.h"
#include "utilities/FormatXML.h"

#include <cmath>
#include <filesystem>
#include <fstream>

namespace kest::test {

namespace {

const auto bystander = u"BYSTANDER"_s;
const auto message = u"m.xml"_s;

void require(bool holds, const char* promise)
{
    if (!holds)
        throw std::logic_error(promise);
}

/// A shop for a target, with a quote that messages may change and others that only those about a bystander may.
class ShopTarget final : public Target, Shop {
public:
    using Reader = void (*)(ShopTarget&, const QByteArray&);
    explicit ShopTarget(Reader reader) : read(reader)
    {
        car(bystander).set("CUST_ID", customer(bystander).id());
        quote(bystander).rego(bystander).request(bystander).quoteNumber(bystander).line(1);
        quote("BYSTANDER2").rego(bystander).request("", "").quoteNumber("").line(1);
        for (const QString& folder : {gsReadPath, gsUnsentPath})
            files::write(folder + bystander, bystander);
        quote("500").request("QR1").quoteNumber("KQ1").stage(3).line(1).set("VENDOR", 0);
        quote("500").note("Responded Quote Request").note("Sending KEST Quote");
        files::makeFolder(u"c:\\wirra32\\report"_s);
        before.emplace();
        held = holdings();
    }
    void take(const QByteArray& input) override
    {
        desktop.emplace();
        read(*this, input);
    }
    void TestBody() override {}

    /// Returns what the shop holds, and makes it as it was.
    std::string takeBack()
    {
        std::string now = holdings();
        if (now != held)
            before->restore();
        return now;
    }

    std::string held;
    using Shop::arrive;
    using Shop::desktop;
    using Shop::root;

private:
    Reader read;
    std::optional<Snapshot> before;
};

/// Takes the first line off an input.
QByteArray firstLine(QByteArray& input)
{
    const qsizetype end = input.indexOf('\n');
    const QByteArray line = end < 0 ? input : input.first(end);
    input = end < 0 ? QByteArray() : input.sliced(end + 1);
    return line;
}

/// Creates a file of any name, even one that is not UTF-8. Returns false if the system does not accept the name.
bool create(const QString& folder, const QByteArray& name, const QByteArray& content)
{
    if (name.isEmpty() || name.size() > 200 || name.contains('/') || name.contains('\0') || name == "." || name == "..")
        return false;
    std::ofstream file(files::systemPath(folder).toStdString() + '/' + name.toStdString(), std::ios::binary);
    file << content.toStdString() << std::flush;
    return file.good();
}

void emptyFolder(const QString& folder)
{
    // not with Qt, which can't name a file whose name is not UTF-8
    for (const auto& file : std::filesystem::directory_iterator(files::systemPath(folder).toStdString()))
        if (file.path().filename() != bystander.toStdString())
            std::filesystem::remove(file.path());
}

void readXml(ShopTarget&, const QByteArray& input)
{
    QString text = files::fromCodePage(input);
    parsedMessage(text).parseError();
    QByteArray bytes = input;
    xml::Document document;
    SetupDocument(document);
    if (!parseWithRepairs(document, bytes)) {
        require(document.documentElement().isNull(), "an unreadable text leaves no document");
        require(document.parseError().srcText.size() <= 10'000, "the shown source is limited");
        return;
    }
    const QString written = document.xml();
    xml::Document again;
    require(again.loadXML(written), "a document can be read as it is written");
    require(again.xml() == written, "a document is written as it was read");
    require(again.documentElement().text() == document.documentElement().text(), "no text is lost");
    if (isSameWhenPrepared(bytes)) {
        QString prepared = files::fromCodePage(bytes);
        require(parsedMessage(prepared).documentElement().text() == document.documentElement().text(),
                "a text that is the same when prepared is so");
    }
    GetMessageTypeName(document);
    GetMarkerTypeName(document);
    GetMessageRow(document, u"SENT"_s);
}

/// Returns a message: the input itself, or the sample that it describes. Returns nothing if there is no such sample.
std::optional<QString> messageIn(const QByteArray& input)
{
    const bool isSample = input.size() >= 4 && input[0] >= 'A' && input[0] <= 'Z';
    if (!isSample)
        return files::fromCodePage(input);
    try {
        return Message::told(QString::fromUtf8(input)).text();
    } catch (const std::exception&) {
        return {};
    }
}

QStringList about(const char* what, const std::string& text)
{
    return QString::fromStdString(text).split(u'\n').filter(QRegularExpression(QString::fromLatin1(what)));
}

/// Returns the rows and files without the mark of a car of the network, the only thing stored before a refusal.
QString withoutCarMark(const std::string& text)
{
    static const QRegularExpression mark(u"^(CAR REGO=.*) KEST=\\S+"_s, QRegularExpression::MultilineOption);
    return QString::fromStdString(text).replace(mark, u"\\1"_s);
}

void loadMessage(ShopTarget& shop, const QByteArray& input)
{
    const std::optional<QString> text = messageIn(input);
    if (!text)
        return;
    shop.arrive(message, *text);
    const bool isTaken = loadAsTheWindow(message);
    if (!isTaken)
        files::remove(gsUnreadPath + message);
    const QString code = text->section(u"messageType>"_s, 1, 1).section(u'<', 0, 0).toUpper();
    const bool isOfKnownType = findMessageType(code) != nullptr;  // no other is told of
    require(isTaken || !isOfKnownType || !shop.desktop->boxes().isEmpty(), "a refusal has a box");
    const std::string now = shop.takeBack();
    const bool isMerged = code == "AUQT"_L1 || code == "MANQ"_L1;  // lines before the one that fails stay
    require(isTaken || isMerged || withoutCarMark(now) == withoutCarMark(shop.held), "a refusal changes nothing");
    if (!text->contains(u"BYSTANDER"_s))
        require(about("BYSTANDER", now) == about("BYSTANDER", shop.held), "a message changes no other quote");
    require(about("^/", now) == about("^/wir(doc/(A|PDF/)|img/)", now), "a message writes no file elsewhere");
}

void put(const QString& folder, const QByteArray& input)
{
    QByteArray name = "m.xml", content;
    for (const QByteArray& line : (input + "\n@").split('\n')) {
        if (line.startsWith('@')) {
            create(folder, name, std::exchange(content, {}));
            name = line.sliced(1);
        } else {
            content += line + '\n';
        }
    }
}

QByteArray filesAs(const QString& folder)
{
    QByteArray all;
    for (const QFileInfo& file : QDir(files::systemPath(folder)).entryInfoList(QDir::Files | QDir::Hidden))
        all += file.fileName().toUtf8() + ' ' + QByteArray::number(file.size()) + '\n';
    return all;
}

/// Fills the list from folders that contain the files of the input.
void fillList(ShopTarget& shop, const QByteArray& input)
{
    for (const MessageFolder folder : messageFolders) {
        gsListFilter.clear();
        gbFilterAsked = false;
        const QString path = pathOf(folder);
        put(path, input);
        const QByteArray own = filesAs(path);
        attempt([&] {
            for (const ListedMessage& listed : BuildMessageList(folder, {LoadSubmissionResponse, {}, {}}))
                require(isBareName(listed.file), "a listed name is a name");
        });
        require(filesAs(path) == own, "a fill leaves the files as they are");
        if (folder == MessageFolder::Unread)
            for (const QString& file : files::list(path))
                attempt([&] { GetReadFileName(path + file); });
        emptyFolder(path);
    }
    const std::string now = shop.takeBack();
    for (const QString& line : QString::fromStdString(difference(shop.held, now)).split(u'\n', Qt::SkipEmptyParts))
        require(line.mid(2).startsWith(u"QUOTE1 "_s) || line.mid(2).startsWith(u"QUOTE3 "_s),
                "a fill changes only the quote of a response");
}

void readNotes(ShopTarget&, const QByteArray& input)
{
    QByteArray rest = input;
    const QString subject = files::fromCodePage(firstLine(rest));
    const QString status = files::fromCodePage(firstLine(rest));
    const QString detail = files::fromCodePage(firstLine(rest));
    const QString chain = files::fromCodePage(rest);
    GetNoteStatus(subject, chain);
    require(RemoveNote(subject, chain).size() <= chain.size() + chain.count(u')'), "a removal adds no notes");
    QString changed = chain;
    require(AddNote(subject, status, changed, detail, false) == changed, "a chain is returned twice");
    QString longer = chain;
    AddNewNote(subject, status, longer, detail);
    require(longer.contains(subject) && longer.contains(detail), "a new note is in the chain");
    constexpr int bodyOfNote = 14;  // after "(21/03/2008 : "
    const bool isPlain = !subject.isEmpty() && !status.isEmpty() && !(status + subject).contains(u':') &&
                         longer.indexOf(subject) == bodyOfNote + status.size() + 1;
    require(!isPlain || GetNoteStatus(subject, longer) == status, "the status of a new note is found");
}

void takeLine(const QString& text)
{
    attempt([&] { toLong(text); });
    attempt([&] { toInteger(text); });
    attempt([&] { toBool(text); });
    attempt([&] { leadingNumber(text); });
    attempt([&] { FormatNetworkDate(text); });
    attempt([&] { require(std::isfinite(SafeVal(text, u"0"_s)), "a safe value is finite"); });
    if (const std::optional<double> number = numberIn(text)) {
        require(std::isfinite(*number), "a number is finite");
        if (std::abs(*number) > 1.797693134862315e308)
            return;  // 15 digits of it are above the largest number
        const QString written = numberText(*number);
        const std::optional<double> again = numberIn(written);
        require(again.has_value(), "a number is read as it is written");
        require(std::abs(*again - *number) <= 1e-14 * std::abs(*number), "a number keeps 15 digits");
        require(numberText(*again) == written, "a number is written as it was read");
    }
    if (const std::optional<QDateTime> date = dateIn(text)) {
        const QTime time = date->time();
        const QDateTime whole = columnDate(date->date(), QTime(time.hour(), time.minute(), time.second()));
        require(dateIn(toText(whole)) == whole, "a date is read as it is written");
    }
}

void readValues(ShopTarget&, const QByteArray& input)
{
    for (const QByteArray& line : input.split('\n'))
        takeLine(files::fromCodePage(line));
}

/// Returns true if the viewer shows a node by what it is, and its save escapes nothing that is in it.
bool isKeptByViewer(const xml::Node& node)
{
    static const QRegularExpression markup(u"[<\r]|]]>|&(#|\\w+;)"_s, QRegularExpression::UseUnicodePropertiesOption);
    if (node.nodeType() == xml::NodeType::Text || node.nodeType() == xml::NodeType::CDataSection) {
        const bool isCData = node.nodeType() == xml::NodeType::CDataSection;
        return isCData ? !node.text().contains(u'&') : !node.text().contains(markup);
    }
    if (node.nodeType() != xml::NodeType::Element)
        return false;
    for (const xml::Attribute& attribute : node.attributes())
        if (attribute.value.contains(markup) || attribute.value.contains(QRegularExpression(u"[\"\t\n]"_s)))
            return false;
    const QList<xml::Node> children = node.childNodes();
    const auto isElement = [](const xml::Node& child) { return child.nodeType() == xml::NodeType::Element; };
    return std::all_of(children.begin(), children.end(), isKeptByViewer) &&
           (std::all_of(children.begin(), children.end(), isElement) ||
            std::none_of(children.begin(), children.end(), isElement));
}

void viewMessage(ShopTarget&, const QByteArray& input)
{
    files::writeBytes(gsUnreadPath + message, input);
    const QString text = FormatXML(gsUnreadPath + message);
    require(files::readBytes(gsUnreadPath + message) == input, "viewing changes no file");
    ExactTextEdit edit;
    edit.setExactText(text);
    require(edit.exactText() == text, "the viewer holds the exact text");
    files::write(gsUnreadPath + message, withMarkupCharacters(withoutRequestWrapper(text)));
    const QString again = FormatXML(gsUnreadPath + message);
    xml::Document document;
    const bool isKept = document.loadXML(files::fromCodePage(input)) && isKeptByViewer(document.documentElement());
    const bool isWritten = files::fromCodePage(files::toCodePage(text)) == text && !text.startsWith(u"<request>"_s);
    require(!isKept || !isWritten || again == text, "a message is shown as it was saved");
    files::remove(gsUnreadPath + message);
}

void sendImages(ShopTarget&, const QByteArray& input)
{
    for (const QByteArray& line : input.split('\n')) {
        const QString name = files::fromCodePage(line);
        const QString id = imageId(name);
        require(id.isEmpty() || numberIn(id).has_value(), "an image's id is a number");
        QuoteKey::fromReference(name);
        QuoteKey::fromResponseName(name);
        attempt([&] { NormaliseQuoteRef(name); });  // a number can be too large
        SplitQuoteRef(name);
        require(!files::isPlainName(name) || !name.contains(u'/'), "a plain name has no folder");
        create(gsImagesPath, line, "jpeg");
    }
    for (const QString& number : {u"500"_s, u"*"_s, u".."_s, u"5?"_s, QString()}) {
        attempt([&] { writeImageDocuments(gsImagesPath, {number, u"0"_s}); });
        for (const QString& file : files::list(gsUnsentPath))
            require(file == bystander || file.startsWith(u"I_"_s + number + u"_0"_s, Qt::CaseInsensitive),
                    "an image is its quote's");
        emptyFolder(gsUnsentPath);
    }
    emptyFolder(gsImagesPath);
}

void print(const report::Report& report)
{
    report.heading();
    QBuffer pdf;
    pdf.open(QBuffer::WriteOnly);
    QPdfWriter device(&pdf);
    report::setPaper(device);
    const report::Pages pages(report, device);
    QPainter painter(&device);
    for (int page = 0; page < std::min(pages.count(), 3); ++page)
        pages.paint(painter, page);
}

void printTemplate(ShopTarget&, const QByteArray& input)
{
    const QString path = u"c:\\wirra32\\report\\710.html"_s;
    files::writeBytes(path, input);
    attempt([&] {
        report::Report report(path);
        print(report);
        report.setTable({{u"quote_ref"_s, u"amount"_s, u"day"_s},
                         {{u"500"_s, u"1,234.5"_s, u"2008-04-11"_s}, {u"{{#rows}}"_s, QVariant(), u"<b>"_s}}});
        print(report);
    });
    files::remove(path);
}

void readRules(ShopTarget&, const QByteArray& input)
{
    attempt([&] {
        const app::InsurerRules rules = app::parsedRules(QString::fromUtf8(input));
        for (const app::Rule& rule : rules.rules) {
            for (const app::Step& step : rule.steps) {
                const app::Step again = app::parsedStep(step.text);
                require(again.act == step.act && again.parameters == step.parameters, "a step is its text");
            }
        }
        for (int time = 0; time < 3; ++time)
            rules.ruleFor({u"500"_s, u"1"_s}, u"QR1"_s, time);
    });
}

void readSettings(ShopTarget& shop, const QByteArray& input)
{
    using settings::RegistryFile;
    const QString path = shop.root() + u"/registry.ini"_s;
    const QByteArray own = QFile::exists(path) ? files::readBytes(path) : QByteArray();
    const RegistryFile file = RegistryFile::fromBytes(input);
    const QByteArray written = file.toBytes();
    require(RegistryFile::isOne(written), "what is written is a settings file");
    require(RegistryFile::fromBytes(written).toBytes() == written, "settings are read as they are written");

    files::writeBytes(path, input);
    const bool isRead = attempt([] { settings::check(); });
    require(isRead == RegistryFile::isOne(input), "only a settings file is accepted");
    const bool isCreated = settings::createKey(settings::Hive::LocalMachine, u"SOFTWARE\\wirra32\\fuzz"_s);
    require(isCreated == isRead, "settings can be changed if they can be read");
    require(isRead || files::readBytes(path) == input, "what is no settings file is not overwritten");
    for (const settings::Entry& entry : settings::entries())
        require(settings::query(entry.hive, entry.key, entry.name).has_value(), "each listed value is found");
    own.isEmpty() ? files::remove(path) : files::writeBytes(path, own);
}

void showSublets(ShopTarget&, const QByteArray& input)
{
    QByteArray content = input;
    const QByteArray name = firstLine(content);
    if (!create(subletFolder(), name, content))
        return;
    for (const QuoteKey& key : {QuoteKey{u"500"_s}, QuoteKey{u"500"_s, u"1"_s}, QuoteKey{}, QuoteKey{u"*"_s}}) {
        const QStringList numbers = subletDocumentNumbers(key);
        const QList<SubletDocument> documents = subletDocuments(key, numbers);
        require(documents.size() <= numbers.size(), "a document belongs to one line");
        for (const SubletDocument& document : documents)
            showPdf(subletFolder() + document.file);
    }
    showPdf(subletFolder() + QFile::decodeName(name));
    emptyFolder(subletFolder());
}

}  // namespace

std::unique_ptr<Target> makeTarget(const std::string& name)
{
    static constexpr ShopTarget::Reader readers[] = {readXml,    loadMessage,  fillList,   readNotes,
                                                     readValues, viewMessage,  sendImages, printTemplate,
                                                     readRules,  readSettings, showSublets};
    for (size_t i = 0; i < std::size(targetNames); ++i)
        if (name == targetNames[i])
            return std::make_unique<ShopTarget>(readers[i]);
    throw std::invalid_argument("no target " + name);
}

}  // namespace kest::test
