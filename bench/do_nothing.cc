// The cost of starting a process at all, against which kestrel is measured.
int main() { return 0; }
