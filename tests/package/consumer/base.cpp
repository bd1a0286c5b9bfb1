#include <nib/base.h>
#include <nib/exceptions.h>

#include <cstdio>
#include <cstring>

int main()
{
    try
    {
        throw Nib::NotSupportedException();
    }
    catch (const std::exception& error)
    {
        if (std::strcmp(error.what(), "Functionality are not supported!") != 0)
            return 1;
    }
    Nib::RectF rect(0, 0, 10, 10);
    if (!rect.Intersect(Nib::RectF(5, 5, 20, 20)) || rect.left != 5 || rect.right != 10)
        return 1;
    std::puts("base consumer: ok");
    return 0;
}
