#include "GifFiles.h"

#include "gif/GifRemoteLoader.h"
#include "gif/ucAniGIF.h"
#include "platform/Settings.h"
#include "platform/Twips.h"
#include "support/FakeHttpServer.h"
#include "support/TestSupport.h"

#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;
using Reply = test::FakeHttpServer::Reply;
using Manner = test::FakeHttpServer::Manner;

namespace {

const QByteArray twoFrames
    = test::gifOf(7, 5, { 0xFF0000, 0x00FF00 }, { { 0, 0, 7, 5, QByteArray(35, '\0') }, { 1, 1, 2, 2, "\1\1\1\1" } });

// A control showing a one-frame GIF and a web server of the ways a transfer can go.
class RemoteLoad : public ::testing::Test
{
protected:
    void SetUp() override
    {
        QObject::connect(&gif, &ucAniGIF::RemoteLoadComplete, [this](qint32 width, qint32 height, bool &Cancel) {
            announced.append({ width, height });
            Cancel = cancel;
        });
    }

    QString url(const char *path) const { return server.baseAddress().toString() + path; }

    // The frames shown once the load of `source`, answered with `reply`, has ended; -1 when it failed.
    int load(const QString &source, const Reply &reply = { 200, twoFrames })
    {
        server.answerWith(reply);
        EXPECT_TRUE(gif.LoadAnimatedGIF_Array(test::gifOf(2, 2, { 0, 0xFFFFFF }, { { 0, 0, 2, 2, "\1\1\1\1" } })));
        const qsizetype failures = failed.count();
        const qsizetype completions = announced.size();
        gif.LoadAnimatedGIF_Remote(source);
        EXPECT_EQ(gif.FrameCount(), 1) << "the call returns before the data arrives";
        if (!QTest::qWaitFor([&] { return failed.count() > failures || announced.size() > completions; }, 10000))
            return 0;
        return failed.count() > failures ? -1 : gif.FrameCount();
    }

    test::FakeHttpServer server;
    ucAniGIF gif;
    QSignalSpy failed { &gif, &ucAniGIF::RemoteLoadFailure };
    QList<std::pair<int, int>> announced;
    bool cancel = false;
};

} // namespace

TEST_F(RemoteLoad, showsWhatArrivesWholeAndKeepsTheShownGifOnEveryFailure)
{
    QTemporaryDir dir;
    const QString file = test::writeFile(dir.filePath("local.gif"), twoFrames);
    const QString fifo = test::makeFifo(dir.filePath("fifo.gif"));
    // A FIFO without a writer would block the reading thread for ever; a huge length is refused
    // once known, though the same address has a kept copy; redirects in a circle end.
    const struct
    {
        QString source;
        Reply reply;
        int frames;
    } cases[] = { { url("/anim.gif"), { 200, twoFrames }, 2 }, { file, {}, 2 },
        { QUrl::fromLocalFile(file).toString(), {}, 2 }, { url("/short.gif"), { 200, "GIF89a\7\0\5\0" }, -1 },
        { url("/text"), { 200, "no GIF here at all" }, -1 }, { url("/missing.gif"), { 404 }, -1 },
        { url("/anim.gif"), { 200, twoFrames, Manner::Whole, {}, 2147483648 }, -1 },
        { url("/loop.gif"), { 302, {}, Manner::Whole, url("/loop.gif").toUtf8() }, -1 },
        { dir.filePath("absent.gif"), {}, -1 }, { fifo, {}, -1 }, { QUrl::fromLocalFile(fifo).toString(), {}, -1 } };
    for (const auto &c : cases) {
        const qsizetype requests = server.requests().size();
        EXPECT_EQ(load(c.source, c.reply), c.frames) << c.source.toStdString();
        EXPECT_LE(server.requests().size() - requests, GifRemoteLoader::MaxRedirects + 1);
    }
    ASSERT_EQ(announced.size(), 3);
    EXPECT_EQ(announced[0], std::make_pair(platform::twipsFromPixels(7), platform::twipsFromPixels(5)));

    cancel = true;
    EXPECT_EQ(load(url("/anim.gif")), 1) << "a cancelled load keeps the GIF shown";
    cancel = false;
    const qsizetype failures = failed.count();
    gif.LoadAnimatedGIF_Remote("ftp://127.0.0.1/x.gif");
    EXPECT_EQ(failed.count(), failures + 1) << "an address that cannot be read fails at once";
    gif.LoadAnimatedGIF_Remote("");
    QTest::qWait(20);
    EXPECT_EQ(failed.count(), failures + 1) << "an empty path does nothing";

    // The transfer timeout ends a silent server; a kept copy stands in, but only for its own address.
    platform::SaveSetting("ZEL", "Config", "giftimeout", "1");
    EXPECT_EQ(load(url("/anim.gif"), { 200, {}, Manner::Silent }), 2);
    EXPECT_EQ(load(url("/other.gif"), { 200, {}, Manner::Silent }), -1);
    platform::DeleteSetting("ZEL", "Config", "giftimeout");
}

TEST_F(RemoteLoad, aBodyWithoutALengthEndsPastTheLimit)
{
    // The control's own limit is 256 MiB; a loader with a smaller one shows the same rule.
    GifRemoteLoader loader;
    loader.setMaxBytes(1 << 20);
    QSignalSpy loaderFailed(&loader, &GifRemoteLoader::failed);
    QSignalSpy loaderFinished(&loader, &GifRemoteLoader::finished);
    server.answerWith({ 200, twoFrames + QByteArray(2 << 20, 'x'), Manner::Whole, {}, -2 });
    ASSERT_TRUE(loader.start(url("/endless.gif")));
    ASSERT_TRUE(QTest::qWaitFor([&] { return loaderFailed.count() + loaderFinished.count() == 1; }, 10000));
    EXPECT_EQ(loaderFailed.count(), 1);
}
