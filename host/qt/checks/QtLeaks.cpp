// For builds with the leak check only: what Qt draws with stays until the process ends.

// NOLINTBEGIN: the sanitizer looks for these names
extern "C" const char* __lsan_default_options() {
    return "print_suppressions=0";
}

extern "C" const char* __lsan_default_suppressions() {
    return "leak:libQt6Gui.so\nleak:libQt6Quick.so\nleak:libfontconfig.so\n";
}
// NOLINTEND
