#include "platform/ui/NamedImage.h"

#include "platform/services/Bundle.h"

#include <QImageReader>
#include <cmath>

namespace platform::NamedImage {

QImage imageNamed(const QString& name, const Bundle* bundle, qreal scale) {
    if (!bundle || name.isEmpty())
        return {};
    const int wanted = std::clamp(int(std::ceil(scale - 0.01)), 1, 3);
    QList<int> order;
    for (int s = wanted; s <= 3; ++s)
        order.append(s);
    for (int s = wanted - 1; s >= 1; --s)
        order.append(s);

    for (int variant : order) {
        const QString file = variant == 1 ? name : name + QStringLiteral("@%1x").arg(variant);
        const QString path =
            bundle->pathForResource(file, QStringLiteral("png"), QString(), QString());
        if (path.isEmpty())
            continue;
        QImageReader reader(path);
        QImage image = reader.read();
        if (image.isNull())
            continue;
        image = image.convertToFormat(QImage::Format_ARGB32_Premultiplied);
        image.setDevicePixelRatio(variant);
        return image;
    }
    return {};
}

} // namespace platform::NamedImage
