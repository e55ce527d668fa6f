// A shared object that exports nothing: no bundle's.
namespace nimbra::test {}
