package org.nibrenderer.ink

import android.annotation.SuppressLint
import android.content.Context
import android.view.Choreographer
import android.view.MotionEvent
import android.view.SurfaceHolder
import android.view.SurfaceView

/** The page on the screen: hands the pen's samples, also the ones between two frames, to the native drawing. */
@SuppressLint("ViewConstructor")
class InkSurfaceView(context: Context, private val ink: NativeInk) :
    SurfaceView(context), SurfaceHolder.Callback, Choreographer.FrameCallback {

    private var samples = FloatArray(64 * NativeInk.FIELDS)
    private var firstTime = -1L
    private var penId = NO_PEN
    private var frameAsked = false
    private var hasSurface = false

    init {
        holder.addCallback(this)
    }

    override fun surfaceCreated(holder: SurfaceHolder) = Unit // its size comes with surfaceChanged

    override fun surfaceChanged(holder: SurfaceHolder, format: Int, width: Int, height: Int) {
        hasSurface = true
        ink.surfaceChanged(holder.surface, width, height)
    }

    override fun surfaceDestroyed(holder: SurfaceHolder) {
        hasSurface = false
        ink.surfaceDestroyed()
    }

    /** Shows the page once more with the next frame. */
    fun askForFrame() {
        if (frameAsked) return
        frameAsked = true
        Choreographer.getInstance().postFrameCallback(this)
    }

    override fun doFrame(frameTimeNanos: Long) {
        frameAsked = false
        if (hasSurface) ink.present()
    }

    @SuppressLint("ClickableViewAccessibility")
    override fun onTouchEvent(event: MotionEvent): Boolean {
        when (event.actionMasked) {
            MotionEvent.ACTION_DOWN -> {
                requestUnbufferedDispatch(event) // every event at once, not one batch a frame
                penId = event.getPointerId(0)
                send(NativeInk.PHASE_DOWN, event)
            }
            MotionEvent.ACTION_MOVE -> if (penId != NO_PEN) send(NativeInk.PHASE_MOVE, event)
            MotionEvent.ACTION_UP, MotionEvent.ACTION_CANCEL -> if (penId != NO_PEN) {
                send(NativeInk.PHASE_UP, event)
                penId = NO_PEN
            }
            MotionEvent.ACTION_POINTER_UP -> if (event.getPointerId(event.actionIndex) == penId) {
                send(NativeInk.PHASE_UP, event)
                penId = NO_PEN
            }
        }
        return true
    }

    private fun send(phase: Int, event: MotionEvent) {
        val pointer = event.findPointerIndex(penId)
        if (pointer < 0) return
        if (firstTime < 0) firstTime = event.eventTime
        val count = event.historySize + 1
        if (samples.size < count * NativeInk.FIELDS) samples = FloatArray(count * NativeInk.FIELDS)
        for (i in 0 until event.historySize) {
            put(
                i, event.getHistoricalEventTime(i), event.getHistoricalX(pointer, i), event.getHistoricalY(pointer, i),
                event.getHistoricalPressure(pointer, i), event.getHistoricalAxisValue(MotionEvent.AXIS_TILT, pointer, i),
                event.getHistoricalOrientation(pointer, i)
            )
        }
        put(
            count - 1, event.eventTime, event.getX(pointer), event.getY(pointer), event.getPressure(pointer),
            event.getAxisValue(MotionEvent.AXIS_TILT, pointer), event.getOrientation(pointer)
        )
        val firstEventTime = if (event.historySize > 0) event.getHistoricalEventTime(0) else event.eventTime
        ink.pen(phase, samples, count, firstEventTime)
        askForFrame()
    }

    private fun put(index: Int, time: Long, x: Float, y: Float, pressure: Float, tilt: Float, orientation: Float) {
        val at = index * NativeInk.FIELDS
        samples[at] = (time - firstTime).toFloat()
        samples[at + 1] = x
        samples[at + 2] = y
        samples[at + 3] = pressure
        samples[at + 4] = tilt
        samples[at + 5] = orientation
    }

    private companion object {
        const val NO_PEN = -1
    }
}
