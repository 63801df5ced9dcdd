// A library with nothing in it but a version, which stands in its resources: the least file whose
// version the setup program reads.
extern "C" {
__declspec(dllexport) int nothing = 0;
}
