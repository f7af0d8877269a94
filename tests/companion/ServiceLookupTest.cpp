// The NIF control looking numbers up from a local stand-in for the VAT information service.

#include "LookupTestSupport.h"

#include "companion/VatServiceClient.h"
#include "nif/cNIF.h"
#include "tips/clsBalloonTip.h"

#include <QJsonDocument>
#include <QJsonObject>
#include <QLineEdit>
#include <QPointer>
#include <QTest>

using namespace zelctl;
using namespace zelctl::companion;
using namespace zelctl::test;

namespace {

using Reply = FakeHttpServer::Reply;
using Manner = FakeHttpServer::Manner;

constexpr quint32 WhiteMark = 0xFFFFFF;
constexpr quint32 NamedMark = 0x00FF00;

// A NIF control on a form, as a host places it, with its lookup events recorded.
struct NifForm
{
    NifForm()
    {
        control->InitNew();
        QObject::connect(control, &cNIF::UpdatedInformation, [this](const QString &id) { events << "Updated:" + id; });
        QObject::connect(control, &cNIF::NameUpdated, [this](const QString &name) { events << "Name:" + name; });
        QObject::connect(control, &cNIF::DataFinished, [this] { events << "DataFinished"; });
    }
    // Types a number's digits; the last one makes it valid and starts the lookup.
    void typeAndWait(const QString &digits)
    {
        QTest::keyClicks(control->findChild<QLineEdit *>("nif"), digits.chopped(1));
        events.clear();
        QTest::keyClick(control->findChild<QLineEdit *>("nif"), digits.back().toLatin1());
        EXPECT_TRUE(QTest::qWaitFor([this] { return events.contains("DataFinished"); }, 10000));
    }
    quint32 statusMark() const { return control->findChild<QWidget *>("Shape1")->property("BorderColor").toUInt(); }

    QWidget form;
    cNIF *control = new cNIF(&form);
    QStringList events;
};

// Runs a fetch whose listener deletes the fetcher from `signal`; whether Finished came first.
template <typename Signal> bool finishesWhenDeletedFrom(const LookupSettings &settings, Signal signal)
{
    auto *grabber = new ChainedNIFGrabber(settings);
    const QPointer<ChainedNIFGrabber> alive(grabber);
    bool finished = false;
    QObject::connect(grabber, &NIFGrabber::Finished, [&finished] { finished = true; });
    QObject::connect(grabber, signal, [grabber] { delete grabber; });
    grabber->Fetch(UnknownHolder);
    EXPECT_TRUE(QTest::qWaitFor([&] { return alive.isNull(); }, 5000));
    return finished;
}

using ServiceLookup = LookupFixture;

} // namespace

