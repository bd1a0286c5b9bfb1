// What the system alone does for each library that it loads.
int EmptyLibrary()
{
    return 0;
}
