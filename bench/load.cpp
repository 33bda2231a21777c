// Measures the load of a message against the plain statements that it needs, on the same database. Also measures the
// note chain.
#include "BenchShop.h"
#include "InTurn.h"
#include "PlainStatements.h"
#include "base/SharedVariables.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/files/files.h"
#include "quotedata/NoteChain.h"

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

QString message(const QString& type, const QString& root, const QString& elements)
{
    return u"<p754:%1 xmlns:p754=\"%2\"><messageType>%3</messageType>%4</p754:%1>"_s.arg(root, GetNamespaceURI(), type,
                                                                                         elements);
}

QString request(int number)
{
    return message(u"QREQ"_s, u"getQuoteRequestResponse"_s,
                   uR"(<p754:quoteRequestNumber>QR%1</p754:quoteRequestNumber>
<p754:quoteRequestVersionNumber>1</p754:quoteRequestVersionNumber><p754:claimNumber>7700001</p754:claimNumber>
<p754:claimDescription>Reversed into a bollard</p754:claimDescription><p754:claimManager>Robin Sayle</p754:claimManager>
<p754:corporateCustomer/><p754:claimCustomer><p754:title>Mr</p754:title><p754:firstName>Alex</p754:firstName>
<p754:surname>Tarrant %1</p754:surname></p754:claimCustomer><p754:vehicleRegistration>C%1</p754:vehicleRegistration>
<p754:vehicleDescription>Corella</p754:vehicleDescription><p754:vehicleLocation>At the shop</p754:vehicleLocation>
<p754:bayNumber>3</p754:bayNumber><p754:offsiteQuoting>false</p754:offsiteQuoting>
<p754:extraQuoteInformationRequested>true</p754:extraQuoteInformationRequested>
<p754:quoteDueTime>2008-03-26T06:30:00.000Z</p754:quoteDueTime><p754:instructions>None</p754:instructions>
<p754:extraVehicleInformation><p754:make>CORELLA</p754:make><p754:yearOfManufacture>2004</p754:yearOfManufacture>
<p754:monthOfManufacture>7</p754:monthOfManufacture><p754:bodyShape>Sedan</p754:bodyShape>
<p754:transmissionType>A</p754:transmissionType><p754:numberOfCylinders>4</p754:numberOfCylinders>
<p754:vinChassis>6T1</p754:vinChassis><p754:color>BLUE</p754:color><p754:paintType>META</p754:paintType>
<p754:odometer>84200</p754:odometer><p754:fuelLevel>50</p754:fuelLevel>
<p754:damageDescription>Bumper</p754:damageDescription><p754:oldDamageDescription>None</p754:oldDamageDescription>
</p754:extraVehicleInformation>)"_s.arg(number));
}

QStringList statementsOfRequest(int number)
{
    QStringList statements{
        u"SELECT * FROM CINFO"_s,
        u"SELECT * FROM INSURER WHERE KEST=1 or name='KEST Universal Insurer'"_s,
        u"SELECT * FROM QUOTE1 WHERE QTNNO='B%1'"_s,
        u"SELECT * FROM QUOTE3 WHERE QTNNO='B%1'"_s,
        u"SELECT * FROM CAR WHERE REGO='B%1'"_s,
        u"SELECT * FROM MODEL WHERE MODEL_ID1='Z000'"_s,
        u"SELECT * FROM KESTColours"_s,
        u"SELECT * FROM QUOTE1 WHERE SUBQUOTE=0 AND KESTQRNO='B%1' AND KESTQRVER='1'"_s,
        u"SELECT * FROM CUSTOMER WHERE NAME='B%1' AND FIRSTNAME LIKE 'Alex%'"_s,
        u"INSERT INTO CUSTOMER (NAME, FIRSTNAME, SALUTATION, Account) VALUES ('B%1', 'Alex', 'Mr', 190)"_s,
        u"INSERT INTO CAR (REGO, KEST, CUST_ID, MODEL_ID, Year, COLOUR) VALUES ('B%1', 1, 1, 'Z000', '07/2004', 'Blue')"_s,
        u"INSERT INTO QUOTE1 (QTNNO, Subquote, KESTQRNo, KESTQRVer, Claim, REGO, Job_stage, TOTAL) "
        "VALUES ('B%1', 0, 'B%1', '1', '7700001', 'B%1', 1, 0)"_s,
        u"INSERT INTO QUOTE3 (QTNNO, Subquote, remarks) VALUES ('B%1', 0, '(22/11/2026 : Active Quote Request)')"_s,
        u"SELECT * FROM QUOTE1 WHERE QTNNO='B%1'"_s,
        u"SELECT * FROM QUOTE1 WHERE QTNNO='C%1'"_s,
        u"UPDATE CINFO SET second_mu=%1"_s,
    };
    for (QString& statement : statements)
        statement.replace(u"%1"_s, QString::number(number));
    return statements;
}

