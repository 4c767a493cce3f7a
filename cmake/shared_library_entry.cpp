// libquorvex.so is assembled from the subsystem archives, taken whole; this unit only gives
// the shared-library target a source of its own.
namespace {
[[maybe_unused]] constexpr int kSharedLibraryEntry = 0;
}  // namespace
