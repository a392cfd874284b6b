#pragma once

namespace zr::faults {

/// Brings ICU back to its beginning, with nothing kept, so that the next use of it allocates anew, from the
/// heap that can fail. False when ICU refuses. Nothing of ICU may be open.
bool restartIcu();

}  // namespace zr::faults
