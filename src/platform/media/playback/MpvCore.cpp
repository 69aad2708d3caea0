#include "MpvCore.h"

#include "AudioOutput.h"
#include "platform/media/Asset.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <cerrno>

namespace platform {

namespace {

// Enough events per turn of the main loop to keep up with playback, few
// enough that a flood cannot starve the interface.
constexpr int kEventsPerDrain = 256;

struct Option {
    const char* name;
    QByteArray value;
};

} // namespace

std::shared_ptr<MpvCore> MpvCore::create(ErrorPtr* error) {
    std::shared_ptr<MpvCore> core(new MpvCore);
    if (!core->start(error))
        return nullptr;
    return core;
}

bool MpvCore::start(ErrorPtr* error) {
    handle_ = mpv_create();
    if (!handle_) {
        setError(error,
                 makeError(-ENOSYS, mediaErrorDomain(), QStringLiteral("cannot start libmpv")));
        return false;
    }
    const Option options[] = {
        // Nothing from the user's mpv setup may change how the editor plays.
        {"config", "no"},
        {"load-scripts", "no"},
        {"ytdl", "no"},
        {"osc", "no"},
        {"terminal", "no"},
        {"input-default-bindings", "no"},
        {"input-vo-keyboard", "no"},
        {"sub-auto", "no"},
        {"audio-file-auto", "no"},
        {"cover-art-auto", "no"},
        {"audio-display", "no"},
        {"idle", "yes"},
        {"vo", "libmpv"},
        {"hwdec", "no"},
        {"gpu-hwdec-interop", "no"},
        {"ao", AudioOutput::mpvOption()},
        {"audio-fallback-to-null", "yes"},
        // The last frame stays up at the end, and an item starts paused, as
        // the editor expects of a new player.
        {"keep-open", "yes"},
        {"pause", "yes"},
        // Absolute seeks decode up to the requested frame.
        {"hr-seek", "default"},
        {"hr-seek-framedrop", "yes"},
        // libmpv's software renderer aborts the process on rotated video;
        // the player turns the frames upright in the filter chain instead
        // (see MpvPlayer::load), the same for every renderer.
        {"video-rotate", "no"},
        // Frames are drawn on the main thread: rendering must never wait
        // for a frame's display time there.
        {"video-timing-offset", "0"},
    };
    for (const Option& option : options) {
        if (mpv_set_option_string(handle_, option.name, option.value.constData()) < 0)
            logError(
                QStringLiteral("player: libmpv refused option %1").arg(QLatin1String(option.name)));
    }
    const int status = mpv_initialize(handle_);
    if (status < 0) {
        setError(error, makeError(status, mediaErrorDomain(),
                                  QStringLiteral("cannot start libmpv: %1")
                                      .arg(QString::fromUtf8(mpv_error_string(status)))));
        mpv_terminate_destroy(handle_);
        handle_ = nullptr;
        return false;
    }
    // The render context must exist before any video output starts, or
    // libmpv gives the video up for the whole file.
    installHeadless();
    mpv_set_wakeup_callback(handle_, &MpvCore::onWakeup, this);
    return true;
}

MpvCore::~MpvCore() {
    if (!handle_)
        return;
    // Fixed order: the render context goes first, then the core. After
    // mpv_terminate_destroy returns, no callback can reach this object.
    freeRenderContext();
    mpv_set_wakeup_callback(handle_, nullptr, nullptr);
    mpv_terminate_destroy(handle_);
}

void MpvCore::onWakeup(void* self) {
    auto* core = static_cast<MpvCore*>(self);
    if (core->drainQueued_.exchange(true))
        return;
    MainQueue::async([weak = core->weak_from_this()] {
        if (auto strong = weak.lock())
            strong->drainEvents();
    });
}

void MpvCore::onRenderUpdate(void* self) {
    auto* core = static_cast<MpvCore*>(self);
    if (core->renderQueued_.exchange(true))
        return;
    MainQueue::async([weak = core->weak_from_this()] {
        if (auto strong = weak.lock())
            strong->renderUpdate();
    });
}

void MpvCore::drainEvents() {
    drainQueued_ = false;
    auto keepAlive = shared_from_this();
    for (int i = 0; i < kEventsPerDrain; ++i) {
        const mpv_event* event = mpv_wait_event(handle_, 0);
        if (event->event_id == MPV_EVENT_NONE)
            return;
        if (event->event_id == MPV_EVENT_START_FILE)
            fileActive_ = true;
        else if (event->event_id == MPV_EVENT_END_FILE || event->event_id == MPV_EVENT_IDLE)
            fileActive_ = false;
        if (handler_)
            handler_(*event);
    }
    onWakeup(this); // more are waiting: continue on a later turn
}

void MpvCore::command(const QList<QByteArray>& args, std::uint64_t replyId) {
    QList<const char*> argv;
    for (const QByteArray& arg : args)
        argv.append(arg.constData());
    argv.append(nullptr);
    const int status = mpv_command_async(handle_, replyId, argv.data());
    if (status < 0)
        logError(QStringLiteral("player: libmpv command %1 failed: %2")
                     .arg(QString::fromUtf8(args.value(0)),
                          QString::fromUtf8(mpv_error_string(status))));
}

void MpvCore::setProperty(const char* name, const QByteArray& value) {
    const char* data = value.constData();
    mpv_set_property_async(handle_, 0, name, MPV_FORMAT_STRING, &data);
}

void MpvCore::installHeadless() {
    mpv_render_param params[] = {
        {MPV_RENDER_PARAM_API_TYPE, const_cast<char*>(MPV_RENDER_API_TYPE_SW)},
        {MPV_RENDER_PARAM_INVALID, nullptr},
    };
    client_ = {};
    attachment_ = 0;
    isGL_ = false;
    if (mpv_render_context_create(&render_, handle_, params) < 0) {
        render_ = nullptr;
        logError(QStringLiteral("player: libmpv has no software renderer"));
        return;
    }
    mpv_render_context_set_update_callback(render_, &MpvCore::onRenderUpdate, this);
}

void MpvCore::freeRenderContext() {
    if (!render_)
        return;
    if (client_.makeCurrent)
        client_.makeCurrent();
    mpv_render_context_free(render_);
    if (client_.doneCurrent)
        client_.doneCurrent();
    render_ = nullptr;
    client_ = {};
    attachment_ = 0;
}

void MpvCore::renderUpdate() {
    renderQueued_ = false;
    if (!render_)
        return;
    if (client_.update) {
        client_.update();
        return;
    }
    // Headless: take the frame so the video clock moves on, draw nothing.
    if (mpv_render_context_update(render_) & MPV_RENDER_UPDATE_FRAME) {
        int skip = 1;
        int noWait = 0;
        mpv_render_param params[] = {
            {MPV_RENDER_PARAM_SKIP_RENDERING, &skip},
            {MPV_RENDER_PARAM_BLOCK_FOR_TARGET_TIME, &noWait},
            {MPV_RENDER_PARAM_INVALID, nullptr},
        };
        mpv_render_context_render(render_, params);
    }
}

std::uint64_t MpvCore::attachRenderer(mpv_render_param* params, RenderClient client) {
    const char* type = nullptr;
    for (mpv_render_param* p = params; p->type != MPV_RENDER_PARAM_INVALID; ++p) {
        if (p->type == MPV_RENDER_PARAM_API_TYPE)
            type = static_cast<const char*>(p->data);
    }
    if (render_ && !isGL_ && type && qstrcmp(type, MPV_RENDER_API_TYPE_SW) == 0) {
        // The headless context is a software one already: hand it over as
        // it is, so the video output never notices.
        client_ = std::move(client);
        attachment_ = nextAttachment_++;
        return attachment_;
    }
    freeRenderContext();
    if (mpv_render_context_create(&render_, handle_, params) < 0) {
        render_ = nullptr;
        logError(QStringLiteral("player: libmpv refused a video renderer"));
        installHeadless();
        reloadVideoOutput();
        return 0;
    }
    isGL_ = type && qstrcmp(type, MPV_RENDER_API_TYPE_OPENGL) == 0;
    client_ = std::move(client);
    attachment_ = nextAttachment_++;
    mpv_render_context_set_update_callback(render_, &MpvCore::onRenderUpdate, this);
    reloadVideoOutput();
    return attachment_;
}

void MpvCore::detachRenderer(std::uint64_t id) {
    if (id == 0 || id != attachment_)
        return;
    if (!isGL_) {
        client_ = {};
        attachment_ = 0;
        return;
    }
    freeRenderContext();
    installHeadless();
    reloadVideoOutput();
}

mpv_render_context* MpvCore::renderContext(std::uint64_t id) const {
    return id != 0 && id == attachment_ ? render_ : nullptr;
}

void MpvCore::reloadVideoOutput() {
    // Freeing a context under a file's video output turns the video off for
    // that file, and one being set up may still pick the old context; a
    // fresh track selection restarts the output on the new context at the
    // same position. Only the default track is ever played, so "auto" finds
    // it again.
    if (!fileActive_)
        return;
    setProperty("vid", "no");
    setProperty("vid", "auto");
}

} // namespace platform
