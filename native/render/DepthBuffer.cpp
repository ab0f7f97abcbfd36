#include "render/DepthBuffer.h"

#include "jni/Exception.h"
#include "render/blitclip.h"
#include "util/memorymanager/aligned.h"

DepthBuffer_c::DepthBuffer_c() : Width(0), Height(0), Data(nullptr) {}

DepthBuffer_c::~DepthBuffer_c() { _aligned_free(Data); }

void DepthBuffer_c::Allocate(unsigned int width, unsigned int height) {
    _aligned_free(Data);
    Data = nullptr;
    Width = Height = 0;
    if (width > 0x7FFFFFFFu || height > 0x7FFFFFFFu) throw new IllegalArgumentException("size too large");
    CheckImageSize(width, height);
    Data = static_cast<float*>(_aligned_malloc(width * height * 4u, 64));
    Width = width;
    Height = height;
}
