#include "StringsTable.h"

#include <QFile>
#include <QStringDecoder>

namespace platform {
namespace {

class Parser {
  public:
    explicit Parser(const QString& text) : s_(text) {}

    std::optional<QVariantMap> run() {
        QVariantMap table;
        for (;;) {
            skipSpaceAndComments();
            if (atEnd())
                return table;
            auto key = token();
            skipSpaceAndComments();
            if (!key || !consume(QLatin1Char('=')))
                return std::nullopt;
            skipSpaceAndComments();
            auto value = token();
            skipSpaceAndComments();
            if (!value || !consume(QLatin1Char(';')))
                return std::nullopt;
            table.insert(*key, *value);
        }
    }

  private:
    bool atEnd() const { return i_ >= s_.size(); }
    QChar peek(qsizetype ahead = 0) const {
        return i_ + ahead < s_.size() ? s_.at(i_ + ahead) : QChar();
    }

    bool consume(QChar c) {
        if (peek() != c)
            return false;
        ++i_;
        return true;
    }

    void skipSpaceAndComments() {
        while (!atEnd()) {
            if (peek().isSpace()) {
                ++i_;
            } else if (peek() == QLatin1Char('/') && peek(1) == QLatin1Char('*')) {
                const qsizetype end = s_.indexOf(QLatin1String("*/"), i_ + 2);
                i_ = end < 0 ? s_.size() : end + 2;
            } else if (peek() == QLatin1Char('/') && peek(1) == QLatin1Char('/')) {
                const qsizetype end = s_.indexOf(QLatin1Char('\n'), i_);
                i_ = end < 0 ? s_.size() : end + 1;
            } else {
                return;
            }
        }
    }

    std::optional<QString> token() {
        if (peek() == QLatin1Char('"'))
            return quoted();
        QString word;
        while (!atEnd() && (peek().isLetterOrNumber() || peek() == QLatin1Char('_') ||
                            peek() == QLatin1Char('.') || peek() == QLatin1Char('-')))
            word += s_.at(i_++);
        if (word.isEmpty())
            return std::nullopt;
        return word;
    }

    std::optional<QString> quoted() {
        ++i_; // opening quote
        QString out;
        while (!atEnd()) {
            const QChar c = s_.at(i_++);
            if (c == QLatin1Char('"'))
                return out;
            if (c != QLatin1Char('\\')) {
                out += c;
                continue;
            }
            if (atEnd())
                return std::nullopt;
            const QChar e = s_.at(i_++);
            switch (e.unicode()) {
            case 'n':
                out += QLatin1Char('\n');
                break;
            case 't':
                out += QLatin1Char('\t');
                break;
            case 'r':
                out += QLatin1Char('\r');
                break;
            case 'U':
            case 'u': {
                bool ok = false;
                const uint code = s_.mid(i_, 4).toUInt(&ok, 16);
                if (!ok)
                    return std::nullopt;
                out += QChar(code);
                i_ += 4;
                break;
            }
            default:
                out += e;
                break; // \" \\ \' and anything else stand for themselves
            }
        }
        return std::nullopt; // unterminated
    }

    const QString& s_;
    qsizetype i_ = 0;
};

} // namespace

std::optional<QVariantMap> parseStrings(const QString& text) {
    return Parser(text).run();
}

std::optional<QVariantMap> readStringsFile(const QString& hostPath) {
    QFile file(hostPath);
    if (!file.open(QIODevice::ReadOnly))
        return std::nullopt;
    return parseStringsData(file.readAll());
}

std::optional<QVariantMap> parseStringsData(const QByteArray& bytes) {
    QString text;
    if (bytes.startsWith("\xFF\xFE") || bytes.startsWith("\xFE\xFF")) {
        QStringDecoder decoder(QStringDecoder::Utf16);
        text = decoder(bytes);
    } else {
        QStringDecoder decoder(QStringDecoder::Utf8);
        text = decoder(bytes);
        if (decoder.hasError())
            return std::nullopt;
    }
    if (text.startsWith(QChar(0xFEFF)))
        text.remove(0, 1);
    return parseStrings(text);
}

} // namespace platform
