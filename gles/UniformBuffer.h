#ifndef NIB_GLES_UNIFORM_BUFFER_H
#define NIB_GLES_UNIFORM_BUFFER_H

#include <nib/pipeline_state.h>

namespace Nib::GLES
{

class UniformBuffer : public IUniformBuffer
{
public:
    UniformBuffer();
    UniformBuffer(const UniformBuffer&) = delete;
    UniformBuffer& operator=(const UniformBuffer&) = delete;

    void Release() override;
    void Update(const void* data, unsigned int size, BufferUsage usage) override;
    void Activate(int binding) override;

private:
    BufferUsage m_usage = BufferUsage::Dynamic;
    unsigned int m_buffer = 0;
    unsigned int m_size = 0; ///< bytes
};

} // namespace Nib::GLES

#endif
