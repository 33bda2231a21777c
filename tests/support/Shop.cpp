#include "support/Shop.h"

#include "base/Journal.h"
#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "recovery/Recovery.h"

namespace kest::test {

static void forgetSharedVariables()
{
    for (QString* text :
         {&gsCurFolder, &gsListFolder, &gsListFilter, &gsMatchedQTNNO, &gsDeletedQTNNO, &gsDeletedSubquote})
        text->clear();
    gsQTNNO = gsSubQuote = u"0"_s;
    gdicQuoteRequests.clear();
    gbFilterAsked = gbTabletLocal = false;
}

static void addQuote(const QString& number, int subquote)
{
    car("ABC123");
    addRow("QUOTE1", {{"QTNNO", number}, {"Subquote", subquote}},
           "REGO=ABC123 INSURER_ID=1 Claim=7700001 QUOTER=Pat Ferrier excess=0 contri=0 Job_stage=1");
}

QuoteRow quote(const Text& number, int subquote)
{
    if (!quoteExists(number, subquote)) {
        addQuote(number, subquote);
        addRow("QUOTE3", {{"QTNNO", QString(number)}, {"Subquote", subquote}});
    }
    return QuoteRow(number, subquote, "rec_id");
}

QuoteRow anotherQuote(const Text& number, int subquote)
{
    addQuote(number, subquote);
    return QuoteRow(number, subquote, "rec_id DESC");
}

bool quoteExists(const Text& number, int subquote)
{
    return QuoteRow(number, subquote, "rec_id").exists();
}

Row car(const Text& rego)
{
    const Row row("CAR", sql("REGO='{}'", QString(rego)));
    if (!row.exists())
        addRow("CAR", {{"REGO", QString(rego)}, {"CUST_ID", customer("Holloway").id()}},
               "KEST=0 MODEL_ID=C120 BODY_ID=4 BODY_ID2=4S COLOUR=Silver Year=03/2005 PAINT_GP=M1");
    return row;
}

Row customer(const Text& name)
{
    const Row row("CUSTOMER", sql("NAME='{}'", QString(name)));
    if (!row.exists())
        addRow("CUSTOMER", {{"NAME", QString(name)}},
               "FIRSTNAME=Kim SALUTATION=Ms street=14 Banksia Street suburb=Wattlebridge 3999");
    return row;
}

Row vendor(const Text& name)
{
    const Row row("VENDOR", sql("NAME='{}'", QString(name)));
    if (!row.exists())
        addRow("VENDOR", {{"NAME", QString(name)}}, "Account=293");
    return row;
}

bool load(const Text& message, const Text& fileName)
{
    files::write(gsUnreadPath + fileName, message);
    gsListFolder = gsUnreadPath;  // as after a fill; a load prints from this folder
    QString text = message;
    return LoadXML(text, fileName);
}

bool loadAsTheWindow(const QString& fileName)
{
    gsListFolder = gsUnreadPath;
    bool taken = false;
    attempt([&] {
        QString text = files::read(gsUnreadPath + fileName);
        const QString hash = journal::hashOf(text);
        taken = recovery::settleLoadOf(fileName, hash) == recovery::EarlierLoad::Complete;
        if (taken)
            return;
        journal::Operation operation(journal::Kind::Load, fileName, hash);
        taken = LoadXML(text, fileName);
        if (taken)
            MoveMessage(fileName, u"read"_s);
        operation.end(!taken              ? journal::State::Failed
                      : isMoved(fileName) ? journal::State::Done
                                          : journal::State::Unfinished);
    });
    return taken;
}

QStringList listed(MessageFolder folder)
{
    QStringList names;
    for (const ListedMessage& message : BuildMessageList(folder, {LoadSubmissionResponse, {}, {}}))
        names << message.file;
    return names;
}

Shop::Shop() : desktop(std::in_place), root_(profile_.root())
{
    forgetSharedVariables();
    for (const char* folder : {"AUnread", "ARead", "AUnsent", "ASent", "PDF"})
        files::makeFolder(u"c:\\wirdoc\\"_s + QString::fromLatin1(folder));
    files::makeFolder(u"c:\\wirimg"_s);
    files::makeFolder(root_ + u"/component"_s);
    makeShopDatabase();
    host_.emplace();
}

Shop::~Shop()
{
    db::setStatementFault({});
    desktop.reset();
    host_.reset();
    forgetSharedVariables();
}

void Shop::arrive(const Text& name, const Text& content)
{
    files::write(gsUnreadPath + name, content);
}

void Shop::putTemplate(int report)
{
    const QString name = QString::number(report) + u".html"_s;
    files::makeFolder(u"c:\\wirra32\\report"_s);
    files::writeBytes(u"c:\\wirra32\\report\\"_s + name, files::readBytes(checkoutFile(u"templates/"_s + name)));
}

QUrl Shop::bring(const QString& name, const QString& content)
{
    const QString stick = root() + u"/stick/"_s;
    files::makeFolder(stick);
    files::write(stick + name, content);
    return QUrl::fromLocalFile(stick + name);
}

std::string Shop::shown()
{
    const QJsonArray& boxes = desktop->record().boxes;
    boxesSeen_ = std::min(boxesSeen_, boxes.size());  // another script starts a new record
    QStringList texts;
    for (; boxesSeen_ < boxes.size(); ++boxesSeen_) {
        const QJsonValue box = boxes[boxesSeen_];
        const QString title = box[u"title"_s].toString();
        texts << u"[%1] "_s.arg(box[u"icon"_s].toString()) + (title.isEmpty() ? title : title + u": "_s) +
                     box[u"text"_s].toString();
    }
    return texts.join(u'\n').toStdString();
}

QStringList Shop::filesIn(const QString& folder)
{
    return files::list(folder);
}

}  // namespace kest::test
