#pragma once

#include <cstdint>
#include <vector>

#include "vidshow/imageproc.h"

namespace imageproc_test {

/// A creation record with everything neutral: linear resizing, BT.601, limited range.
inline QZ_IMAGEPROC_INIT_PARAMS Params(uint32_t code, uint32_t inWidth, uint32_t inHeight,
                                       uint32_t outWidth, uint32_t outHeight) {
    QZ_IMAGEPROC_INIT_PARAMS params = {};
    params.u32Size = sizeof params;
    params.u32CscType = code;
    params.u32ResizeAlgorithm = QZ_IMAGEPROC_RESIZE_LINEAR;
    params.u32InWidth = inWidth;
    params.u32InHeight = inHeight;
    params.u32OutWidth = outWidth;
    params.u32OutHeight = outHeight;
    return params;
}

/// A processor that is destroyed with its scope. `result` is what creation returned.
class Processor {
  public:
    explicit Processor(const QZ_IMAGEPROC_INIT_PARAMS& params)
        : result(QZ_IMAGEPROC_Create(&m_handle, 0, &params)) {}
    ~Processor() {
        if (m_handle) QZ_IMAGEPROC_Destroy(m_handle);
    }
    Processor(const Processor&) = delete;
    Processor& operator=(const Processor&) = delete;

    void* handle() const { return m_handle; }
    QZ_IMAGEPROC_PARAMSET& record() const { return *static_cast<QZ_IMAGEPROC_PARAMSET*>(m_handle); }
    QZ_IMAGEPROC_PARAMSET* operator->() const { return &record(); }

  private:
    void* m_handle = nullptr;  // filled while `result` is initialised

  public:
    const HRESULT result;
};

}  // namespace imageproc_test
