// The busy animation: the AVI reader on every encoding it plays, damaged
// files refused without harm, the shipped clip, and the control's loop.

#include "avi_writer.h"
#include "filemove_scene.h"
#include "platform/animation.h"

#include <QRandomGenerator>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>

using namespace quotas;

Q_DECLARE_METATYPE(clipgen::Encoding)
Q_DECLARE_METATYPE(clipgen::Clip)

namespace {

QByteArray bytesOf(const clipgen::Clip& clip, clipgen::Encoding encoding)
{
    const std::vector<std::uint8_t> b = clipgen::writeAvi(clip, encoding);
    return QByteArray(reinterpret_cast<const char*>(b.data()), qsizetype(b.size()));
}

// Odd sizes (rows padded to four bytes), long runs, single pixels and
// literal stretches of odd length, frames that change only a little.
clipgen::Clip patterned(int width, int height, int frames)
{
    clipgen::Clip clip;
    clip.width = width;
    clip.height = height;
    clip.microsecondsPerFrame = 40000;
    clip.palette = {0x102030, 0xff0000, 0x00ff00, 0x0000ff, 0xffffff};
    std::vector<std::uint8_t> pixels(std::size_t(width * height));
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            pixels[std::size_t(y * width + x)] = std::uint8_t(x < width / 2 ? (y % 2) : ((x * 7 + y * 3) % 5));
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
        QTest::addColumn<clipgen::Encoding>("encoding");
        const struct {
            const char* name;
            clipgen::Clip clip;
        } clips[] = {{"scene", clipgen::fileMoveScene()},
                     {"7x5", patterned(7, 5, 6)},
                     {"300x3", patterned(300, 3, 4)},
                     {"1x1", patterned(1, 1, 3)}};
        const struct {
            const char* name;
            clipgen::Encoding encoding;
        } encodings[] = {{"raw8", clipgen::Encoding::Raw8},
                         {"raw24", clipgen::Encoding::Raw24},
                         {"rle8", clipgen::Encoding::Rle8},
                         {"rle8-delta", clipgen::Encoding::Rle8Delta}};
        for (const auto& c : clips)
            for (const auto& e : encodings)
                QTest::addRow("%s %s", c.name, e.name) << c.clip << e.encoding;
    }

    void decodesEveryEncodingAlike()
    {
        QFETCH(clipgen::Clip, clip);
        QFETCH(clipgen::Encoding, encoding);
        AviClip decoded;
        QVERIFY2(decoded.loadData(bytesOf(clip, encoding)), qPrintable(decoded.errorString()));
        QCOMPARE(decoded.frameCount(), int(clip.frames.size()));
        QCOMPARE(decoded.size(), QSize(clip.width, clip.height));
        QCOMPARE(decoded.interval(), clip.microsecondsPerFrame / 1000);
        for (int f = 0; f < decoded.frameCount(); ++f) {
            for (int y = 0; y < clip.height; ++y) {
                for (int x = 0; x < clip.width; ++x) {
                    const QRgb want = 0xff000000u | clip.palette[clip.frames[size_t(f)][size_t(y * clip.width + x)]];
                    if (decoded.frame(f).pixel(x, y) != want)
                        QFAIL(qPrintable(QStringLiteral("frame %1, pixel %2,%3").arg(f).arg(x).arg(y)));
                }
            }
        }
    }

    void shippedClipIsTheGeneratedOne()
    {
        const QString file = QStringLiteral(QUOTAS_SOURCE_DIR "/data/filemove.avi");
        QFile shipped(file);
        QVERIFY(shipped.open(QIODevice::ReadOnly));
        QCOMPARE(shipped.readAll(), bytesOf(clipgen::fileMoveScene(), clipgen::Encoding::Rle8Delta));
    }

    void refusesDamagedFiles_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        const QByteArray good = bytesOf(patterned(7, 5, 3), clipgen::Encoding::Rle8);
        const qsizetype strf = good.indexOf("strf") + 8;
        auto patched = [&](qsizetype at, quint32 value) {
            QByteArray b = good;
            for (int i = 0; i < 4; ++i)
                b[at + i] = char(value >> (8 * i));
            return b;
        };
        QTest::newRow("empty") << QByteArray();
        QTest::newRow("not a clip") << QByteArray("GIF89a this is something else entirely");
        QTest::newRow("truncated") << good.left(good.size() / 2);
        QTest::newRow("chunk longer than file") << patched(good.indexOf("movi") - 4, 0x7ffffff0);
        QTest::newRow("huge width") << patched(strf + 4, 100000);
        QTest::newRow("negative width") << patched(strf + 4, quint32(-7));
        QTest::newRow("other compression") << patched(strf + 16, 2);
        QTest::newRow("no frames") << good.left(good.indexOf("LIST", good.indexOf("strl"))) ;
    }

    void refusesDamagedFiles()
    {
        QFETCH(QByteArray, bytes);
        AviClip clip;
        QVERIFY(!clip.loadData(bytes));
        QVERIFY(clip.isEmpty());
        QVERIFY(!clip.errorString().isEmpty());
    }

    void survivesCorruptedFrames()
    {
        // Every byte of the frame data may be anything: the reader must
        // neither crash nor write outside its frame.
        const QByteArray good = bytesOf(clipgen::fileMoveScene(), clipgen::Encoding::Rle8Delta);
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

    void missingClipLeavesTheControlStill()
    {
        QTemporaryDir dir;
        Animation animation;
        QVERIFY(!animation.open(dir.filePath(QStringLiteral("filemove.avi"))));
        QVERIFY(animation.errorString().contains(QStringLiteral("não existe")));
        animation.play();
        QVERIFY(!animation.isPlaying());
        animation.stop();
    }

    void playsInALoopAndStopsWhereItIs()
    {
        QTemporaryDir dir;
        clipgen::Clip clip = patterned(4, 4, 3);
        clip.microsecondsPerFrame = 10000;
        const QString file = dir.filePath(QStringLiteral("loop.avi"));
        QFile out(file);
        QVERIFY(out.open(QIODevice::WriteOnly));
        out.write(bytesOf(clip, clipgen::Encoding::Rle8Delta));
        out.close();

        Animation animation;
        QVERIFY(animation.open(file));
        QCOMPARE(animation.frameCount(), 3);
        QSignalSpy frames(&animation, &Animation::frameChanged);
        animation.play();
        QVERIFY(animation.isPlaying());
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
