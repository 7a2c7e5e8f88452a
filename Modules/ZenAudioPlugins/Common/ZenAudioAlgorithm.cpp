#include "ZenAudioAlgorithm.h"

#include "ZenAssert.h"

ZenAudioAlgorithm::ZenAudioAlgorithm(const zen::ParameterTableDefinition& definitions) {
    m_parameters.reserve(definitions.size());
    for (const zen::ParameterDefinition& d : definitions) m_parameters.push_back(std::make_unique<ParameterRecord>(d, this));
}

ZenAudioAlgorithm::~ZenAudioAlgorithm() = default;

bool ZenAudioAlgorithm::Prepare(float sampleRate, std::uint32_t maxBlock) {
    m_maxBlock = maxBlock;
    m_sampleRate = static_cast<int>(sampleRate);
    for (std::uint64_t i = 0; i < m_parameters.size(); ++i) SetParameter(i, m_parameters[i]->definition.defaultValue);
    return true;
}

bool ZenAudioAlgorithm::SetSampleRate(std::uint32_t sampleRate) {
    m_sampleRate = static_cast<int>(sampleRate);
    return true;
}

bool ZenAudioAlgorithm::SetMaxBlockSize(std::uint32_t maxBlock) {
    m_maxBlock = maxBlock;
    return true;
}

void ZenAudioAlgorithm::SetChannelCount(std::uint64_t channels) { m_channels = channels; }

bool ZenAudioAlgorithm::ProcessChannel(std::uint64_t, float*, std::uint64_t) {
    ZEN_ASSERT(false, "0");
    return false;
}

bool ZenAudioAlgorithm::Process(float* const*, std::uint64_t) {
    ZEN_ASSERT(false, "0");
    return false;
}

bool ZenAudioAlgorithm::SetParameter(std::uint64_t index, float value) {
    if (index >= m_parameters.size()) return false;
    m_parameters[index]->value.Exchange(value);
    return true;
}

float ZenAudioAlgorithm::GetParameter(std::uint64_t index) const {
    if (index >= m_parameters.size()) return 0.0f;
    return m_parameters[index]->value.Get();
}

float ZenAudioAlgorithm::GetMeter(std::uint64_t) const { return 0.0f; }

