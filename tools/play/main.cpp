// vidshow-play: decodes a clip, drives the presenter as a media player does, and shows the buffers
// that arrive at its window.

#include <cstdio>

#include "common/deinterlace.h"
#include "common/error.h"
#include "common/run_tool.h"
#include "play/options.h"
#include "play/playback.h"
#include "play/player.h"
#include "play/sinks.h"

namespace vidshow::tools {

namespace {

void complain(const std::string& text) {
    std::fprintf(stderr, "vidshow-play: %s\n", text.c_str());
}

void printClosing(std::FILE* out, const Counts& counts, const Player& player) {
    const std::chrono::duration<double, std::milli> time = player.presentTime();
    const double each =
        player.presents() != 0 ? time.count() / static_cast<double>(player.presents()) : 0;
    std::fprintf(out, "%llu frames shown, %llu dropped, %llu failed, %.3f ms per Present\n",
                 static_cast<unsigned long long>(counts.shown),
                 static_cast<unsigned long long>(counts.dropped),
                 static_cast<unsigned long long>(counts.failed), each);
}

// How the playing went. Complains of a damaged clip.
int judge(const Options& options, const Decoder& decoder, const Playback& playback) {
    const Counts& counts = playback.counts();
    if (counts.failed != 0) return kExitFailed;
    const std::string damage = playback.ended() ? decoder.damage() : std::string();
    if (damage.empty()) return kExitDone;
    complain(options.clip + " is cut off or damaged: " + damage);
    return kExitDamaged;
}

// The closing line comes in any case: what was shown was shown.
int finish(Sink* sink, const Playback& playback, const Player& player, int status) {
    std::FILE* const out = sink->takesStandardOutput() ? stderr : stdout;
    try {
        const std::string result = sink->finish();
        if (!result.empty()) std::fprintf(out, "%s\n", result.c_str());
    } catch (const Error& error) {
        complain(error.what());
        status = kExitFailed;
    }
    printClosing(out, playback.counts(), player);
    return status;
}

int play(const Options& options) {
    if (options.path == Path::decoder && options.deinterlace != kDeinterlaceOff) {
        complain("decoder buffers are shown as they are: --deinterlace has no effect");
    }
    Decoder decoder(options.clip);
    const std::unique_ptr<Sink> sink = openSink(options, decoder);
    Player player(options, sink.get());
    Playback playback(options, &decoder, &player, sink.get());
    playback.run();
    if (playback.ended() && playback.decoded() == 0) {
        throw Error("no frame of " + options.clip + " can be decoded");
    }
    return finish(sink.get(), playback, player, judge(options, decoder, playback));
}

}  // namespace

}  // namespace vidshow::tools

int main(int argc, char** argv) {
    using namespace vidshow::tools;
    return runTool<Options>(
        "vidshow-play", [&](Options* options) { return readOptions(argc, argv, options); },
        [](const Options& options) { return play(options); });
}
