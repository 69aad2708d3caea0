#include "VideoMetadata.h"

#include <QTextBoundaryFinder>

#include <functional>

namespace youtube_publishing::VideoMetadata {

namespace {

// The service refuses angle brackets; these look alike and are allowed.
bool replaceAngleBrackets(QString& text) {
    if (!text.contains(QLatin1Char('<')) && !text.contains(QLatin1Char('>')))
        return false;
    text.replace(QLatin1Char('<'), QChar(0x2039));
    text.replace(QLatin1Char('>'), QChar(0x203A));
    return true;
}

// The longest prefix ending on a grapheme boundary whose cost stays within
// `limit`; true when it had to cut. Costs add up piece by piece.
bool cutAtLimit(QString& text, qsizetype limit, const std::function<qsizetype(QStringView)>& cost) {
    if (cost(text) <= limit)
        return false;
    QTextBoundaryFinder graphemes(QTextBoundaryFinder::Grapheme, text);
    qsizetype fits = 0;
    qsizetype spent = 0;
    for (qsizetype at = graphemes.toNextBoundary(); at > 0; at = graphemes.toNextBoundary()) {
        spent += cost(QStringView(text).mid(fits, at - fits));
        if (spent > limit)
            break;
        fits = at;
    }
    text.truncate(fits);
    return true;
}

qsizetype codePoints(QStringView text) {
    qsizetype count = 0;
    for (qsizetype i = 0; i < text.size(); ++i)
        if (!text[i].isLowSurrogate())
            ++count;
    return count;
}

qsizetype utf8Bytes(QStringView text) {
    return text.toUtf8().size();
}

} // namespace

FittedText fitTitle(const QString& title) {
    FittedText fitted;
    fitted.text = title;
    fitted.text.replace(QLatin1String("\r\n"), QLatin1String(" "));
    fitted.text.replace(QLatin1Char('\n'), QLatin1Char(' '));
    fitted.text.replace(QLatin1Char('\r'), QLatin1Char(' '));
    fitted.text = fitted.text.trimmed();
    fitted.replaced = replaceAngleBrackets(fitted.text);
    fitted.shortened = cutAtLimit(fitted.text, titleCharacterLimit, codePoints);
    fitted.text = fitted.text.trimmed();
    return fitted;
}

FittedText fitDescription(const QString& description) {
    FittedText fitted;
    fitted.text = description;
    fitted.replaced = replaceAngleBrackets(fitted.text);
    fitted.shortened = cutAtLimit(fitted.text, descriptionByteLimit, utf8Bytes);
    return fitted;
}

} // namespace youtube_publishing::VideoMetadata
