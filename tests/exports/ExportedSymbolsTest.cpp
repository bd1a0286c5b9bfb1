#include "OutputOf.h"

#include <gtest/gtest.h>

#include <array>
#include <set>
#include <string>

// What the built libraries define, as `nm` names it.

namespace
{

/// The names that @p file defines for others, demangled.
std::set<std::string> DefinedBy(const char* file)
{
    std::set<std::string> names;
    for (const std::string& line :
         OutputOf(std::string(NIB_NM) + " -DC --defined-only --no-weak '" + file + "' 2>/dev/null"))
        names.insert(line.substr(line.find_first_of(' ') + 3));
    return names;
}

/// With the weak ones: what templates and inline functions leave behind.
std::set<std::string> AllDefinedBy(const char* file)
{
    std::set<std::string> names;
    for (const std::string& line :
         OutputOf(std::string(NIB_NM) + " -DC --defined-only '" + file + "'"))
        names.insert(line.substr(line.find_first_of(' ') + 3));
    return names;
}

template <std::size_t Count>
void ExpectDefined(const std::array<const char*, Count>& names, const char* file)
{
    const std::set<std::string> defined = AllDefinedBy(file);
    ASSERT_GT(defined.size(), Count);
    for (const char* name : names)
        EXPECT_EQ(defined.count(name), 1u) << name << " is not exported";
}

bool StartsWith(const std::string& text, const std::string& head)
{
    return text.compare(0, head.size(), head) == 0;
}

constexpr std::array kBase = {
    "__android_log_print",
    "__android_log_assert",
    "ANativeWindow_setBuffersGeometry",
    "Nib::Thread::Thread(void (*)(void*), void*, char const*, int)",
    "Nib::Thread::~Thread()",
    "Nib::Thread::start()",
    "Nib::Thread::join()",
    "Nib::Thread::self()",
    "Nib::GetNibCurrentThreadId()",
    "Nib::CriticalSection::Enter()",
    "Nib::CriticalSection::Leave()",
    "Nib::ConditionalVariable::Wait(Nib::CriticalSection*, int)",
    "Nib::ConditionalVariable::Signal()",
    "Nib::ConditionalVariable::SignalAll()",
    "Nib::Directory::MakeDirectory(char const*)",
    "Nib::RectF::Set(float, float, float, float)",
    "Nib::RectF::Intersect(Nib::RectF const&)",
    "Nib::RectF::Union(Nib::RectF const&)",
    "Nib::RectF::MakeRect(float, float)",
    "Nib::RectF::ExtendRect()",
    "Nib::Rect::Set(int, int, int, int)",
    "Nib::Rect::operator=(Nib::RectF const&)",
    "Nib::System::GetSDKVersion()",
    "Nib::System::SetSDKVersion(int)",
    "Nib::System::IsBuildTypeEngMode()",
    "Nib::System::SetBuildTypeEngMode(bool)",
    "Nib::System::GetSDKCacheDirectoryPath()",
    "Nib::System::SetSDKCacheDirectoryPath(char const*)",
    "Nib::System::SetDesktopFallbacks(bool)",
    "Nib::InvalidArgumentException::what() const",
    "Nib::NotSupportedException::what() const",
    "Nib::OGLVersionNotSupportedException::what() const",
    "Nib::TextureNotValidException::what() const",
    "typeinfo for Nib::InvalidArgumentException",
    "typeinfo for Nib::NotSupportedException",
    "typeinfo for Nib::OGLVersionNotSupportedException",
    "typeinfo for Nib::TextureNotValidException",
};

constexpr std::array kThreads = {
    "Nib::ITask::isGlobalLockAllowed()",
    "Nib::ITask::operator new(unsigned long)",
    "Nib::ITask::operator new(unsigned long, std::nothrow_t const&)",
    "Nib::ITask::operator delete(void*, unsigned long)",
    "Nib::ITask::operator delete(void*, std::nothrow_t const&)",
    "Nib::IWorkerThread::CreateInstance_NoLock(char const*, int)",
    "Nib::IWorkerThread::CreateInstance_GlobalLock(char const*, int)",
    "Nib::IWorkerThread::CreatePoolInstance(char const*, int, int)",
    "Nib::Watchdog::SetLimit(int)",
    "Nib::Watchdog::GetLimit()",
    "Nib::AttachToThread(Nib::IGLMsgQueue*)",
    "Nib::GetCurrentMsgQueue()",
    "Nib::IGLMsgQueue::setTearingAllowed(bool)",
    "Nib::ManagedObject::Register()",
    "Nib::ManagedObject::Unregister()",
    "Nib::ManagedObject::IsSubscribed() const",
    "Nib::ManagedObject::OnRelease()",
    "Nib::ManagedObject::OnRestore()",
    "Nib::Observer<Nib::IManagedObject>::Observer()",
    "Nib::Observer<Nib::IManagedObject>::~Observer()",
    "Nib::Observer<Nib::IManagedObject>::Subscribe(Nib::IManagedObject*)",
    "Nib::Observer<Nib::IManagedObject>::Unsubscribe(std::_List_iterator<Nib::IManagedObject*>)",
    "Nib::RenderThreadGLST::getInstance()",
    "Nib::RenderThreadGLST::release()",
    "Nib::RenderThreadLowRenderPriorityGLST::getInstance()",
    "Nib::RenderThreadLowRenderPriorityGLST::release()",
    "Nib::GLES::CreateSurfaceRenderer(char const*, Nib::RenderThreadGL::RenderPriority)",
    "Nib::GLES::CreateOffscreenRenderer(Nib::IGLMsgQueue*, char const*, bool)",
    "Nib::GLES::CreateFBRSurfaceRenderer(Nib::IGLMsgQueue*, char const*)",
    "Nib::GLES::CreateHWUIRenderer(Nib::HwuiCallback*, char const*)",
    "typeinfo for Nib::IGLManagedMsgQueue",
    "typeinfo for Nib::RenderThreadHWUI",
};

constexpr std::array kEgl = {
    "Nib::Egl::GetInstance()",
    "Nib::Egl::GetEglStatus()",
    "Nib::Egl::Init()",
    "Nib::Egl::InitializeAPI()",
    "Nib::Egl::FindConfig(bool, void**)",
    "Nib::Egl::GetConfigAttributes(bool) const",
    "Nib::Egl::GetConfig(bool) const",
    "Nib::Egl::HasFrontBufferConfig() const",
    "Nib::Egl::GetDisplay() const",
    "Nib::Egl::GetEglExtensions() const",
    "Nib::Egl::IsEglExtensionSupported(char const*) const",
    "Nib::Egl::MakeCurrent(Nib::EglContext const*, Nib::EglSurface const*) const",
    "Nib::Egl::CreateOffscreenSurface(int, int) const",
    "Nib::Egl::CreateWindowSurface(ANativeWindow*) const",
    "Nib::EglContext::Create(void*, bool, Nib::EglContext::Priority)",
    "Nib::EglContext::Destroy()",
    "Nib::EglContext::Get() const",
    "Nib::EglContext::~EglContext()",
    "Nib::SharedContext::GetInstance()",
    "Nib::EglSurface::EglSurface(void*)",
    "Nib::EglSurface::~EglSurface()",
    "Nib::EglSurface::Destroy()",
    "Nib::EglSurface::SetAttribute(int, int)",
    "Nib::EglSurface::QueryAttribute(int, int*) const",
    "Nib::EglSurface::SwapBuffers() const",
    "Nib::EglSurface::GetWidth() const",
    "Nib::EglSurface::GetHeight() const",
    "Nib::HybridSurface::Create()",
    "Nib::HybridSurface::AttachToWindow(ANativeWindow*)",
    "Nib::HybridSurface::DetachFromWindow()",
    "Nib::HybridSurface::IsAttachedToWindow() const",
    "Nib::HybridSurface::GetActiveSurface() const",
    "Nib::HybridSurface::Destroy()",
    "Nib::EglSyncObject::CreateEglSyncObject()",
    "Nib::EglFrameTime::GetForNextFrame()",
    "Nib::EglFrameTime::IsFrameTimestampSupported()",
    "Nib::IsPresentationTimeSupported()",
    "Nib::UpdateRectangle::UpdateRectangle()",
    "Nib::UpdateRectangle::~UpdateRectangle()",
    "Nib::UpdateRectangle::Init(Nib::EglSurface*)",
    "Nib::UpdateRectangle::Init(Nib::EglSurface*, int, int)",
    "Nib::UpdateRectangle::InitEGLExtensions()",
    "Nib::UpdateRectangle::SetUpdateMode()",
    "Nib::UpdateRectangle::InitClipRect()",
    "Nib::UpdateRectangle::SetScreenRect(int, int)",
    "Nib::UpdateRectangle::SetPreserveBehavior()",
    "Nib::UpdateRectangle::UseRect(Nib::RectF, int)",
    "Nib::UpdateRectangle::SetDamageRect(Nib::UpdateRectangle::DamageRect const&)",
    "Nib::UpdateRectangle::DoSwapBuffers()",
    "Nib::UpdateRectangle::Reset()",
    "Nib::UpdateRectangle::IsFramebufferDirty()",
    "Nib::UpdateRectangle::GetUpdateMode() const",
    "Nib::UpdateRectangle::GetTileSize() const",
    "Nib::UpdateRectangle::GetDamageRect() const",
    "Nib::ClipRect::ClipRect(int)",
    "Nib::ClipRect::Init(int, int)",
    "Nib::ClipRect::Reset()",
    "Nib::ClipRect::AddUpdateRect(Nib::RectF const*)",
    "Nib::android_property_get(char const*, char*)",
};

constexpr std::array kResources = {
    "Nib::RendererFactory::CreateTextureObject(Nib::TextureDescriptor const&, void const*, "
    "unsigned int const*, unsigned int, Nib::TextureBufferInfo const*)",
    "Nib::RendererFactory::CreateGraphicsObject(unsigned int, Nib::PrimitiveType, "
    "Nib::VertexDescriptor const*, unsigned int, unsigned int)",
    "Nib::RendererFactory::CreateDepthStencilBuffer(unsigned int, unsigned int)",
    "Nib::RendererFactory::CreateBlendStateObject(Nib::BlendStateDescriptor const&)",
    "Nib::RendererFactory::CreateOffscreenRenderTarget(Nib::ITextureObject*)",
    "Nib::RendererFactory::CreateRenderTargetFromDefault(int, int)",
    "Nib::RendererFactory::CreateRenderTargetFromCurrent(int, int)",
    "Nib::RendererFactory::CreateShaderProgram(char const*, char const*, char const*)",
    "Nib::RendererFactory::CreateDepthStencilState(Nib::DepthStencilStateDescriptor const&)",
    "Nib::RendererFactory::CreateFence()",
    "Nib::RendererFactory::CreateUniformBuffer()",
    "Nib::RendererFactory::GetRasterizerState()",
    "Nib::RendererFactory::GetRendererDeviceCaps()",
    "Nib::RendererFactory::GetContextHolder()",
    "Nib::RendererFactory::CreateSurfaceRenderer(char const*, "
    "Nib::RenderThreadGL::RenderPriority)",
    "Nib::RendererFactory::CreateHWUIRenderer(Nib::HwuiCallback*, char const*)",
    "Nib::RendererFactory::CreateFBRSurfaceRenderer(Nib::IGLMsgQueue*, char const*)",
    "Nib::RendererFactory::CreateOffscreenRenderer(Nib::IGLMsgQueue*, char const*, bool)",
    "Nib::RendererFactory::CreateSwapChainRenderer(char const*)",
    "Nib::TextureDescriptor::TextureDescriptor(Nib::ITextureObject const*)",
    "Nib::VertexDescriptor::addAttribute(Nib::VertexDescriptor::AttributeType, int, int, int)",
    "Nib::VertexDescriptor::calculateAttributeSize()",
    "Nib::VertexDescriptor::size() const",
    "Nib::VertexDescriptor::numAtributes() const",
    "Nib::VertexDescriptor::attributeType(int) const",
    "Nib::VertexDescriptor::attributeSize(int) const",
    "Nib::VertexDescriptor::attributeOffset(int) const",
    "Nib::BlendStateDescriptor::BlendStateDescriptor(bool)",
    "Nib::BlendStateDescriptor::BlendStateDescriptor(bool, bool)",
    "Nib::BlendStateDescriptor::SetEnabled(bool, bool)",
    "Nib::BlendStateDescriptor::SetColorBlendingMode(Nib::BlendingFunction, Nib::BlendingFactor, "
    "Nib::BlendingFactor)",
    "Nib::BlendStateDescriptor::SetAlphaBlendingMode(Nib::BlendingFunction, Nib::BlendingFactor, "
    "Nib::BlendingFactor)",
    "Nib::DepthStencilStateDescriptor::DepthStencilStateDescriptor(bool, bool)",
    "Nib::DepthStencilStateDescriptor::SetDepthFunction(Nib::DepthStencilFunction, bool)",
    "Nib::DepthStencilStateDescriptor::SetStencilFunction(Nib::DepthStencilFunction, unsigned "
    "char, unsigned char, unsigned char)",
    "Nib::DepthStencilStateDescriptor::SetStencilOperation(Nib::StencilOperation, "
    "Nib::StencilOperation, Nib::StencilOperation)",
    "Nib::DepthStencilStateDescriptor::SetStencilOperationFront(Nib::StencilOperation, "
    "Nib::StencilOperation, Nib::StencilOperation)",
    "Nib::DepthStencilStateDescriptor::SetStencilOperationBack(Nib::StencilOperation, "
    "Nib::StencilOperation, Nib::StencilOperation)",
    "Nib::IParameterBinding::GetValue() const",
    "Nib::ShaderManager::GetInstance()",
    "Nib::ShaderManager::OnDestroyContext()",
    "Nib::ShaderManager::OnRestoreContext()",
    "Nib::ShaderManager::CheckEmpty()",
    "Nib::ShaderManager::Add(Nib::ShaderManager::Key const&, Nib::ShaderManager::Entry const&)",
    "Nib::ShaderManager::Find(Nib::ShaderManager::Key const&, Nib::ShaderManager::Entry*)",
    "Nib::ShaderManager::Remove(Nib::ShaderManager::Key const&)",
    "Nib::ShaderManager::Size()",
    "Nib::ShaderManager::Key::Key(char const*)",
    "Nib::ShaderProgramCache::GetInstance()",
    "Nib::ShaderProgramCache::Init()",
    "Nib::ShaderProgramCache::GetShaderKey(char const*, char const*)",
    "Nib::ShaderProgramCache::Append(unsigned long, char const*)",
    "Nib::ShaderProgramCache::GetBinaryShader(unsigned long)",
    "Nib::ShaderProgramCache::SetBinaryShader(Nib::ShaderProgramCache::BinaryShader const&)",
    "Nib::ShaderProgramCache::BinaryShader::Clone() const",
};

constexpr std::array kDevice = {
    "InitOpenGLExtensions()",
    "IsGLExtensionSupported(char const*)",
    "Nib::IsCompatibleGL()",
    "Nib::IsFBRSupported()",
    "Nib::IsGPUNameEqualTo(char const*)",
    "Nib::OpenGLRenderer::InitParameters()",
    "Nib::OpenGLRenderer::IsGLParameterInited()",
    "Nib::OpenGLRenderer::getMaxTextureSize()",
    "Nib::OpenGLRenderer::isMinMaxBlendingSupported()",
    "Nib::OpenGLRenderer::isSupportSampler()",
    "Nib::OpenGLRenderer::getSupportSampler()",
    "Nib::OpenGLRenderer::getGPUVendor()",
    "Nib::OpenGLRenderer::isGpuOneOf(char const**)",
    "Nib::OpenGLRenderer::getMaliDriverVersion()",
    "Nib::OpenGLRenderer::getGLVersion()",
    "Nib::OpenGLRenderer::getGLExtensions()",
    "Nib::OpenGLRenderer::checkQCOMTilingSupport()",
    "Nib::OpenGLRenderer::getTilingMaskQCOM(int)",
    "Nib::OpenGLRenderer::startTilingQCOM(int, int, int, int, int)",
    "Nib::OpenGLRenderer::stopTilingQCOM(int)",
    "Nib::OpenGLRenderer::discardFramebuffer(int)",
    "Nib::OpenGLRenderer::reportGLError(char const*)",
    "Nib::OpenGLRenderer::reportAndResetAllGLErrors(char const*)",
    "Nib::OpenGLRenderer::setClearColor(float, float, float, float)",
    "Nib::OpenGLRenderer::setClearDepth(float)",
    "Nib::OpenGLRenderer::setClearStencil(float)",
    "Nib::OpenGLRenderer::clear(bool, bool, bool)",
    "Nib::OpenGLRenderer::enableState(Nib::RenderState)",
    "Nib::OpenGLRenderer::disableState(Nib::RenderState)",
    "Nib::OpenGLRenderer::storeState(unsigned int)",
    "Nib::OpenGLRenderer::loadState(unsigned int)",
    "Nib::OpenGLRenderer::setBlendEquation(Nib::BlendingFuncOld, Nib::BlendingFuncOld)",
    "Nib::OpenGLRenderer::setBlendFuncFactors(Nib::BlendingFactorOld, Nib::BlendingFactorOld, "
    "Nib::BlendingFactorOld, Nib::BlendingFactorOld)",
    "Nib::OpenGLRenderer::setStencilFunc(Nib::FaceMode, Nib::DSFunc, int, unsigned int)",
    "Nib::OpenGLRenderer::setStencilAction(Nib::FaceMode, Nib::StencilAction, Nib::StencilAction, "
    "Nib::StencilAction)",
    "Nib::OpenGLRenderer::setStencilMask(Nib::FaceMode, unsigned int)",
    "Nib::OpenGLRenderer::setCullingSide(Nib::FaceMode)",
    "Nib::OpenGLRenderer::setDepthFunc(Nib::DSFunc)",
    "Nib::OpenGLRenderer::setWriteMask(bool, bool)",
    "Nib::OpenGLRenderer::setViewport(int, int, unsigned int, unsigned int)",
    "Nib::OpenGLRenderer::setScissor(int, int, unsigned int, unsigned int)",
    "Nib::OpenGLRenderer::getViewport()",
    "Nib::OpenGLRenderer::readPixels(int, int, int, int, void*, Nib::TextureTargetLayout, "
    "Nib::TextureMemoryLayout)",
    "Nib::OpenGLRenderer::activateTextureUnit2D(int, int)",
    "Nib::OpenGLRenderer::bindFramebuffer(Nib::FramebufferTarget, unsigned int)",
    "Nib::OpenGLRenderer::setReadbackBufferLayout(Nib::ReadbackBufferLayout, int, int*)",
    "Nib::OpenGLRenderer::finish()",
    "Nib::OpenGLRenderer::OpenGlState::store()",
    "Nib::OpenGLRenderer::OpenGlState::restore()",
};

constexpr std::array kChecker = {
    "Nib::ResourceChecker::addLookup(unsigned int, Nib::ResourceChecker::dbDescriptor, "
    "std::unique_ptr<Nib::ResourceChecker::BaseInfo, "
    "std::default_delete<Nib::ResourceChecker::BaseInfo> >)",
    "Nib::ResourceChecker::removeLookup(unsigned int, Nib::ResourceChecker::dbDescriptor)",
    "Nib::ResourceChecker::checkLookup(unsigned int, Nib::ResourceChecker::dbDescriptor)",
    "Nib::ResourceChecker::updateTagLookup(unsigned int, char const*, "
    "Nib::ResourceChecker::dbDescriptor)",
    "Nib::ResourceChecker::addSharedContext(void*, void*)",
    "Nib::ResourceChecker::removeSharedContext(void*)",
    "Nib::ResourceChecker::leakCheckLookup(bool)",
    "Nib::ResourceChecker::getRealContext(Nib::ResourceChecker::DescriptorType)",
    "Nib::ResourceChecker::lookForContextResources(Nib::ResourceChecker::dbDescriptor, bool)",
    "Nib::ResourceChecker::printInfoTexture()",
    "Nib::ResourceChecker::compareFunction(Nib::ResourceChecker::CheckerItem const*, "
    "Nib::ResourceChecker::CheckerItem const*)",
    "Nib::ResourceChecker::CheckerItem::CheckerItem(unsigned int, Nib::IGLMsgQueue*, void*)",
    "Nib::ResourceChecker::CheckerItem::CheckerItem(Nib::ResourceChecker::CheckerItem const&)",
    "Nib::ResourceChecker::CheckerItem::operator<(Nib::ResourceChecker::CheckerItem const&) const",
    "Nib::ResourceChecker::TextureInfo::TextureInfo(int, int, unsigned int)",
    "Nib::ResourceChecker::dbDescriptor::toString() const",
    "Nib::ResourceChecker::textureDbDescriptor",
    "Nib::ResourceChecker::samplerDbDescriptor",
    "Nib::ResourceChecker::frameBufferDbDescriptor",
    "Nib::ResourceChecker::renderBufferDbDescriptor",
    "Nib::ResourceChecker::vertexBufferDbDescriptor",
    "Nib::ResourceChecker::textureDb",
    "Nib::ResourceChecker::samplerDb",
    "Nib::ResourceChecker::frameBufferDb",
    "Nib::ResourceChecker::renderBufferDb",
    "Nib::ResourceChecker::vertexBufferDb",
    "Nib::ResourceChecker::contextDb",
};

constexpr std::array kMatrices = {
    "Nib::Matrix3<float>::Matrix3()",
    "Nib::Matrix3<float>::Matrix3(float const&)",
    "Nib::Matrix3<float>::Matrix3(float const*)",
    "Nib::Matrix3<float>::operator==(Nib::Matrix3<float> const&) const",
    "Nib::Matrix3<float>::identitySelf()",
    "Nib::Matrix3<float>::zeroSelf()",
    "Nib::Matrix3<float>::isIdentity() const",
    "Nib::Matrix3<float>::translateMatrix(float, float)",
    "Nib::Matrix3<float>::scaleMatrix(float, float)",
    "Nib::Matrix3<float>::rotateMatrix(float)",
    "Nib::Matrix3<float>::setScale(float, float, float, float)",
    "Nib::Matrix3<float>::setRotate(float, float, float)",
    "Nib::Matrix3<float>::setTranslate(float, float)",
    "Nib::Matrix3<float>::preConcat(Nib::Matrix3<float> const&)",
    "Nib::Matrix3<float>::postConcat(Nib::Matrix3<float> const&)",
    "Nib::Matrix3<float>::transpose() const",
    "Nib::Matrix3<float>::inverse() const",
    "Nib::Matrix3<float>::calculateMatrix(double*) const",
    "Nib::Matrix3<float>::mapRect(Nib::RectF*, Nib::RectF const&) const",
    "Nib::Matrix3<float>::mapRect(Nib::Rect*, Nib::Rect const&) const",
    "Nib::Matrix4<float>::Matrix4()",
    "Nib::Matrix4<float>::Matrix4(float const&)",
    "Nib::Matrix4<float>::Matrix4(float const*)",
    "Nib::Matrix4<float>::operator==(Nib::Matrix4<float> const&) const",
    "Nib::Matrix4<float>::identitySelf()",
    "Nib::Matrix4<float>::zeroSelf()",
    "Nib::Matrix4<float>::isIdentity() const",
    "Nib::Matrix4<float>::perspectiveMatrix(float, float, float, float)",
    "Nib::Matrix4<float>::orthoMatrix(float, float, float, float, float, float)",
    "Nib::Matrix4<float>::translateMatrix(float, float, float)",
    "Nib::Matrix4<float>::translateMatrix(Nib::Vector3<float> const&)",
    "Nib::Matrix4<float>::scaleMatrix(float, float, float)",
    "Nib::Matrix4<float>::scaleMatrix(Nib::Vector3<float> const&)",
    "Nib::Matrix4<float>::rotateMatrix(float, float, float)",
    "Nib::Matrix4<float>::rotateMatrix(Nib::Vector3<float>, Nib::Vector3<float>)",
    "Nib::Matrix4<float>::rotateMatrix(float, Nib::Vector3<float>&)",
    "Nib::Matrix4<float>::rotateSelf(float, float, float)",
    "Nib::Matrix4<float>::row(int) const",
    "Nib::Matrix4<float>::column(int) const",
    "Nib::Matrix4<float>::rotation() const",
    "Nib::Matrix4<float>::translation() const",
    "Nib::Matrix4<float>::transpose() const",
    "Nib::Matrix4<float>::inverse() const",
    "Nib::Matrix4<float>::calculaeMatrix(double*) const",
};

} // namespace

