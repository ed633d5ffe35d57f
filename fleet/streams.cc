#include "fleet/streams.h"

#include <deque>

#include "fleet/NatsHandles.h"

namespace fleet {

namespace {

using OwnedStreamInfo = NatsOwned<jsStreamInfo, jsStreamInfo_Destroy>;

// A site's stream as a source, with the texts that the library looks at.
struct Source {
    std::string api;
    jsExternalStream external{};
    jsStreamSource source{};

    explicit Source(const std::string& site) : api("$JS." + site + ".API") {
        jsExternalStream_Init(&external);
        external.APIPrefix = api.c_str();
        external.DeliverPrefix = "";  // the library takes no null pointer
        jsStreamSource_Init(&source);
        source.Name = siteStream;
        source.External = &external;
    }
    Source(const Source&) = delete;
    Source& operator=(const Source&) = delete;
};

// The library's form of the rules. The rules outlive it.
class Config {
  public:
    explicit Config(const StreamRules& rules) {
        for (const std::string& subject : rules.subjects)
            subjects_.push_back(subject.c_str());
        for (const std::string& site : rules.sites)
            sources_.push_back(&held_.emplace_back(site).source);
        jsStreamConfig_Init(&config_);
        config_.Name = rules.name.c_str();
        config_.Subjects = subjects_.data();
        config_.SubjectsLen = static_cast<int>(subjects_.size());
        config_.Retention = js_LimitsPolicy;
        config_.Discard = js_DiscardNew;
        config_.Storage = js_FileStorage;
        config_.Replicas = rules.replicas;
        config_.MaxBytes = rules.mostOctets == 0 ? -1 : static_cast<std::int64_t>(rules.mostOctets);
        config_.MaxAge = std::chrono::nanoseconds(rules.age).count();
        config_.Duplicates = std::chrono::nanoseconds(rules.duplicates).count();
        config_.Sources = sources_.data();
        config_.SourcesLen = static_cast<int>(sources_.size());
    }
    Config(const Config&) = delete;
    Config& operator=(const Config&) = delete;

    jsStreamConfig* get() { return &config_; }

  private:
    std::vector<const char*> subjects_;
    std::deque<Source> held_;
    std::vector<jsStreamSource*> sources_;
    jsStreamConfig config_{};
};

}  // namespace

void makeStream(NatsConnection& connection, const StreamRules& rules) {
    jsCtx* const jetStream = connection.handles().jetStream.get();
    Config config(rules);
    jsStreamInfo* made = nullptr;
    jsErrCode error{};
    natsStatus status = js_AddStream(&made, jetStream, config.get(), nullptr, &error);
    if (error == JSStreamNameExistErr)
        status = js_UpdateStream(&made, jetStream, config.get(), nullptr, &error);
    const OwnedStreamInfo owned(made);
    requireAnswer(connection, status, "make the stream " + rules.name, error);
}

StreamFilling fillingOf(NatsConnection& connection, const std::string& stream) {
    jsStreamInfo* info = nullptr;
    jsErrCode error{};
    const natsStatus status =
        js_GetStreamInfo(&info, connection.handles().jetStream.get(), stream.c_str(), nullptr, &error);
    const OwnedStreamInfo owned(info);
    requireAnswer(connection, status, "ask about the stream " + stream, error);
    const std::int64_t most = info->Config->MaxBytes;
    return {info->State.Msgs, info->State.Bytes, most > 0 ? static_cast<std::uint64_t>(most) : 0};
}

}  // namespace fleet
