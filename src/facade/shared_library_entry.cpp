// The shared library is assembled from the subsystem archives; this unit only gives the
// linker a source of its own.
namespace {
[[maybe_unused]] constexpr int kSharedLibraryEntry = 0;
}  // namespace
