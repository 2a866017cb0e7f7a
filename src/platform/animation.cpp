#include "platform/animation.h"

#include <QFile>
#include <QPainter>
#include <algorithm>

namespace quotas {

namespace {

// Bounds that no busy clip comes near: they keep a damaged or hostile file
// from asking for gigabytes.
constexpr qint64 kMaxFileBytes = 32 * 1024 * 1024;
constexpr int kMaxSide = 2048;
constexpr int kMaxFrames = 10000;
constexpr qint64 kMaxPixels = 64LL * 1024 * 1024;  // over all frames

quint32 read32(const QByteArray& b, qsizetype at)
{
    const auto* p = reinterpret_cast<const uchar*>(b.constData() + at);
    return quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16 | quint32(p[3]) << 24;
}

quint16 read16(const QByteArray& b, qsizetype at)
{
    const auto* p = reinterpret_cast<const uchar*>(b.constData() + at);
    return quint16(p[0] | p[1] << 8);
}

QByteArray tagAt(const QByteArray& b, qsizetype at)
{
    return b.mid(at, 4);
}

struct Chunk {
    QByteArray tag;
    qsizetype body = 0;  // offset of the data
    qsizetype size = 0;
};

// What the walk over the file collects.
struct Parsed {
    quint32 microsecondsPerFrame = 0;
    quint32 scale = 0;
    quint32 rate = 0;
    int streams = 0;
    int videoStream = -1;
    bool haveFormat = false;
    qsizetype format = 0;  // BITMAPINFOHEADER
    qsizetype formatSize = 0;
    QByteArray frameTags[2];  // "NNdb", "NNdc"
    QVector<Chunk> frames;
};

class Reader {
public:
    explicit Reader(const QByteArray& bytes) : m_b(bytes) {}

    // Walks the chunks in [begin, end); false with a reason when one runs
    // past its parent.
    bool walk(qsizetype begin, qsizetype end, const QByteArray& list, Parsed& p)
    {
        qsizetype at = begin;
        while (at + 8 <= end) {
            Chunk c{tagAt(m_b, at), at + 8, qsizetype(read32(m_b, at + 4))};
            if (c.size > end - c.body) {
                m_error = QStringLiteral("o ficheiro está truncado");
                return false;
            }
            if (c.tag == "LIST") {
                if (c.size < 4) {
                    m_error = QStringLiteral("uma lista do ficheiro está vazia");
                    return false;
                }
                const QByteArray type = tagAt(m_b, c.body);
                if (type == "strl")
                    ++p.streams;
                if (type == "hdrl" || type == "strl" || type == "movi" || type == "rec ") {
                    if (++m_depth > 8) {
                        m_error = QStringLiteral("listas encaixadas em demasia");
                        return false;
                    }
                    if (!walk(c.body + 4, c.body + c.size, type, p))
                        return false;
                    --m_depth;
                }
            } else if (list == "hdrl" && c.tag == "avih" && c.size >= 40) {
                p.microsecondsPerFrame = read32(m_b, c.body);
            } else if (list == "strl" && c.tag == "strh" && c.size >= 32) {
                if (p.videoStream < 0 && tagAt(m_b, c.body) == "vids") {
                    p.videoStream = p.streams - 1;
                    p.scale = read32(m_b, c.body + 20);
                    p.rate = read32(m_b, c.body + 24);
                    const QByteArray n = QByteArray::number(p.videoStream).rightJustified(2, '0');
                    p.frameTags[0] = n + "db";
                    p.frameTags[1] = n + "dc";
                }
            } else if (list == "strl" && c.tag == "strf") {
                if (p.videoStream == p.streams - 1 && !p.haveFormat) {
                    p.haveFormat = true;
                    p.format = c.body;
                    p.formatSize = c.size;
                }
            } else if ((list == "movi" || list == "rec ") && p.videoStream >= 0
                       && (c.tag == p.frameTags[0] || c.tag == p.frameTags[1])) {
                if (p.frames.size() >= kMaxFrames) {
                    m_error = QStringLiteral("o filme tem imagens em demasia");
                    return false;
                }
                p.frames.append(c);
            }
            at = c.body + c.size + (c.size & 1);
        }
        return true;
    }

