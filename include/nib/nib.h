#ifndef NIB_NIB_H
#define NIB_NIB_H

/// @file
/// Everything that the library exports.

#include <nib/base.h>
#include <nib/device.h>
#include <nib/egl.h>
#include <nib/egl_timing.h>
#include <nib/exceptions.h>
#include <nib/export.h>
#include <nib/geometry.h>
#include <nib/gl_debug.h>
#include <nib/log.h>
#include <nib/managed_object.h>
#include <nib/matrix.h>
#include <nib/msg_queue.h>
#include <nib/partial_update.h>
#include <nib/pipeline_state.h>
#include <nib/render_target.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>
#include <nib/resource_checker.h>
#include <nib/shader.h>
#include <nib/shader_cache.h>
#include <nib/shader_manager.h>
#include <nib/task.h>
#include <nib/texture.h>
#include <nib/trace.h>
#include <nib/version.h>
#include <nib/watchdog.h>
#include <nib/worker_thread.h>

#endif
