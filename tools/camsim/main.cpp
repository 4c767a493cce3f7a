// quorvex-camsim: a network camera with video analytics on 127.0.0.1, for tests and demos.
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <thread>

#include "camera_simulator.h"

namespace {

volatile std::sig_atomic_t g_stop = 0;

void OnSignal(int) {
    g_stop = 1;
}

void Usage(std::FILE* out) {
    std::fputs(
        "usage: quorvex-camsim [options]\n"
        "Serves camera inquiries, CGI commands and a multipart binary metadata stream on\n"
        "127.0.0.1 over HTTP/1.0.\n"
        "\n"
        "  --port N             listening port (default 0: an ephemeral port, printed)\n"
        "  --fps X              frames per second of the metadata stream (default 10)\n"
        "  --frames N           frames per stream connection, 0 = unlimited (default 0)\n"
        "  --objects N          moving objects per frame, following straight tracks (default 2)\n"
        "  --grid WxH           object grid of the box coordinates (default 160x120)\n"
        "  --user NAME          user name for Basic and Digest (default admin)\n"
        "  --password TEXT      password (default admin)\n"
        "  --no-auth            accept every request without credentials\n"
        "  --digest             the stream demands Digest authentication (CGI stays Basic)\n"
        "  --realm TEXT         authentication realm (default camsim)\n"
        "  --date-format F      ymd, mdy or dmy: the inquiry answer and CamTim order (ymd)\n"
        "  --dmo-version V      MovingObjectDetectionVersion answered (default 1.0.0)\n"
        "  --dso-version V      UnattendedObjectDetectionVersion answered (default 1.0.0)\n"
        "  --cgi-fault F        fault in every CGI answer\n"
        "  --stream-fault F     fault in the metadata stream\n"
        "  --fault-after N      good frames before the stream fault starts (default 0)\n"
        "  --seconds N          stop after N seconds; 0 = until SIGINT/SIGTERM (default 0)\n"
        "  --help               this text\n"
        "\n"
        "Faults: none, 404, 500, 503, 301 (status codes), missing-length, wrong-length,\n"
        "short-body, stall, close-mid-part, garbage, no-status-line.\n",
        out);
}

bool NeedValue(int i, int argc, const char* option) {
    if (i + 1 >= argc) {
        std::fprintf(stderr, "quorvex-camsim: %s needs a value\n", option);
        return false;
    }
    return true;
}

}  // namespace

int main(int argc, char** argv) {
    camsim::SSimulatorConfig config;
    long seconds = 0;
    for (int i = 1; i < argc; ++i) {
        const std::string opt = argv[i];
        if (opt == "--help" || opt == "-h") {
            Usage(stdout);
            return 0;
        }
        if (opt == "--no-auth") {
            config.requireAuth = false;
            continue;
        }
        if (opt == "--digest") {
            config.digest = true;
            continue;
        }
        if (!NeedValue(i, argc, opt.c_str())) {
            return 2;
        }
        const std::string value = argv[++i];
        if (opt == "--port") {
            config.port = static_cast<uint16_t>(std::strtoul(value.c_str(), nullptr, 10));
        } else if (opt == "--fps") {
            config.fps = std::strtod(value.c_str(), nullptr);
        } else if (opt == "--frames") {
            config.maxFrames = static_cast<uint32_t>(std::strtoul(value.c_str(), nullptr, 10));
        } else if (opt == "--objects") {
            config.objects = std::atoi(value.c_str());
        } else if (opt == "--grid") {
            unsigned w = 0;
            unsigned h = 0;
            if (std::sscanf(value.c_str(), "%ux%u", &w, &h) != 2 || w == 0 || h == 0 ||
                w > 0xFFFF || h > 0xFFFF) {
                std::fprintf(stderr, "quorvex-camsim: bad --grid %s\n", value.c_str());
                return 2;
            }
            config.gridWidth = static_cast<uint16_t>(w);
            config.gridHeight = static_cast<uint16_t>(h);
        } else if (opt == "--user") {
            config.user = value;
        } else if (opt == "--password") {
            config.password = value;
        } else if (opt == "--realm") {
            config.realm = value;
        } else if (opt == "--date-format") {
            config.dateFormat = value;
        } else if (opt == "--dmo-version") {
            config.dmoVersion = value;
        } else if (opt == "--dso-version") {
            config.dsoVersion = value;
        } else if (opt == "--cgi-fault" || opt == "--stream-fault") {
            camsim::EFault fault;
            if (!camsim::ParseFault(value, &fault)) {
                std::fprintf(stderr, "quorvex-camsim: unknown fault %s\n", value.c_str());
                return 2;
            }
            (opt == "--cgi-fault" ? config.cgiFault : config.streamFault) = fault;
        } else if (opt == "--fault-after") {
            config.faultAfterFrames =
                static_cast<uint32_t>(std::strtoul(value.c_str(), nullptr, 10));
        } else if (opt == "--seconds") {
            seconds = std::strtol(value.c_str(), nullptr, 10);
        } else {
            std::fprintf(stderr, "quorvex-camsim: unknown option %s (see --help)\n", opt.c_str());
            return 2;
        }
    }
    if (config.objects < 0 || config.fps <= 0) {
        std::fprintf(stderr, "quorvex-camsim: --objects must be >= 0 and --fps > 0\n");
        return 2;
    }
    std::signal(SIGINT, OnSignal);
    std::signal(SIGTERM, OnSignal);
    camsim::CCameraSimulator sim(config);
    uint16_t port = sim.Start();
    if (port == 0) {
        std::fprintf(stderr, "quorvex-camsim: cannot listen on 127.0.0.1:%u\n", config.port);
        return 1;
    }
    std::printf("quorvex-camsim listening on 127.0.0.1:%u\n", port);
    std::fflush(stdout);
    for (long waited = 0; !g_stop && (seconds <= 0 || waited < seconds * 10); ++waited) {
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    sim.Stop();
    std::printf("quorvex-camsim stopped: %d connections, %d frames\n", sim.Connections(),
                sim.FramesSent());
    return 0;
}