    const QString& error() const { return m_error; }

private:
    const QByteArray& m_b;
    QString m_error;
    int m_depth = 0;
};

// RLE8 onto the previous frame's pixels: what a frame does not mention
// stays as it was. Rows are counted from the bottom, as bitmaps store them.
void decodeRle8(const uchar* data, qsizetype size, QByteArray& pixels, int width, int height)
{
    qsizetype i = 0;
    int x = 0;
    int y = 0;
    auto put = [&](uchar index) {
        if (x < width && y < height)
            pixels[qsizetype(height - 1 - y) * width + x] = char(index);
        x = std::min(x + 1, width);
    };
    while (i + 1 < size && y < height) {
        const uchar count = data[i];
        const uchar value = data[i + 1];
        i += 2;
        if (count > 0) {
            for (int n = 0; n < count; ++n)
                put(value);
        } else if (value == 0) {
            x = 0;
            ++y;
        } else if (value == 1) {
            return;
        } else if (value == 2) {
            if (i + 1 >= size)
                return;
            x = std::min(x + data[i], width);
            y += data[i + 1];
            i += 2;
        } else {
            for (int n = 0; n < value && i < size; ++n)
                put(data[i++]);
            i += value & 1;  // absolute runs end on a 16-bit boundary
        }
    }
}

}  // namespace

bool AviClip::fail(const QString& reason)
{
    m_frames.clear();
    m_size = QSize();
    m_error = reason;
    return false;
}

void AviClip::clear()
{
    m_frames.clear();
    m_size = QSize();
    m_interval = 100;
    m_error.clear();
}

bool AviClip::load(const QString& file)
{
    QFile f(file);
    if (!f.exists())
        return fail(QStringLiteral("o ficheiro \"%1\" não existe").arg(file));
    if (!f.open(QIODevice::ReadOnly))
        return fail(QStringLiteral("não foi possível ler \"%1\": %2").arg(file, f.errorString()));
    if (f.size() > kMaxFileBytes)
        return fail(QStringLiteral("o ficheiro \"%1\" é demasiado grande").arg(file));
    const QByteArray bytes = f.readAll();
    if (!loadData(bytes)) {
        m_error = QStringLiteral("\"%1\": %2").arg(file, m_error);
        return false;
    }
    return true;
}

bool AviClip::loadData(const QByteArray& b)
{
    clear();
    if (b.size() > kMaxFileBytes)
        return fail(QStringLiteral("o ficheiro é demasiado grande"));
    if (b.size() < 12 || tagAt(b, 0) != "RIFF" || tagAt(b, 8) != "AVI ")
        return fail(QStringLiteral("não é um filme AVI"));
    const qsizetype end = std::min<qsizetype>(b.size(), 8 + qsizetype(read32(b, 4)));
    Parsed p;
    Reader reader(b);
    if (!reader.walk(12, end, "RIFF", p))
        return fail(reader.error());
    if (p.videoStream < 0 || !p.haveFormat || p.formatSize < 40)
        return fail(QStringLiteral("o filme não tem imagens"));

    const qsizetype f = p.format;
    const quint32 headerSize = read32(b, f);
    const qint32 width = qint32(read32(b, f + 4));
    const qint32 rawHeight = qint32(read32(b, f + 8));
    const int bits = read16(b, f + 14);
    const quint32 compression = read32(b, f + 16);
    const quint32 used = read32(b, f + 32);
    const bool topDown = rawHeight < 0;
    const qint64 height = topDown ? -qint64(rawHeight) : rawHeight;
    if (headerSize < 40 || headerSize > quint32(p.formatSize))
        return fail(QStringLiteral("o formato das imagens está danificado"));
    if (width <= 0 || height <= 0 || width > kMaxSide || height > kMaxSide)
        return fail(QStringLiteral("as imagens têm um tamanho impossível"));
    const bool rle8 = compression == 1 && bits == 8 && !topDown;
    const bool raw = compression == 0 && (bits == 8 || bits == 24 || bits == 32);
    if (!rle8 && !raw)
        return fail(QStringLiteral("as imagens estão num formato que não é suportado (%1 bits, compressão %2)")
                        .arg(bits)
                        .arg(compression));
    if (p.frames.isEmpty())
        return fail(QStringLiteral("o filme não tem imagens"));
    if (qint64(width) * height * p.frames.size() > kMaxPixels)
        return fail(QStringLiteral("o filme é demasiado grande"));

    QVector<QRgb> palette;
    if (bits == 8) {
        const qsizetype entries = std::min<qsizetype>(used == 0 ? 256 : qsizetype(used), 256);
        const qsizetype available = (p.formatSize - qsizetype(headerSize)) / 4;
        for (qsizetype i = 0; i < std::min(entries, available); ++i) {
            const qsizetype at = f + qsizetype(headerSize) + 4 * i;
            palette.append(qRgb(uchar(b[at + 2]), uchar(b[at + 1]), uchar(b[at])));
        }
        // An index past the palette shows black rather than reading past it.
        palette.resize(256, qRgb(0, 0, 0));
    }

    const int w = int(width);
    const int h = int(height);
    const qsizetype stride = (qsizetype(w) * bits + 31) / 32 * 4;
    QByteArray indices(qsizetype(w) * h, '\0');
    QImage previous;
    for (const Chunk& c : p.frames) {
        const auto* data = reinterpret_cast<const uchar*>(b.constData() + c.body);
        QImage image;
        if (c.size == 0 && !previous.isNull()) {
            image = previous;  // a dropped frame repeats the one before
        } else if (rle8) {
            decodeRle8(data, c.size, indices, w, h);
            QImage indexed(reinterpret_cast<const uchar*>(indices.constData()), w, h, w, QImage::Format_Indexed8);
            indexed.setColorTable(palette);
            image = indexed.convertToFormat(QImage::Format_RGB32);
        } else {
            if (c.size < stride * h)
                return fail(QStringLiteral("uma imagem do filme está incompleta"));
            image = QImage(w, h, QImage::Format_RGB32);
            for (int y = 0; y < h; ++y) {
                const uchar* row = data + stride * (topDown ? y : h - 1 - y);
                auto* out = reinterpret_cast<QRgb*>(image.scanLine(y));
                for (int x = 0; x < w; ++x) {
                    if (bits == 8) {
                        out[x] = palette[row[x]];
                    } else {
                        const uchar* px = row + x * (bits / 8);
                        out[x] = qRgb(px[2], px[1], px[0]);
                    }
                }
            }
        }
        m_frames.append(image);
        previous = image;
    }
    m_size = QSize(w, h);
    if (p.microsecondsPerFrame > 0)
        m_interval = int(std::clamp<quint32>(p.microsecondsPerFrame / 1000, 10, 1000));
    else if (p.rate > 0 && p.scale > 0)
        m_interval = int(std::clamp<quint64>(quint64(p.scale) * 1000 / p.rate, 10, 1000));
    return true;
}

Animation::Animation(QWidget* parent) : QWidget(parent)
{
    connect(&m_timer, &QTimer::timeout, this, &Animation::advance);
}

bool Animation::open(const QString& file)
{
    close();
    AviClip clip;
    if (!clip.load(file)) {
        m_error = clip.errorString();
        return false;
    }
    const QRgb background = clip.frame(0).pixel(0, 0);
    for (int i = 0; i < clip.frameCount(); ++i) {
        QImage image = clip.frame(i).convertToFormat(QImage::Format_ARGB32);
        for (int y = 0; y < image.height(); ++y) {
            auto* row = reinterpret_cast<QRgb*>(image.scanLine(y));
            for (int x = 0; x < image.width(); ++x) {
                if (row[x] == background)
                    row[x] = qRgba(0, 0, 0, 0);
            }
        }
        m_frames.append(image);
    }
    m_timer.setInterval(clip.interval());
    update();
    return true;
}

void Animation::play()
{
    if (m_frames.isEmpty())
        return;
    m_frame = 0;
    update();
    emit frameChanged(m_frame);
    if (m_frames.size() > 1)
        m_timer.start();
}

void Animation::stop()
{
    m_timer.stop();
}

void Animation::close()
{
    m_timer.stop();
    m_frames.clear();
    m_frame = 0;
    m_error.clear();
    update();
}

QSize Animation::sizeHint() const
{
    return m_frames.isEmpty() ? QSize(80, 36) : m_frames.front().size();
}

void Animation::advance()
{
    if (m_frames.isEmpty())
        return;
    m_frame = (m_frame + 1) % int(m_frames.size());
    update();
    emit frameChanged(m_frame);
}

void Animation::paintEvent(QPaintEvent*)
{
    if (m_frames.isEmpty())
        return;
    const QImage& image = m_frames.at(m_frame);
    QPainter painter(this);
    const QRect target(QPoint((width() - image.width()) / 2, (height() - image.height()) / 2), image.size());
    painter.drawImage(target.topLeft(), image);
}

}  // namespace quotas
