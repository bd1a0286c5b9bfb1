#ifndef NIB_SIM_EXTENSIONS_H
#define NIB_SIM_EXTENSIONS_H

#include "SimEntry.h"

#include <GLES2/gl2.h>
// After gl2.h, which it needs.
#include <GLES2/gl2ext.h>

/// Entry points that are only to be had through eglGetProcAddress.
namespace Sim::Extension
{

EGLSyncKHR eglCreateSyncKHR(EGLDisplay, EGLenum type, const EGLint* list);
EGLBoolean eglDestroySyncKHR(EGLDisplay, EGLSyncKHR);
EGLint eglClientWaitSyncKHR(EGLDisplay, EGLSyncKHR, EGLint flags, EGLTimeKHR timeout);
EGLBoolean eglGetSyncAttribKHR(EGLDisplay, EGLSyncKHR, EGLint attribute, EGLint* value);

EGLBoolean eglSwapBuffersWithDamageKHR(EGLDisplay, EGLSurface, const EGLint* rects, EGLint count);
EGLBoolean eglSetDamageRegionKHR(EGLDisplay, EGLSurface, EGLint* rects, EGLint count);
EGLBoolean eglPostSubBufferNV(EGLDisplay, EGLSurface, EGLint x, EGLint y, EGLint width,
                              EGLint height);

EGLBoolean eglGetCompositorTimingSupportedANDROID(EGLDisplay, EGLSurface, EGLint name);
EGLBoolean eglGetCompositorTimingANDROID(EGLDisplay, EGLSurface, EGLint count, const EGLint* names,
                                         EGLnsecsANDROID* values);
EGLBoolean eglGetFrameTimestampSupportedANDROID(EGLDisplay, EGLSurface, EGLint name);
EGLBoolean eglGetNextFrameIdANDROID(EGLDisplay, EGLSurface, EGLuint64KHR* id);
EGLBoolean eglGetFrameTimestampsANDROID(EGLDisplay, EGLSurface, EGLuint64KHR id, EGLint count,
                                        const EGLint* names, EGLnsecsANDROID* values);
EGLBoolean eglPresentationTimeANDROID(EGLDisplay, EGLSurface, EGLnsecsANDROID time);

void glStartTilingQCOM(GLuint x, GLuint y, GLuint width, GLuint height, GLbitfield preserveMask);
void glEndTilingQCOM(GLbitfield preserveMask);

void glDebugMessageCallbackKHR(GLDEBUGPROCKHR callback, const void* user);
void glDebugMessageControlKHR(GLenum source, GLenum type, GLenum severity, GLsizei count,
                              const GLuint* ids, GLboolean enabled);
void glPushDebugGroupKHR(GLenum source, GLuint id, GLsizei length, const GLchar* message);
void glPopDebugGroupKHR();
void glObjectLabelKHR(GLenum identifier, GLuint name, GLsizei length, const GLchar* label);

} // namespace Sim::Extension

#endif
