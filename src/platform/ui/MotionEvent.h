#pragma once

namespace platform {

// A motion of the device, as delivered to the first responder.
struct MotionEvent {
    enum class Type { Touches = 0, Motion = 1 };
    enum class Subtype { None = 0, MotionShake = 1 };

    Type type = Type::Motion;
    Subtype subtype = Subtype::None;
    double timestamp = 0.0; // seconds since the process started
};

} // namespace platform
