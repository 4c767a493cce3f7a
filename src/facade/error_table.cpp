#include "facade/error_table.h"

#include <algorithm>
#include <iterator>

namespace {

struct SErrorText {
    int code;
    char text[64];
};

// Sorted by code for the binary search. Writable storage: the exported interface hands
// out char*, and a host that writes through it must not hit read-only memory.
SErrorText g_errorTexts[] = {
    {-2209, "memory allocation error."},
    {-2208, "No filter."},
    {-2207, "Unknown algorithm."},
    {-2206, "Wrong data."},
    {-2205, "Collision error."},
    {-2204, "Over node error."},
    {-2203, "Over input error."},
    {-2202, "Unknown event."},
    {-2201, "Null input."},
    {-2102, "Unknown event."},
    {-2101, "Null input."},
    {-2001, "No filter setting."},
    {-1041, "Unattended/Removed fileters are in the Sequencial package."},
    {-1040, "Invalid node value."},
    {-1039, "Unknown logic value."},
    {-1038, "Duplicated filter ID."},
    {-1037, "Inactive filter precedes active one."},
    {-1036, "Both DMO filter and DSO filter exist."},
    {-1035, "Unsupported DSO major version."},
    {-1034, "Unsupported DMO major version."},
    {-1033, "Lower limit value is bigger than Upper."},
    {-1032, "Invalid figure."},
    {-1031, "Seek error."},
    {-1030, "Read error."},
    {-1029, "memory allocation error."},
    {-1028, "No data."},
    {-1027, "Unexpected data."},
    {-1026, "HTTP error."},
    {-1025, "Service unavailable."},
    {-1024, "Fail starting error."},
    {-1023, "Thread error."},
    {-1022, "Already started."},
    {-1021, "Unknown host name."},
    {-1020, "Mkdir error."},
    {-1019, "File rotating error."},
    {-1018, "File size check error."},
    {-1017, "Not enough disk space."},
    {-1016, "Write error."},
    {-1015, "Disk full error."},
    {-1014, "Logfile open error."},
    {-1013, "Not initialized."},
    {-1012, "HTTP error 404."},
    {-1011, "Invalid command."},
    {-1010, "0byte received."},
    {-1009, "Cannot synchronize."},
    {-1008, "File not opend."},
    {-1007, "File not found."},
    {-1006, "Timeout."},
    {-1005, "Winsock error."},
    {-1004, "Cannot open data."},
    {-1003, "Cannot open index."},
    {-1002, "No buffer."},
    {-1001, "Invalid parameters."},
    {1, "No error."},
    {1000, "End of record."},
    {1001, "Now pausing."},
};

char g_unknown[] = "Unknown error code.";

}  // namespace

char* ErrorTextOf(int code) {
    auto it = std::lower_bound(std::begin(g_errorTexts), std::end(g_errorTexts), code,
                               [](const SErrorText& e, int c) { return e.code < c; });
    if (it == std::end(g_errorTexts) || it->code != code) {
        return g_unknown;
    }
    return it->text;
}