TEST(ExportedSymbols, TheBaseLibraryDefinesItsOwn)
{
    ExpectDefined(kBase, NIB_BASE_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesThreadsAndQueues)
{
    ExpectDefined(kThreads, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesEglObjectsAndPartialUpdate)
{
    ExpectDefined(kEgl, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesResourcesAndShaders)
{
    ExpectDefined(kResources, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesDeviceServices)
{
    ExpectDefined(kDevice, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesTheResourceChecker)
{
    ExpectDefined(kChecker, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, TheRendererDefinesMatrices)
{
    ExpectDefined(kMatrices, NIB_RENDERER_FILE);
}

TEST(ExportedSymbols, ImplementationsStayHidden)
{
    const std::set<std::string> factories = {
        "Nib::GLES::CreateSurfaceRenderer(char const*, Nib::RenderThreadGL::RenderPriority)",
        "Nib::GLES::CreateOffscreenRenderer(Nib::IGLMsgQueue*, char const*, bool)",
        "Nib::GLES::CreateFBRSurfaceRenderer(Nib::IGLMsgQueue*, char const*)",
        "Nib::GLES::CreateHWUIRenderer(Nib::HwuiCallback*, char const*)",
    };
    for (const std::string& name : AllDefinedBy(NIB_RENDERER_FILE))
    {
        if (name.find("Nib::GLES::") != std::string::npos)
        {
            EXPECT_EQ(factories.count(name), 1u) << name;
        }
        for (const char* hidden : {"WorkerThreadImpl", "WorkerThreadPool", "GlobalLocker"})
            EXPECT_EQ(name.find(hidden), std::string::npos) << name;
    }
}

TEST(ExportedSymbols, NothingElseTakesAGlobalName)
{
    for (const char* file : {NIB_RENDERER_FILE, NIB_BASE_FILE})
    {
        const std::set<std::string> names = DefinedBy(file);
        EXPECT_FALSE(names.empty());
        for (const std::string& name : names)
        {
            const bool ours =
                StartsWith(name, "Nib::") || StartsWith(name, "typeinfo for Nib::") ||
                StartsWith(name, "typeinfo name for Nib::") ||
                StartsWith(name, "vtable for Nib::") || name == "InitOpenGLExtensions()" ||
                name == "IsGLExtensionSupported(char const*)" || name == "__android_log_print" ||
                name == "__android_log_assert" || name == "ANativeWindow_setBuffersGeometry";
            // Sanitizers and coverage leave names of their own.
            const bool tools = StartsWith(name, "__asan") || StartsWith(name, "__odr_asan") ||
                               StartsWith(name, "__ubsan") || StartsWith(name, "__gcov") ||
                               StartsWith(name, "std::") || StartsWith(name, "__tsan");
            EXPECT_TRUE(ours || tools) << name << " of " << file;
        }
    }
}

TEST(NeededLibraries, AreTheOnesThatTheLibraryIsMadeFor)
{
    const std::set<std::string> allowed = {
        "libNibBase.so.1",
        "libEGL.so.1",
        "libGLESv2.so.2",
        "libz.so.1",
        "libstdc++.so.6",
        "libm.so.6",
        "libgcc_s.so.1",
        "libc.so.6",
        "ld-linux-x86-64.so.2",
        "ld-linux-aarch64.so.1",
        // With sanitizers.
        "libasan.so.8",
        "libubsan.so.1",
        "libtsan.so.2",
    };
    std::set<std::string> needed;
    for (const std::string& line :
         OutputOf(std::string(NIB_READELF) + " -d '" + NIB_RENDERER_FILE + "'"))
    {
        const std::size_t open = line.find('[');
        if (line.find("(NEEDED)") != std::string::npos && open != std::string::npos)
            needed.insert(line.substr(open + 1, line.find(']') - open - 1));
    }
    for (const std::string& name : needed)
        EXPECT_EQ(allowed.count(name), 1u) << name;
    for (const char* name : {"libNibBase.so.1", "libEGL.so.1", "libGLESv2.so.2", "libz.so.1"})
        EXPECT_EQ(needed.count(name), 1u) << name;
}
