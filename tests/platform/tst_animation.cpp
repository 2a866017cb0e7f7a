// The busy animation: the AVI reader on every encoding it plays, damaged
// files refused without harm, the shipped clip, and the control's loop.

#include "avi_writer.h"
#include "filemove_scene.h"
#include "platform/animation.h"

#include <QRandomGenerator>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QtEndian>

using namespace quotas;
using clipgen::Encoding;

Q_DECLARE_METATYPE(clipgen::Encoding)
Q_DECLARE_METATYPE(clipgen::Clip)

namespace {

QByteArray bytesOf(const clipgen::Clip& clip, Encoding encoding)
{
    const std::vector<std::uint8_t> b = clipgen::writeAvi(clip, encoding);
    return QByteArray(reinterpret_cast<const char*>(b.data()), qsizetype(b.size()));
}

// Odd sizes (rows padded to four bytes), long runs, single pixels and
// literal stretches of odd length, frames that change only a little.
clipgen::Clip patterned(int width, int height, int frames)
{
    clipgen::Clip clip{width, height, 40000, {0x102030, 0xff0000, 0x00ff00, 0x0000ff, 0xffffff}, {}};
    std::vector<std::uint8_t> pixels;
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            pixels.push_back(std::uint8_t(x < width / 2 ? y % 2 : (x * 7 + y * 3) % 5));
    for (int f = 0; f < frames; ++f) {
        pixels[std::size_t((f * 13) % (width * height))] = std::uint8_t(4 - f % 5);
        clip.frames.push_back(pixels);
    }
    return clip;
}

}  // namespace

class AnimationTest : public QObject {
    Q_OBJECT

private slots:
    void decodesEveryEncodingAlike_data()
    {
        QTest::addColumn<clipgen::Clip>("clip");
        QTest::addColumn<Encoding>("encoding");
        const std::pair<const char*, clipgen::Clip> clips[] = {
            {"scene", clipgen::fileMoveScene()}, {"7x5", patterned(7, 5, 6)}, {"300x3", patterned(300, 3, 4)}, {"1x1", patterned(1, 1, 3)}};
        const char* const encodings[] = {"raw8", "raw24", "rle8", "rle8-delta"};  // in the order of Encoding
        for (const auto& [name, clip] : clips)
            for (int e = 0; e < 4; ++e)
                QTest::addRow("%s %s", name, encodings[e]) << clip << Encoding(e);
    }

    void decodesEveryEncodingAlike()
    {
        QFETCH(clipgen::Clip, clip);
        QFETCH(Encoding, encoding);
        AviClip decoded;
        QVERIFY2(decoded.loadData(bytesOf(clip, encoding)), qPrintable(decoded.errorString()));
        QCOMPARE(decoded.frameCount(), int(clip.frames.size()));
        QCOMPARE(decoded.interval(), clip.microsecondsPerFrame / 1000);
        for (int f = 0; f < decoded.frameCount(); ++f) {
            QImage want(clip.width, clip.height, QImage::Format_RGB32);
            for (int i = 0; i < clip.width * clip.height; ++i)
                want.setPixel(i % clip.width, i / clip.width, clip.palette[clip.frames[size_t(f)][size_t(i)]]);
            QCOMPARE(decoded.frame(f), want);
        }
    }

    void shippedClipIsTheGeneratedOne()
    {
        QFile shipped(QStringLiteral(QUOTAS_SOURCE_DIR "/data/filemove.avi"));
        QVERIFY(shipped.open(QIODevice::ReadOnly));
        QCOMPARE(shipped.readAll(), bytesOf(clipgen::fileMoveScene(), Encoding::Rle8Delta));
    }

    void refusesDamagedFiles_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        const QByteArray good = bytesOf(patterned(7, 5, 3), Encoding::Rle8);
        const qsizetype strf = good.indexOf("strf") + 8;
        auto patched = [&](qsizetype at, quint32 value) { QByteArray b = good; qToLittleEndian(value, b.data() + at); return b; };
        QTest::newRow("empty") << QByteArray();
        QTest::newRow("not a clip") << QByteArray("GIF89a this is something else entirely");
        QTest::newRow("truncated") << good.left(good.size() / 2);
        QTest::newRow("chunk longer than file") << patched(good.indexOf("movi") - 4, 0x7ffffff0);
        QTest::newRow("huge width") << patched(strf + 4, 100000);
        QTest::newRow("negative width") << patched(strf + 4, quint32(-7));
        QTest::newRow("other compression") << patched(strf + 16, 2);
        QTest::newRow("no frames") << good.left(good.indexOf("LIST", good.indexOf("strl")));
    }

    void refusesDamagedFiles()
    {
        QFETCH(QByteArray, bytes);
        AviClip clip;
        QVERIFY(!clip.loadData(bytes) && clip.isEmpty() && !clip.errorString().isEmpty());
    }

    void survivesCorruptedFrames()
    {
        // Any byte of the frame data may be anything: the reader must neither
        // crash nor write outside its frame.
        const QByteArray good = bytesOf(clipgen::fileMoveScene(), Encoding::Rle8Delta);
        const qsizetype movi = good.indexOf("movi");
        QRandomGenerator random(7);
        for (int round = 0; round < 300; ++round) {
            QByteArray b = good;
            for (int n = 0; n < 20; ++n)
                b[movi + 4 + qsizetype(random.bounded(int(b.size() - movi - 4)))] = char(random.bounded(256));
            AviClip clip;
            if (clip.loadData(b))
                QCOMPARE(clip.frame(0).size(), QSize(80, 36));
        }
    }

    // Without a clip the control stays still: the maintenance test runs without one.
    void playsInALoopAndStopsWhereItIs()
    {
        QTemporaryDir dir;
        QFile file(dir.filePath(QStringLiteral("loop.avi")));
        Animation animation;
        clipgen::Clip clip = patterned(4, 4, 3);
        clip.microsecondsPerFrame = 10000;
        QVERIFY(file.open(QIODevice::WriteOnly) && file.write(bytesOf(clip, Encoding::Rle8Delta)) > 0);
        file.close();
        QVERIFY(animation.open(file.fileName()));
        QSignalSpy frames(&animation, &Animation::frameChanged);
        animation.play();
        QTRY_VERIFY_WITH_TIMEOUT(frames.size() >= 5, 5000);
        // Round and round: after the last frame comes the first again.
        for (int i = 0; i < frames.size(); ++i)
            QCOMPARE(frames[i][0].toInt(), i % 3);
        animation.stop();
        const int stoppedAt = animation.currentFrame();
        QTest::qWait(60);
        QCOMPARE(animation.currentFrame(), stoppedAt);
        QVERIFY(!animation.isPlaying());
    }
};

QTEST_MAIN(AnimationTest)
#include "tst_animation.moc"
