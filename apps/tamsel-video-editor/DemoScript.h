#pragma once

#include <QString>

// The typical use of the editor, as an automation script: play the recording
// to its end, trim its end, play the range, save the clip, done.
inline QString demoScript() {
    return QStringLiteral(R"(# The typical use, on the sample recording.
wait ready 30
tap videoOverlayPlayButton
wait playing
wait paused 120
drag end 6
tap playButton
wait playing
wait paused 60
tap videoOverlay
sleep 0.3
tap trimButton
wait exporting=false 60
dump
tap doneButton
)");
}
