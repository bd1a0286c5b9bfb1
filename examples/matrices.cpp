// Transforms of the plane and of space, stored as GL takes them.

#include <nib/matrix.h>

#include <cmath>
#include <cstdio>

int main()
{
    using namespace Nib;
    // Turn a page by 90 degrees about its middle, then see where a rectangle comes to lie.
    Matrix3<float> turn;
    turn.setRotate(90, 50, 50);
    RectF mapped;
    turn.mapRect(&mapped, RectF(10, 20, 30, 40));
    std::printf("mapped to %g,%g to %g,%g\n", mapped.left, mapped.top, mapped.right, mapped.bottom);

    // And back again.
    RectF back;
    turn.inverse().mapRect(&back, mapped);

    // A projection that has the page's pixels as its units, y downward.
    const Matrix4<float> pixels = Matrix4<float>::orthoMatrix(0, 1280, 800, 0, -1, 1);
    const bool isUnit = pixels[0] == 2.0f / 1280 && pixels[5] == -2.0f / 800;

    const auto isNear = [](float a, float b) { return std::fabs(a - b) < 1e-3f; };
    return isNear(mapped.left, 60) && isNear(mapped.top, 10) && isNear(back.left, 10) &&
                   isNear(back.bottom, 40) && isUnit
               ? 0
               : 1;
}
