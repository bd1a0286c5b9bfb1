package org.nibrenderer.ink

import android.app.Activity
import android.os.Bundle
import android.view.Gravity
import android.widget.Button
import android.widget.FrameLayout
import android.widget.LinearLayout
import java.io.File

/** One page to write on. Leaving the application and coming back loses nothing of it. */
class InkActivity : Activity() {
    private lateinit var ink: NativeInk

    override fun onCreate(savedInstanceState: Bundle?) {
        super.onCreate(savedInstanceState)
        ink = NativeInk(File(cacheDir, "sdk").path)
        val page = InkSurfaceView(this, ink)
        val buttons = LinearLayout(this)
        buttons.addView(button(R.string.undo) { ink.undo(); page.askForFrame() })
        buttons.addView(button(R.string.clear) { ink.clear(); page.askForFrame() })

        val content = FrameLayout(this)
        content.addView(page)
        content.addView(
            buttons,
            FrameLayout.LayoutParams(
                FrameLayout.LayoutParams.WRAP_CONTENT, FrameLayout.LayoutParams.WRAP_CONTENT, Gravity.TOP or Gravity.END
            )
        )
        setContentView(content)
    }

    override fun onStart() {
        super.onStart()
        ink.start()
    }

    override fun onStop() {
        ink.stop()
        super.onStop()
    }

    override fun onDestroy() {
        ink.close()
        super.onDestroy()
    }

    private fun button(label: Int, action: () -> Unit): Button {
        val button = Button(this)
        button.setText(label)
        button.setOnClickListener { action() }
        return button
    }
}
