#include "PrefixMatch.h"

namespace {

// Decomposes, drops the combining marks and folds case, so that "Á", "á" and
// "a" all become "a".
QString folded(const QString& text) {
    const QString decomposed = text.normalized(QString::NormalizationForm_KD);
    QString out;
    out.reserve(decomposed.size());
    for (const QChar c : decomposed) {
        const auto category = c.category();
        if (category != QChar::Mark_NonSpacing && category != QChar::Mark_SpacingCombining &&
            category != QChar::Mark_Enclosing)
            out += c;
    }
    return out.toCaseFolded();
}

} // namespace

bool beginsWithIgnoringCaseAndDiacritics(const QString& name, const QString& prefix) {
    return folded(name).startsWith(folded(prefix));
}
