#pragma once

#include <QImage>
#include <QString>
#include <QTimer>
#include <QVector>
#include <QWidget>

namespace quotas {

// The frames of a silent AVI clip, all decoded when it is loaded. Plays the
// first video stream, with frames uncompressed (8 bits through a palette, 24
// or 32 bits) or run-length encoded (RLE8, including frames that only carry
// what changed). Anything else, or a damaged file, is refused with a reason;
// sizes are bounded, so a hostile file cannot exhaust memory.
class AviClip {
public:
    bool load(const QString& file);
    bool loadData(const QByteArray& bytes);
    void clear();

    bool isEmpty() const { return m_frames.isEmpty(); }
    int frameCount() const { return int(m_frames.size()); }
    QSize size() const { return m_size; }
    // Milliseconds between two frames.
    int interval() const { return m_interval; }
    // Opaque RGB32 images, top row first.
    const QImage& frame(int index) const { return m_frames.at(index); }
    // Why the last load failed (Portuguese), empty after a success.
    const QString& errorString() const { return m_error; }

private:
    bool fail(const QString& reason);

    QVector<QImage> m_frames;
    QSize m_size;
    int m_interval = 100;
    QString m_error;
};

// The busy animation of a dialog: opens a clip, plays it in a loop on a
// timer and stops on the frame it shows. The clip's background colour (that
// of its first pixel) is left transparent, so the dialog shows through. The
// timer only fires while events are processed: a long run that wants the
// animation to move lets events through now and then.
class Animation : public QWidget {
    Q_OBJECT
public:
    explicit Animation(QWidget* parent = nullptr);

    // Loads the clip and shows its first frame. A missing or unreadable file
    // leaves the control empty and still, and gives false.
    bool open(const QString& file);
    // Plays from the first frame, over and over; nothing without a clip.
    void play();
    // Stays on the frame shown.
    void stop();
    // Empties the control.
    void close();

    bool isOpen() const { return !m_frames.isEmpty(); }
    bool isPlaying() const { return m_timer.isActive(); }
    int frameCount() const { return int(m_frames.size()); }
    int currentFrame() const { return m_frame; }
    const QString& errorString() const { return m_error; }

    QSize sizeHint() const override;

signals:
    // The frame now shown (after play() and on every tick).
    void frameChanged(int frame);

protected:
    void paintEvent(QPaintEvent* event) override;

private:
    void advance();

    QVector<QImage> m_frames;
    QTimer m_timer;
    int m_frame = 0;
    QString m_error;
};

}  // namespace quotas
