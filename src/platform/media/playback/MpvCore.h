#pragma once

// Internal to the playback library: the only header that includes libmpv.

#include "platform/runtime/Error.h"

#include <QByteArray>
#include <QList>

#include <mpv/client.h>
#include <mpv/render.h>

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>

namespace platform {

// One libmpv core with the player's fixed options, and the one render context
// that a core may have.
//
// Threads: made, used and destroyed on the main thread. libmpv calls back on
// its own threads; those callbacks only post to the main queue, where the
// events are drained and handed to the event handler, one at a time.
//
// Video: the core always runs with vo=libmpv and always has a render
// context. Without a client (no widget shows the player) it is a software
// context that consumes each frame without drawing it, so the clock, the
// time observers and the end of the item behave exactly as on screen. A
// widget attaches its own context in its place and hands it back when it
// goes. Teardown: the render context is freed before the core, always.
class MpvCore : public std::enable_shared_from_this<MpvCore> {
  public:
    using EventHandler = std::function<void(const mpv_event&)>;

    // What a widget that draws the video gives the core when it attaches.
    struct RenderClient {
        // Main thread: the render context has an update (a new frame, or a
        // redraw); the client calls mpv_render_context_update() and draws or
        // skips the frame. Required.
        std::function<void()> update;
        // For contexts bound to a graphics context (OpenGL): make it current
        // around the context's release. May be empty.
        std::function<void()> makeCurrent;
        std::function<void()> doneCurrent;
    };

    // Starts a core. Null, with `error` set, when libmpv cannot start.
    static std::shared_ptr<MpvCore> create(ErrorPtr* error);
    ~MpvCore();
    MpvCore(const MpvCore&) = delete;
    MpvCore& operator=(const MpvCore&) = delete;

    mpv_handle* handle() const { return handle_; }

    // Receives every event except the core's own bookkeeping; called on the
    // main thread from the drain, never from inside a caller's call.
    void setEventHandler(EventHandler handler) { handler_ = std::move(handler); }

    // Asynchronous commands and property writes: they never wait for the
    // core. Replies arrive as MPV_EVENT_COMMAND_REPLY with `replyId`.
    void command(const QList<QByteArray>& args, std::uint64_t replyId = 0);
    void setProperty(const char* name, const QByteArray& value);

    // Gives `client` a render context made from `params` (terminated by
    // MPV_RENDER_PARAM_INVALID). A software client takes the headless
    // context over as it is; any other kind replaces it, and the file's
    // video output is restarted on the new one. Returns the attachment's id,
    // or 0 when libmpv refuses the parameters (the headless context is then
    // put back). A previous client loses the context without being told; it
    // finds out from renderContext().
    std::uint64_t attachRenderer(mpv_render_param* params, RenderClient client);
    // Gives the context of attachment `id` back (no-op when it is no longer
    // the current one) and returns to the headless context.
    void detachRenderer(std::uint64_t id);
    // The context of attachment `id` while it is the current one, else null.
    mpv_render_context* renderContext(std::uint64_t id) const;

  private:
    MpvCore() = default;
    bool start(ErrorPtr* error);
    void drainEvents();
    void renderUpdate();
    void installHeadless();
    void freeRenderContext();
    void reloadVideoOutput();

    static void onWakeup(void* self);
    static void onRenderUpdate(void* self);

    mpv_handle* handle_ = nullptr;
    mpv_render_context* render_ = nullptr;
    RenderClient client_; // empty update: the headless context
    std::uint64_t attachment_ = 0;
    std::uint64_t nextAttachment_ = 1;
    bool isGL_ = false;       // the context is bound to a client's GL context
    bool fileActive_ = false; // between the start and the end of a file
    EventHandler handler_;
    std::atomic_bool drainQueued_{false};
    std::atomic_bool renderQueued_{false};
};

} // namespace platform
