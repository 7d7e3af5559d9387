#include "storage/ResultProcessing.h"

#include <array>
#include <cmath>
#include <cstdlib>
#include <memory>

#include "engine/CompressionData.h"
#include "platform/ErrorText.h"
#include "platform/NumberText.h"
#include "platform/WholeFile.h"
#include "storage/FileFailures.h"
#include "storage/FlashTransfer.h"
#include "storage/ReceiverNames.h"
#include "storage/StoredBackups.h"

namespace storage {

namespace {

constexpr std::array<float, kCompressionLevels> kLevels = {0.05f, 0.1f, 0.2f, 0.5f};
constexpr std::array<float, kCompressionLevels> kTolerances = {0.006f, 0.008f, 0.01f, 0.01f};

// The raw result text, buffered and written in blocks to a file that replaces the earlier one
// only when complete. A failure stops the writing and is kept for finish().
class RawResultWriter {
  public:
    explicit RawResultWriter(const std::optional<std::filesystem::path>& path) {
        if (path) {
            try {
                m_file = std::make_unique<platform::WholeFile>(
                    *path, "the raw result file " + path->filename().string());
            } catch (...) {
                m_error = platform::currentErrorText();
            }
        }
        m_text.reserve(kFlushAt + 1024);
    }
    RawResultWriter(const RawResultWriter&) = delete;
    RawResultWriter& operator=(const RawResultWriter&) = delete;

    // Whether the text is wanted: a file was asked for, even if it has failed since.
    bool on() const { return m_file != nullptr || !m_error.empty(); }
    void text(std::string_view text) { m_text += text; }
    void number(double value, int digits) { platform::appendGeneral(m_text, value, digits); }
    void reading(float value) { platform::appendFloat8(m_text, value); }
    void endBlock() {
        if (m_text.size() >= kFlushAt) {
            flush();
        }
    }
    // Writes the rest and puts the file in place; returns why it could not be, or empty.
    std::string finish() {
        flush();
        if (m_file) {
            try {
                m_file->commit();
            } catch (...) {
                m_error = platform::currentErrorText();
            }
            m_file.reset();
        }
        return m_error;
    }

