#pragma once

namespace vidshow {

/// Takes over the two signals; what fails is reported on standard error.
void InstallSignalHandlers();

/// Suspends the calling thread, unless it was resumed since that was asked for.
void SuspendSelf();

/// From here on the calling thread, which is about to end, is no longer suspended.
void RefuseSuspends();

}  // namespace vidshow