TEST_F(ServiceLookup, showsTheHolderAndSaysWhyEveryFailedLookupFoundNone)
{
    saveSetting("nifsources", "service");
    service.answerWith(FakeHttpServer::holder("MARIA DO CÉU ANTUNES", R"(RUA DO OURO 12\n1100-060 LISBOA)"));
    NifForm nif;
    nif.typeAndWait("123456789");

    ASSERT_EQ(service.requests().size(), 1);
    const FakeHttpServer::Request &request = service.requests().first();
    EXPECT_EQ(request.method + ' ' + request.path, "POST /rest-api/check-vat-number");
    EXPECT_EQ(QJsonDocument::fromJson(request.body).object(),
        QJsonObject({ { "countryCode", "PT" }, { "vatNumber", "123456789" } }));
    EXPECT_TRUE(nif.events.contains("Name:MARIA DO CÉU ANTUNES"));
    EXPECT_EQ(nif.events.last(), "DataFinished");
    EXPECT_EQ(QStringList({ nif.control->Information("status"), nif.control->Information("updated"),
                  nif.control->Information("SOURCE"), nif.control->Information("morada") }),
        QStringList({ "Válido", "2025-03-01", "Serviço de IVA da Comissão Europeia", "RUA DO OURO 12" }))
        << "updated is the day of the service's request";
    const QString tip = "MARIA DO CÉU ANTUNES\r\n1100-060\r\nLISBOA\r\nNIF: 123456789\r\nPaís: Portugal";
    EXPECT_EQ(nif.control->findChild<clsBalloonTip *>("tip")->TipText(), tip);

    const QByteArray loop = service.baseAddress().toEncoded() + "/check-vat-number";
    const struct
    {
        const char *answer;
        Reply reply;
        QString status;
        const char *setting = nullptr, *value = nullptr; // changed for this case alone
    } cases[] = {
        { "an unregistered number", { 200, R"({"valid":false,"name":"---","address":"---"})" },
            "Não registado no serviço de IVA" },
        { "INVALID_INPUT", FakeHttpServer::userError("INVALID_INPUT"), "(INVALID_INPUT)" },
        { "INVALID_INPUT as a rejected request",
            { 400, R"({"actionSucceed":false,"errorWrappers":[{"error":"INVALID_INPUT"}]})" }, "(INVALID_INPUT)" },
        { "MS_UNAVAILABLE", FakeHttpServer::userError("MS_UNAVAILABLE"), "(MS_UNAVAILABLE)" },
        { "an answer slower than the timeout", { 200, QByteArray(200, ' ') + "{}", Manner::Trickle }, TimedOut },
        { "a connection that never answers", { 200, {}, Manner::Silent }, TimedOut },
        { "a server error", { 500, "<html>Internal Server Error</html>" }, "O serviço respondeu com o erro HTTP 500" },
        { "a redirect loop", { 302, {}, Manner::Whole, loop }, "redireccionou" },
        { "a huge body", { 200, "{\"valid\":true,\"name\":\"" + QByteArray(200 * 1024, 'A') + "\"}" },
            "Resposta do serviço demasiado grande" },
        { "malformed JSON", { 200, R"({"valid":true,"name":"ANA)" }, "Resposta do serviço ilegível" },
        { "remote lookups off", {}, "consultas remotas desligadas", "allowremotenif", "0" },
        { "an address not on the web", {}, "Endereço do serviço inválido", "nifserviceurl", "file:///etc/passwd" },
        { "a plain address elsewhere", {}, "Endereço do serviço inválido", "nifserviceurl", "http://192.0.2.1/x" },
    };
    // Every failure ends the lookup of a new control with the fetcher saying why.
    for (const auto &c : cases) {
        SCOPED_TRACE(c.answer);
        service.answerWith(c.reply);
        if (c.setting)
            saveSetting(c.setting, c.value);
        const qsizetype asked = service.requests().size();
        NifForm other;
        other.typeAndWait("123456789");
        EXPECT_TRUE(!c.setting || service.requests().size() == asked) << "the number stays on the machine";
        SetUp();
        EXPECT_EQ(other.events, QStringList { "DataFinished" }) << "no information, no name";
        const QString why = other.control->findChild<NIFGrabber *>()->GetField("STATUS");
        EXPECT_TRUE(why.contains(c.status)) << why.toStdString();
        EXPECT_TRUE(other.control->Nome().isEmpty());
        EXPECT_EQ(other.statusMark(), WhiteMark);
    }
    EXPECT_EQ(nif.statusMark(), NamedMark) << "the first control keeps its holder";
    EXPECT_EQ(service.abandoned(), 2) << "the slow and the silent connection were closed by the fetcher";
}

TEST_F(ServiceLookup, theFormMayGoWhileTheServiceIsAskedOrFromTheLookupsEvents)
{
    saveSetting("nifsources", "service");
    service.answerWith({ 200, {}, Manner::Silent });
    {
        NifForm nif;
        QTest::keyClicks(nif.control->findChild<QLineEdit *>("nif"), "123456789");
        ASSERT_TRUE(QTest::qWaitFor([&] { return service.requests().size() == 1; }));
    }
    EXPECT_TRUE(QTest::qWaitFor([&] { return service.abandoned() == 1; })) << "the request went with the control";

    service.answerWith(FakeHttpServer::holder("ANA", "1000-001 LISBOA"));
    auto *form = new NifForm;
    QObject::connect(form->control, &cNIF::DataFinished, [form] { delete form; });
    QPointer<cNIF> control(form->control);
    QTest::keyClicks(control->findChild<QLineEdit *>("nif"), "123456789");
    EXPECT_TRUE(QTest::qWaitFor([&] { return control.isNull(); }));

    EXPECT_FALSE(finishesWhenDeletedFrom(settings(), &NIFGrabber::Starting));
    EXPECT_FALSE(finishesWhenDeletedFrom(settings(), &NIFGrabber::ReceivedInformation));
    EXPECT_TRUE(finishesWhenDeletedFrom(settings(), &NIFGrabber::Finished));
}
