// For builds under sanitizers: modules of drivers stay loaded to the end, so that a report about them can name them and
// tools/lsan.supp can tell them from ours.

extern "C" int dlclose(void*)
{
    return 0;
}
