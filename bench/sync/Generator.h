#pragma once

namespace lumora::bench {

/// Names of the cameras' nodes.
inline constexpr const char* leftCamera = "lumora_left";
inline constexpr const char* rightCamera = "lumora_right";

/// Shows the light to everything that can record it, until the process is killed: two cameras (PipeWire nodes) whose
/// pictures are taken at different moments, a window on the screen, and the beep on the loudspeaker whose sound the
/// headless microphone has. Status of the process when it cannot.
int generate();

} // namespace lumora::bench
