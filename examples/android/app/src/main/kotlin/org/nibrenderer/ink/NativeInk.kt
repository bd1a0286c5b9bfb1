package org.nibrenderer.ink

import android.view.Surface

/**
 * The native drawing: a page with its render thread. All calls come from the main thread, and none after [close].
 */
class NativeInk(cacheDirectory: String) : AutoCloseable {
    private var handle = create(cacheDirectory)

    /** A surface has come, or changed its size, in pixels. */
    fun surfaceChanged(surface: Surface, width: Int, height: Int) = surfaceChanged(handle, surface, width, height)

    /** The surface goes: when this returns, nobody draws into it any more. */
    fun surfaceDestroyed() = surfaceDestroyed(handle)

    /** The application leaves the screen: the page is kept, the GPU is given back where the device allows it. */
    fun stop() = stop(handle)

    /** The application is on the screen again. */
    fun start() = start(handle)

    /**
     * The pen came down ([PHASE_DOWN]), moved on or went up. [samples] holds [count] times the [FIELDS] fields; the first of them
     * came at [firstEventTime], in milliseconds of the clock of events.
     */
    fun pen(phase: Int, samples: FloatArray, count: Int, firstEventTime: Long) =
        pen(handle, phase, samples, count, firstEventTime)

    /** Shows what the samples so far have drawn. */
    fun present() = present(handle)

    /** Takes the last stroke off the page, or puts back what [clear] took. */
    fun undo() = undo(handle)

    fun clear() = clear(handle)

    override fun close() {
        destroy(handle)
        handle = 0
    }

    private external fun create(cacheDirectory: String): Long
    private external fun destroy(handle: Long)
    private external fun surfaceChanged(handle: Long, surface: Surface, width: Int, height: Int)
    private external fun surfaceDestroyed(handle: Long)
    private external fun stop(handle: Long)
    private external fun start(handle: Long)
    private external fun pen(handle: Long, phase: Int, samples: FloatArray, count: Int, firstEventTime: Long)
    private external fun present(handle: Long)
    private external fun undo(handle: Long)
    private external fun clear(handle: Long)

    companion object {
        const val PHASE_DOWN = 0
        const val PHASE_MOVE = 1
        const val PHASE_UP = 2

        /** Of a sample: milliseconds since the first one, x, y, pressure (0 to 1), tilt (radians from upright), orientation (radians). */
        const val FIELDS = 6

        init {
            System.loadLibrary("nibink")
        }
    }
}
