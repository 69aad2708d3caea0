#include "AppStreamCatalogue.h"

#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"
#include "platform/services/PreferredLanguages.h"

#include <QDir>

// libappstream is a GLib library whose headers use "signals" and "slots" as
// plain identifiers.
#undef signals
#include <appstream.h>

namespace platform {

namespace {

struct PoolDeleter {
    void operator()(AsPool* pool) const { g_object_unref(pool); }
};
struct ArrayDeleter {
    void operator()(GPtrArray* array) const { g_ptr_array_unref(array); }
};
using ComponentList = std::unique_ptr<GPtrArray, ArrayDeleter>;

QString text(const gchar* value) {
    return value ? QString::fromUtf8(value) : QString();
}

// A folder of metainfo files is read differently from a collection: the
// parser is chosen by the folder, so the two kinds cannot share one.
bool holdsMetainfo(const QString& directory) {
    return !QDir(directory)
                .entryList({QStringLiteral("*.metainfo.xml"), QStringLiteral("*.appdata.xml")},
                           QDir::Files)
                .isEmpty();
}

// The pool's locale also filters what it loads, and a pool in the "C" locale
// (its default under LANG=C.UTF-8) finds nothing: without a language of the
// user's, English, which gives the untranslated names.
QByteArray poolLocale() {
    const QStringList languages = preferredLanguages();
    if (languages.isEmpty())
        return QByteArrayLiteral("en");
    QString locale = languages.first();
    locale.replace(QLatin1Char('-'), QLatin1Char('_'));
    return locale.toUtf8();
}

} // namespace

struct AppStreamCatalogue::Pool {
    std::unique_ptr<AsPool, PoolDeleter> pool;
    std::mutex mutex; // AsPool is not safe for concurrent queries
};

AppStreamCatalogue::AppStreamCatalogue(QStringList directories)
    : directories_(std::move(directories)) {
    if (directories_.isEmpty() && qEnvironmentVariableIsSet("TAMSEL_APPSTREAM_DIRS"))
        directories_ = qEnvironmentVariable("TAMSEL_APPSTREAM_DIRS")
                           .split(QLatin1Char(':'), Qt::SkipEmptyParts);
}

AppStreamCatalogue::~AppStreamCatalogue() = default;

void AppStreamCatalogue::lookupApplication(const QString& bundleIdentifier, Done done) {
    // Loading a desktop's whole catalogue takes a while; it must not hold up
    // the service's thread, where the remote catalogue's answer arrives.
    GlobalQueue::async(QueuePriority::Default,
                       [self = shared_from_this(), bundleIdentifier, done = std::move(done)] {
                           done(self->lookupNow(bundleIdentifier));
                       });
}

std::optional<StoreRecord> AppStreamCatalogue::lookupNow(const QString& bundleIdentifier) {
    std::shared_ptr<Pool> pool;
    {
        std::lock_guard lock(mutex_);
        if (!pool_) {
            pool_ = std::make_shared<Pool>();
            pool_->pool.reset(as_pool_new());
            AsPool* p = pool_->pool.get();
            as_pool_set_locale(p, poolLocale().constData());
            if (!directories_.isEmpty()) {
                as_pool_set_load_std_data_locations(p, FALSE);
                as_pool_set_flags(
                    p, AsPoolFlags(AS_POOL_FLAG_LOAD_OS_CATALOG | AS_POOL_FLAG_LOAD_OS_METAINFO));
                for (const QString& directory : std::as_const(directories_))
                    as_pool_add_extra_data_location(p, QFile::encodeName(directory).constData(),
                                                    holdsMetainfo(directory)
                                                        ? AS_FORMAT_STYLE_METAINFO
                                                        : AS_FORMAT_STYLE_COLLECTION);
            }
            GError* error = nullptr;
            if (!as_pool_load(p, nullptr, &error)) {
                // A partly readable catalogue still answers for what it read.
                logError(QStringLiteral("AppStreamCatalogue: %1")
                             .arg(error ? text(error->message) : QString()));
                g_clear_error(&error);
            }
        }
        pool = pool_;
    }

    std::lock_guard lock(pool->mutex);
    AsPool* p = pool->pool.get();
    const QByteArray id = bundleIdentifier.toUtf8();
    ComponentList found(as_pool_get_components_by_id(p, id.constData()));
    if (!found || found->len == 0)
        found.reset(as_pool_get_components_by_id(p, (id + ".desktop").constData()));
    if (!found || found->len == 0)
        found.reset(as_pool_get_components_by_launchable(p, AS_LAUNCHABLE_KIND_DESKTOP_ID,
                                                         (id + ".desktop").constData()));
    if (!found || found->len == 0)
        return std::nullopt;

    auto* component = static_cast<AsComponent*>(g_ptr_array_index(found.get(), 0));
    StoreRecord record;
    record.name = text(as_component_get_name(component));
    record.developerName = text(as_component_get_developer_name(component));
    if (GPtrArray* categories = as_component_get_categories(component))
        for (guint i = 0; i < categories->len; ++i)
            record.categories.append(text(static_cast<const gchar*>(categories->pdata[i])));
    record.storeLink = QStringLiteral("appstream://") + text(as_component_get_id(component));
    return record;
}

} // namespace platform