  private:
    static constexpr std::size_t kFlushAt = 1 << 20;
    void flush() {
        if (m_file) {
            try {
                m_file->write(m_text);
            } catch (...) {
                m_error = platform::currentErrorText();
                m_file.reset();
            }
        }
        m_text.clear();
    }
    std::unique_ptr<platform::WholeFile> m_file;
    std::string m_error;
    std::string m_text;
};

CompressionPoint searchOutputs(const MeasuredResults& store) {
    return {store.compressionPower(), store.compressionValue(), store.compressionPhase()};
}

// Settles the four levels at frequency index f; returns the index of the last level reached.
int settleLevels(MeasuredResults& store, int f, bool rawOn, RecordPoints& points) {
    int startIndex = -1;
    for (std::size_t k = 0; k < kCompressionLevels; ++k) {
        bool stop = false;
        if (k > 0) {
            ++startIndex;
        }
        const bool reached =
            store.findCompressionPoint(kLevels[k], kTolerances[k], f, k == 0, startIndex, stop);
        const CompressionPoint reported = searchOutputs(store);
        if (reached) {
            for (std::size_t j = k; j < (stop ? kCompressionLevels : k + 1); ++j) {
                points[j] = reported;
            }
            if (stop) {
                return static_cast<int>(k);
            }
            continue;
        }
        if (k == 0) {
            points.fill({reported.power, 0, 0});
            store.setCompressionValue(0);
            store.setCompressionPhase(0);
            return 0;
        }
        const CompressionPoint& below = points[k - 1];
        const float powerRise = reported.power - below.power;
        const float valueDrop = reported.value - below.value;
        int last;
        CompressionPoint settled;
        if (valueDrop < -0.01 && powerRise >= 0.5 * store.getCalPowDelta()) {
            settled = reported;
            last = static_cast<int>(k);
        } else {
            settled = below;
            last = static_cast<int>(k) - 1;
            if (rawOn) {
                store.setCompressionPoint(below.power, below.value, below.phase);
            }
        }
        for (std::size_t j = k; j < kCompressionLevels; ++j) {
            points[j] = settled;
        }
        return last;
    }
    return static_cast<int>(kCompressionLevels) - 1;
}

void writeRawLine(RawResultWriter& raw, double frequency, const RecordPoints& points) {
    raw.text("\n");
    raw.number(frequency, 15);
    for (const auto& point : points) {
        raw.text(", (");
        raw.reading(point.power);
        raw.text(",");
        raw.reading(point.value);
        raw.text(",");
        raw.reading(point.phase);
        raw.text(")");
    }
}

// Counts the pairs of consecutive reached levels that fail the bad-connection criteria.
int failingPairs(const RecordPoints& points, int last, float minCompStepRatio) {
    int failures = 0;
    for (int m = 0; m < last; ++m) {
        const CompressionPoint& lower = points[m];
        const CompressionPoint& upper = points[m + 1];
        const bool compressionGrows = lower.value - upper.value > 0.01;
        const bool powerRises = upper.power - lower.power > 0.01;
        const bool notTooDeep =
            std::fabs(lower.value) < kLevels[m] + minCompStepRatio * (kLevels[m + 1] - kLevels[m]);
        if (!(compressionGrows && powerRises && notTooDeep)) {
            ++failures;
        }
    }
    return failures;
}

std::string defaultedWarning(const std::string& name) {
    return "The characterization for receiver " + name +
           " has been defaulted. This will create \npoor receiver measurements at higher input "
           "powers.  For proper functionality,\nthis receiver, " +
           name +
           ", should be re-characterized from the Receiver Characterization \nselection screen "
           "after ensuring the quality and cleanliness of all \nequipment and "
           "connections.\n\nPress OK to continue.";
}

}  // namespace

std::string rawResultFileName(const std::string& receiver) {
    return ".\\rcvrCharRaw_" + shortReceiverName(receiver) + ".txt";
}

namespace {

// Builds the image and the raw result file; the raw file is in place on return, or its
// failure is in the result.
Judgement buildImage(MeasuredResults& store, const std::string& name, bool mmwave,
                     const std::optional<std::filesystem::path>& rawFile) {
    const auto& frequencies = store.getFrequencies();
    const auto& low = store.getLowFrequencies();
    const auto announced = static_cast<std::uint32_t>(frequencies.size() + low.size());
    const std::string& atten = store.getNarrowbandAtten();

    Judgement result;
    result.image = RcvrCharImage::withHeader(name, announced, store.getNarrowbandLoss(),
                                             static_cast<float>(std::atof(atten.c_str())));
    RawResultWriter raw(rawFile);
    if (raw.on()) {
        raw.text("1\n" + name + "\n25\n");
        raw.number(store.getNarrowbandLoss(), 12);
        raw.text("\n" + atten);
    }
    for (double frequency : low) {
        result.image.appendZeroRecord(frequency);
    }

    const double maxMeasured = store.getMaxMeasuredFrequency();
    const float ratio = store.getMinCompStepRatio();
    RecordPoints previous{};
    for (std::size_t i = 0; i < frequencies.size(); ++i) {
        const double frequency = frequencies[i];
        RecordPoints points{};
        if (frequency + 0.1 > maxMeasured) {
            if (mmwave) {
                // The image ends here; its header must not announce records it lacks.
                result.image.setAnnouncedRecords(
                    static_cast<std::uint32_t>(result.image.recordsPresent()));
                break;
            }
            points = previous;
            if (raw.on()) {
                writeRawLine(raw, frequency, points);
            }
        } else {
            const int last = settleLevels(store, static_cast<int>(i), raw.on(), points);
            if (raw.on()) {
                writeRawLine(raw, frequency, points);
            }
            // A reading that is not a number (a failed trace read) can never pass.
            const int failures = failingPairs(points, last, ratio) +
                                 (store.readingsFinite(static_cast<int>(i)) ? 0 : 1);
            if (failures > 0) {
                result.passed = false;
                for (int n = 0; raw.on() && n < failures; ++n) {
                    raw.text("\nDATA AT ABOVE FREQUENCY FAILED BAD CONNECTION CRITERIA");
                }
            }
        }
        result.image.appendRecord(frequency, points);
        previous = points;
        raw.endBlock();
    }
    result.rawFileError = raw.finish();
    return result;
}

}  // namespace

Judgement judgeResults(MeasuredResults& store, const std::string& receiver, bool mmwave,
                       const std::optional<std::filesystem::path>& rawFile,
                       platform::OperatorUi& ui) {
    const std::string name = shortReceiverName(receiver);
    Judgement result = buildImage(store, name, mmwave, rawFile);
    if (result.passed) {
        return result;
    }
    switch (ui.badDataChoice(name)) {
        case platform::BadDataChoice::Quit:
            throw std::string("User aborted characterization due to bad data on receiver " + name);
        case platform::BadDataChoice::Retest:
            result.accepted = false;
            return result;
        case platform::BadDataChoice::Continue:
            break;
    }
    ui.messageBox({defaultedWarning(name), "Warning", platform::Buttons::Ok,
                   platform::BoxSystemModal | platform::BoxTopmost});
    for (std::size_t r = store.getLowFrequencies().size(); r < result.image.recordsPresent(); ++r) {
        result.image.zeroRecordPoints(r);
    }
    return result;
}

bool processResults(StorageContext& context, MeasuredResults& store, const std::string& receiver,
                    const std::string& /*searchMode*/, bool rawFile) {
    const std::string name = shortReceiverName(receiver);
    std::optional<std::filesystem::path> rawPath;
    if (rawFile) {
        rawPath = context.paths.toLocal(rawResultFileName(name));
    }
    const bool mmwave = context.analyzer.ismmwave();
    Judgement judgement = judgeResults(store, name, mmwave, rawPath, context.ui);
    if (!judgement.rawFileError.empty()) {
        if (!context.fileFailures) {
            throw judgement.rawFileError;
        }
        context.fileFailures->report(judgement.rawFileError);
    }
    if (!judgement.accepted) {
        return false;
    }
    if (context.backups) {
        context.backups->save(context, {name}, BackupReason::Overwrite);
    }
    if (mmwave) {
        pushPortFile(context, name, judgement.image);
    } else {
        writeFlashVerified(context, "RcvrChar", name, judgement.image);
    }
    context.log.append("diag:fcal:load");
    context.analyzer.sendscpi("diag:fcal:load");
    context.clock.wait(std::chrono::milliseconds(1000));
    reportAnalyzerErrors(context, "SCPI Error Loading Flash");
    return true;
}

}  // namespace storage
