// Owners of COM objects and of a thread's COM initialisation. Windows only.
#pragma once

#include <windows.h>
#include <objbase.h>

#include <memory>

namespace velmora::reelview {

struct ReleaseCom {
    template <class Interface>
    void operator()(Interface* object) const {
        object->Release();
    }
};
template <class Interface>
using Com = std::unique_ptr<Interface, ReleaseCom>;

// Receives a new object through a pointer argument, typed or void.
template <class Interface>
class ComOut {
  public:
    explicit ComOut(Com<Interface>& target) : m_target(target) {}
    ~ComOut() { m_target.reset(m_object); }
    ComOut(const ComOut&) = delete;
    ComOut& operator=(const ComOut&) = delete;
    operator Interface**() { return &m_object; }
    operator void**() { return reinterpret_cast<void**>(&m_object); }

  private:
    Com<Interface>& m_target;
    Interface* m_object = nullptr;
};

class ComThread {
  public:
    explicit ComThread(DWORD model) : m_isOurs(SUCCEEDED(CoInitializeEx(nullptr, model))) {}
    ~ComThread() {
        if (m_isOurs) CoUninitialize();
    }
    ComThread(const ComThread&) = delete;
    ComThread& operator=(const ComThread&) = delete;

  private:
    bool m_isOurs;
};

}  // namespace velmora::reelview
