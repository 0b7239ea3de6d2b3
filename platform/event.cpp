// Events: the signalled flag of the base, and whether a wait clears it.

#include <new>

#include "platform/handles.h"

using vidshow::HandleOf;
using vidshow::IsInvalid;
using vidshow::ObjectOf;

// The base's second flag: true for manual reset.

CLinuxEvent::CLinuxEvent() = default;

CLinuxEvent::~CLinuxEvent() = default;

int CLinuxEvent::Init(bool manualReset, bool initialState) {
    m_flag = manualReset;
    SetSignaled(initialState, true);
    return 0;
}

int CLinuxEvent::Set() {
    return SetSignaled(true, true);
}

int CLinuxEvent::Reset() {
    return SetSignaled(false, true);
}

const char* CLinuxEvent::getType() const {
    return vidshow::kObjectType;
}

int CLinuxEvent::WaitAction() {
    if (!m_flag) m_signaled = false;
    return 0;
}

int CLinuxEvent::Release() {
    return m_flag ? 0 : Set();
}

extern "C" {

HANDLE CreateEvent(void*, BOOL manual, BOOL initial, const char*) {
    auto* event = new (std::nothrow) CLinuxEvent;
    if (event != nullptr) event->Init(manual != 0, initial != 0);
    return HandleOf(event);
}

BOOL SetEvent(HANDLE event) {
    return !IsInvalid(event) && ObjectOf<CLinuxEvent>(event)->Set() == 0;
}

BOOL ResetEvent(HANDLE event) {
    return !IsInvalid(event) && ObjectOf<CLinuxEvent>(event)->Reset() == 0;
}

}  // extern "C"
