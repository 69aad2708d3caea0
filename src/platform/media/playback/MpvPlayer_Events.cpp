// The player's side of libmpv's events: loading, the end of the file,
// positions and seeks.

#include "MpvCore.h"
#include "MpvPlayer_Internal.h"
#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"

#include <cerrno>
#include <cmath>

namespace platform {

namespace {

const mpv_node* member(const mpv_node& map, const char* key) {
    if (map.format != MPV_FORMAT_NODE_MAP)
        return nullptr;
    for (int i = 0; i < map.u.list->num; ++i) {
        if (qstrcmp(map.u.list->keys[i], key) == 0)
            return &map.u.list->values[i];
    }
    return nullptr;
}

std::optional<double> number(const mpv_node* node) {
    if (!node)
        return std::nullopt;
    if (node->format == MPV_FORMAT_DOUBLE)
        return node->u.double_;
    if (node->format == MPV_FORMAT_INT64)
        return double(node->u.int64);
    return std::nullopt;
}

} // namespace

QList<MediaTimeRange> seekableRanges(const mpv_node& cacheState, std::int32_t timescale) {
    QList<MediaTimeRange> ranges;
    const mpv_node* list = member(cacheState, "seekable-ranges");
    if (!list || list->format != MPV_FORMAT_NODE_ARRAY)
        return ranges;
    for (int i = 0; i < list->u.list->num; ++i) {
        const std::optional<double> start = number(member(list->u.list->values[i], "start"));
        const std::optional<double> end = number(member(list->u.list->values[i], "end"));
        if (!start || !end || !std::isfinite(*start) || !std::isfinite(*end) || *end < *start)
            continue;
        ranges.append(
            MediaTimeRange::fromStartToEnd(MediaTime::fromSeconds(std::max(0.0, *start), timescale),
                                           MediaTime::fromSeconds(std::max(0.0, *end), timescale)));
    }
    return ranges;
}

void MpvPlayer::handleEvent(const mpv_event& event) {
    switch (event.event_id) {
    case MPV_EVENT_START_FILE:
        startedEntry_ = static_cast<const mpv_event_start_file*>(event.data)->playlist_entry_id;
        break;
    case MPV_EVENT_FILE_LOADED:
        // Events of a file loaded for an earlier item may still be queued;
        // only the current item's file counts.
        openedEntry_ = startedEntry_;
        if (openedEntry_ == expectedEntry_)
            handleFileLoaded();
        break;
    case MPV_EVENT_END_FILE:
        handleEndFile(event);
        break;
    case MPV_EVENT_SEEK:
        if (seek_.pending && seek_.issued && seek_.repliesOutstanding == 0)
            seek_.started = true;
        break;
    case MPV_EVENT_PLAYBACK_RESTART:
        handlePlaybackRestart();
        break;
    case MPV_EVENT_PROPERTY_CHANGE:
        handleProperty(event);
        break;
    case MPV_EVENT_COMMAND_REPLY:
        if (event.reply_userdata >= kLoadReplyBase) {
            handleLoadReply(event);
        } else if (event.reply_userdata == kSeekReply && seek_.repliesOutstanding > 0) {
            --seek_.repliesOutstanding;
            // A seek libmpv refused (the file went away under it, say) will
            // never land.
            if (event.error < 0 && seek_.repliesOutstanding == 0 && seek_.pending && seek_.issued)
                finishSeeks(false);
        }
        break;
    default:
        break;
    }
}

bool MpvPlayer::hasPlayableTrack() const {
    mpv_node list;
    if (mpv_get_property(core_->handle(), "track-list", MPV_FORMAT_NODE, &list) < 0)
        return false;
    bool playable = false;
    if (list.format == MPV_FORMAT_NODE_ARRAY) {
        for (int i = 0; i < list.u.list->num && !playable; ++i) {
            const mpv_node& track = list.u.list->values[i];
            if (track.format != MPV_FORMAT_NODE_MAP)
                continue;
            QByteArray type;
            bool image = false;
            for (int k = 0; k < track.u.list->num; ++k) {
                const QByteArray key(track.u.list->keys[k]);
                const mpv_node& value = track.u.list->values[k];
                if (key == "type" && value.format == MPV_FORMAT_STRING)
                    type = value.u.string;
                else if (key == "image" && value.format == MPV_FORMAT_FLAG)
                    image = value.u.flag != 0;
            }
            playable = type == "audio" || (type == "video" && !image);
        }
    }
    mpv_free_node_contents(&list);
    return playable;
}

void MpvPlayer::handleLoadReply(const mpv_event& event) {
    if (event.reply_userdata - kLoadReplyBase != generation_ || !item_)
        return;
    if (event.error < 0) {
        failItem(makeError(
            event.error, mediaErrorDomain(),
            QStringLiteral("cannot load %1: %2")
                .arg(item_->url().toString(), QString::fromUtf8(mpv_error_string(event.error)))));
        return;
    }
    const auto* reply = static_cast<const mpv_event_command*>(event.data);
    const std::optional<double> entry = number(member(reply->result, "playlist_entry_id"));
    if (!entry) {
        failItem(makeError(-EPROTO, mediaErrorDomain(),
                           QStringLiteral("libmpv did not say what it loads")));
        return;
    }
    expectedEntry_ = std::int64_t(*entry);
    // The answer can come after the file has already opened.
    if (openedEntry_ == expectedEntry_)
        handleFileLoaded();
}

void MpvPlayer::handleFileLoaded() {
    if (!item_ || loaded_)
        return;
    loaded_ = true;
    if (!hasPlayableTrack()) {
        failItem(makeError(-EINVAL, mediaErrorDomain(),
                           QStringLiteral("nothing to play in %1").arg(item_->url().toString())));
        return;
    }
    double duration = 0;
    if (mpv_get_property(core_->handle(), "duration", MPV_FORMAT_DOUBLE, &duration) >= 0)
        item_->setDurationSeconds(duration);
    // A file is loaded at its start. What libmpv reports at this moment
    // depends on whether it has decoded the first picture yet, which can
    // stand a few milliseconds after the start (behind Opus's pre-skip, say).
    position_ = 0.0;
    crossingFrom_ = 0.0;
    if (seek_.pending && !seek_.issued)
        issueSeek();
    item_->setStatus(PlayerItem::Status::ReadyToPlay);
    updateClock();
}

void MpvPlayer::handleEndFile(const mpv_event& event) {
    const auto* end = static_cast<const mpv_event_end_file*>(event.data);
    if (!item_ || expectedEntry_ < 0 || end->playlist_entry_id != expectedEntry_)
        return; // an earlier item, stopped on purpose
    switch (end->reason) {
    case MPV_END_FILE_REASON_ERROR:
        failItem(makeError(
            end->error, mediaErrorDomain(),
            QStringLiteral("cannot play %1: %2")
                .arg(item_->url().toString(), QString::fromUtf8(mpv_error_string(end->error)))));
        break;
    case MPV_END_FILE_REASON_REDIRECT:
        // A playlist or a link to elsewhere: not a movie, and never followed.
        failItem(makeError(-EINVAL, mediaErrorDomain(),
                           QStringLiteral("not a movie: %1").arg(item_->url().toString())));
        core_->command({"playlist-clear"});
        core_->command({"stop"});
        break;
    case MPV_END_FILE_REASON_EOF:
        // keep-open holds the last frame, so this only comes when libmpv
        // could not keep the file open; it is still the item's end.
        if (loaded_ && !endReached_)
            handleEndOfItem();
        break;
    default:
        break;
    }
}

void MpvPlayer::refreshPosition() {
    double seconds = 0;
    if (mpv_get_property(core_->handle(), "time-pos", MPV_FORMAT_DOUBLE, &seconds) >= 0 &&
        std::isfinite(seconds))
        position_ = seconds;
}

void MpvPlayer::handlePlaybackRestart() {
    // A restart before the latest seek has started belongs to one it
    // replaced.
    if (!seek_.pending || !seek_.issued || !seek_.started)
        return;
    // The position libmpv reported on landing. Read afresh only when it sent
    // none (a seek to where the player already stood): a fresh read can
    // already show where the audio ran on to, past the last frame.
    if (seek_.landing)
        position_ = *seek_.landing;
    else
        refreshPosition();
    crossingFrom_ = position_.value_or(0);
    seek_.pending = false;
    seek_.issued = false;
    seek_.started = false;
    seek_.landing.reset();
    finishSeeks(true);
    updateClock();
    MainQueue::async([weak = weak_from_this()] {
        if (auto self = weak.lock())
            self->firePeriodicObservers();
    });
}

void MpvPlayer::handleProperty(const mpv_event& event) {
    const auto* property = static_cast<const mpv_event_property*>(event.data);
    switch (event.reply_userdata) {
    case kTimePos: {
        if (property->format != MPV_FORMAT_DOUBLE || !loaded_)
            return;
        const double seconds = *static_cast<const double*>(property->data);
        if (!std::isfinite(seconds))
            return;
        if (seek_.pending) {
            // Only what comes once libmpv has taken the seek is its landing.
            if (seek_.started)
                seek_.landing = seconds;
            return;
        }
        // While paused the position moves only by seeking; what libmpv
        // reports then is its audio running out past the last frame.
        if (mpvPaused_)
            return;
        position_ = seconds;
        if (!seek_.pending && rate_ > 0 && seconds >= crossingFrom_) {
            fireBoundaries(crossingFrom_, seconds, false);
            crossingFrom_ = seconds;
        }
        break;
    }
    case kEofReached: {
        if (property->format != MPV_FORMAT_FLAG)
            return;
        const bool atEnd = *static_cast<const int*>(property->data) != 0;
        if (!atEnd) {
            endReached_ = false;
            return;
        }
        // Reaching the end by playing is the item's end; standing there
        // after a seek past it is not.
        if (loaded_ && !endReached_ && !seek_.pending && rate_ > 0)
            handleEndOfItem();
        else if (atEnd)
            endReached_ = true;
        break;
    }
    case kPause:
        if (property->format != MPV_FORMAT_FLAG)
            return;
        mpvPaused_ = *static_cast<const int*>(property->data) != 0;
        // Where playback stopped; at the end the last report stands.
        if (mpvPaused_ && loaded_ && !seek_.pending && !endReached_)
            refreshPosition();
        break;
    case kDuration:
        if (property->format == MPV_FORMAT_DOUBLE && item_)
            item_->setDurationSeconds(*static_cast<const double*>(property->data));
        break;
    case kCacheState:
        if (property->format == MPV_FORMAT_NODE && item_ && loaded_)
            item_->setLoadedTimeRanges(
                seekableRanges(*static_cast<const mpv_node*>(property->data), item_->timescale()));
        break;
    default:
        break;
    }
}

void MpvPlayer::handleEndOfItem() {
    endReached_ = true;
    const double end =
        item_->duration().isValid() ? item_->duration().seconds() : position_.value_or(0);
    fireBoundaries(crossingFrom_, std::max(end, position_.value_or(0)), true);
    crossingFrom_ = position_.value_or(0);

    const std::shared_ptr<PlayerItem> item = item_;
    switch (actionAtItemEnd_) {
    case ActionAtItemEnd::Pause:
        pause();
        break;
    case ActionAtItemEnd::Advance:
        // There is no next item: the player is left with none.
        pause();
        replaceCurrentItemWithPlayerItem(nullptr);
        break;
    case ActionAtItemEnd::None:
        break;
    }
    updateClock();
    MainQueue::async([item] {
        NotificationCenter::defaultCenter().post(itemDidPlayToEndNotification(), item.get());
    });
}

} // namespace platform
