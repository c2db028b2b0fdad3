// A library that is no data point module.
extern "C" int SomethingElse()
{
    return 1;
}
