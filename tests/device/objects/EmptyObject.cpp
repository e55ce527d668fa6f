// A shared object that is no bundle's: it has no entry point.

extern "C" int nimbraTestValue();

int nimbraTestValue() {
    return 1;
}