/// Runs loads and statements in turn and reports the ratio of their times.
template <class Load, class Statements>
void compare(benchmark::State& state, Load load, Statements statements)
{
    InTurn times(state);
    int number = 0;
    for (auto _ : state) {
        ++number;
        times.floor([&] { statements(number); });
        bool taken = false;
        times.operation([&] { taken = load(number); });
        if (!taken)
            state.SkipWithError("the message was not loaded");
    }
}

constexpr int requests = 500;

void loadRequest(benchmark::State& state)
{
    const BenchShop shop;
    for (int number = 1; number <= requests; ++number)
        files::write(gsUnreadPath + u"%1.xml"_s.arg(number), request(number));
    compare(
        state,
        [](int number) {
            QString text = request(number);
            return LoadXML(text, u"%1.xml"_s.arg(number));
        },
        [&](int number) {
            for (const QString& statement : statementsOfRequest(number))
                runPlain(statement);
        });
}
BENCHMARK(loadRequest)->UseManualTime()->Iterations(requests)->Unit(benchmark::kMillisecond);

void loadStatusMessage(benchmark::State& state)
{
    const BenchShop shop;
    for (int number = 0; number < 1000; ++number) {
        runPlain(
            u"INSERT INTO QUOTE1 (QTNNO, Subquote, KESTQRNo, Job_stage) VALUES ('%1', 0, 'QR%1', 1)"_s.arg(number));
        runPlain(u"INSERT INTO QUOTE3 (QTNNO, Subquote, remarks) VALUES ('%1', 0, '')"_s.arg(number));
    }
    compare(
        state,
        [](int number) {
            QString text = message(u"QRCN"_s, u"getQRCancellationResponse"_s,
                                   u"<p754:quoteRequestNumber>QR%1</p754:quoteRequestNumber>"
                                   "<p754:qrCancellationReason>sold</p754:qrCancellationReason>"_s.arg(number));
            return LoadXML(text, u"m.xml"_s);
        },
        [&](int number) {
            const QString other = QString::number(500 + number % 500);
            runPlain(u"SELECT * FROM QUOTE1 WHERE KESTQRNO='QR%1' ORDER BY rec_id DESC"_s.arg(other));
            runPlain(u"SELECT * FROM QUOTE3 WHERE QTNNO='%1' AND SUBQUOTE='0'"_s.arg(other));
            runPlain(
                u"UPDATE QUOTE3 SET remarks='(22/11/2026 : QR Cancelled - sold) (22/11/2026 : Cancelled Quote "
                "Request)' WHERE QTNNO='%1' AND Subquote=0"_s.arg(other));
            runPlain(u"UPDATE QUOTE1 SET Job_stage=9, ReadOnly=1 WHERE rec_id=%1"_s.arg(other));
        });
}
BENCHMARK(loadStatusMessage)->UseManualTime()->Iterations(490)->Unit(benchmark::kMillisecond);

void changeNoteInPlace(benchmark::State& state)
{
    QString chain;
    for (int64_t i = 0; i < state.range(0); ++i)
        chain += u"(21/03/2008 : QR Cancelled - reason %1) "_s.arg(i);
    chain += u"(19/03/2008 : Active Quote Request)"_s;
    for (auto _ : state) {
        QString remarks = chain;
        benchmark::DoNotOptimize(AddNote(u"Quote Request"_s, u"Won"_s, remarks, {}, false));
    }
    state.SetComplexityN(state.range(0));
}
BENCHMARK(changeNoteInPlace)->RangeMultiplier(10)->Range(10, 100000)->Complexity();

}  // namespace
}  // namespace kest
