// The main of a build-time tool that draws images into a bundle directory at
// 1x, 2x and 3x, named as the bundle's image lookup expects: NAME.png,
// NAME@2x.png, NAME@3x.png. Each drawing function gets the scale.
#pragma once

#include <QDir>
#include <QGuiApplication>
#include <QImage>
#include <QString>
#include <cstdio>
#include <functional>
#include <utility>
#include <vector>

namespace platform::tools {

using ImageDrawing = std::pair<QString, std::function<QImage(int scale)>>;

inline int drawImageSet(int argc, char** argv, const std::vector<ImageDrawing>& drawings) {
    QGuiApplication app(argc, argv);
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s BUNDLE_DIRECTORY\n", argv[0]);
        return 2;
    }
    const QString directory = QString::fromLocal8Bit(argv[1]);
    if (!QDir().mkpath(directory)) {
        std::fprintf(stderr, "cannot create %s\n", argv[1]);
        return 1;
    }
    for (int scale = 1; scale <= 3; ++scale) {
        for (const auto& [name, draw] : drawings) {
            const QString file = directory + QLatin1Char('/') + name +
                                 (scale == 1 ? QString() : QStringLiteral("@%1x").arg(scale)) +
                                 QStringLiteral(".png");
            if (!draw(scale).save(file, "PNG")) {
                std::fprintf(stderr, "cannot write %s\n", qPrintable(file));
                return 1;
            }
        }
    }
    return 0;
}

} // namespace platform::tools
