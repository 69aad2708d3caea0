#pragma once

#include <QByteArray>

namespace platform::AudioOutput {

// The audio outputs a player tries, in order, as libmpv's "ao" option: the
// desktop's sound server when one is reachable, and the null output (which
// keeps the clock running in silence) when there is none, when the server
// refuses us, or when TAMSEL_AUDIO=null is set. Raw sound devices are never
// opened: without a server another program may own them, and probing them
// fills the terminal with the sound library's complaints.
// Reads the environment on every call; any thread.
QByteArray mpvOption();

// True when a PipeWire or PulseAudio socket is there to connect to.
bool soundServerReachable();

} // namespace platform::AudioOutput
