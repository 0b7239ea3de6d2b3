// Window, COM and other system calls that clients contain but never need here. Each has one answer.

#include "vidshow/platform/misc.h"

extern "C" {

void OutputDebugString(const char*) {}

LRESULT SendMessage(HWND, UINT, WPARAM, LPARAM) {
    return 0;
}

BOOL PostMessage(HWND, UINT, WPARAM, LPARAM) {
    return TRUE;
}

void PostQuitMessage(int) {}

LRESULT DefWindowProc(HWND, UINT, WPARAM, LPARAM) {
    return 0;
}

LONG GetWindowLong(HWND, int) {
    return 0;
}

LONG SetWindowLong(HWND, int, LONG) {
    return 0;
}

HCURSOR LoadCursor(HINSTANCE, const char*) {
    return nullptr;
}

ATOM RegisterClass(const WNDCLASS*) {
    return 0;
}

// Not null, so that clients take it for a window and go on.
HWND CreateWindow(const char*, const char*, DWORD, int, int, int, int, HWND, HMENU, HINSTANCE,
                  void*) {
    return reinterpret_cast<HWND>(static_cast<uintptr_t>(0x12345678));
}

BOOL ShowWindow(HWND, int) {
    return TRUE;
}

BOOL TranslateMessage(const MSG*) {
    return TRUE;
}

LRESULT DispatchMessage(const MSG*) {
    return 1;
}

BOOL GetWindowRect(HWND, RECT*) {
    return FALSE;
}

int GetSystemMetrics(int) {
    return 0;
}

BOOL SetWindowPos(HWND, HWND, int, int, int, int, UINT) {
    return TRUE;
}

HMODULE GetModuleHandle(const char*) {
    return nullptr;
}

HGDIOBJ GetStockObject(int) {
    return nullptr;
}

HRESULT CoInitialize(void*) {
    return S_OK;
}

HRESULT CoInitializeEx(void*, DWORD) {
    return S_OK;
}

HRESULT CoUninitialize(void) {
    return S_OK;
}

BOOL GetVolumeInformation(const char*, char*, DWORD, DWORD*, DWORD*, DWORD*, char*, DWORD) {
    return TRUE;
}

int WideCharToMultiByte(UINT, DWORD, const wchar_t*, int, char*, int, const char*, BOOL*) {
    return 0;
}

int MultiByteToWideChar(UINT, DWORD, const char*, int, wchar_t*, int) {
    return 0;
}

BOOL GetProcessTimes(HANDLE, FILETIME*, FILETIME*, FILETIME*, FILETIME*) {
    return FALSE;
}

BOOL GetThreadTimes(HANDLE, FILETIME*, FILETIME*, FILETIME*, FILETIME*) {
    return FALSE;
}

}  // extern "C"
