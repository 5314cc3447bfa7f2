// screen_shot OUT.png [SECONDS]: waits until something shows on the X display (the root window is
// no longer one colour), then saves a picture of the whole screen. Exit 0 when saved, 1 when
// nothing showed in time.
#include <QElapsedTimer>
#include <QGuiApplication>
#include <QImage>
#include <QPixmap>
#include <QScreen>
#include <QSet>
#include <QThread>

#include <cstdio>

namespace {

int DistinctColours(const QImage& image)
{
    QSet<QRgb> colours;
    for (int y = 0; y < image.height(); y += 4)
        for (int x = 0; x < image.width(); x += 4)
            colours.insert(image.pixel(x, y));
    return static_cast<int>(colours.size());
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fprintf(stderr, "usage: screen_shot OUT.png [SECONDS]\n");
        return 2;
    }
    QGuiApplication application(argc, argv);
    const int seconds = argc > 2 ? std::atoi(argv[2]) : 30;
    QElapsedTimer clock;
    clock.start();
    while (clock.elapsed() < seconds * 1000) {
        QGuiApplication::processEvents();
        const QImage shot = QGuiApplication::primaryScreen()->grabWindow(0).toImage();
        // A window with text and buttons has many shades; an empty screen has one.
        if (DistinctColours(shot) > 8) {
            QThread::msleep(1500); // let the first page finish painting
            const bool saved = QGuiApplication::primaryScreen()->grabWindow(0).save(QString::fromLocal8Bit(argv[1]));
            std::printf("screen_shot: %s %s\n", argv[1], saved ? "saved" : "not saved");
            return saved ? 0 : 1;
        }
        QThread::msleep(200);
    }
    std::fprintf(stderr, "screen_shot: nothing showed on the display within %d seconds\n", seconds);
    return 1;
}
