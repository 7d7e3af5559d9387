#include <array>
#include <charconv>

#include "analyzer/remote/RemoteObjects.h"

namespace remote {

std::string numberText(double value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    return std::string(buffer, result.ptr);
}

namespace {

void appendNumber(std::string& out, double value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    out.append(buffer, result.ptr);
}

[[noreturn]] void refuse(const ScpiLink& link, const std::string& call, const std::string& why) {
    throw call + " on " + link.resource() + ": " + why;
}

}  // namespace

void RemoteChannel::setSweepType(int code) {
    const char* word = code == 0   ? "LIN"
                       : code == 2 ? "POW"
                       : code == 3 ? "CW"
                       : code == 4 ? "SEGM"
                                   : nullptr;
    if (word == nullptr) {
        refuse(*m_link, "Channel.setSweepType(" + std::to_string(code) + ")",
               "no sweep type " + std::to_string(code));
    }
    m_link->command(std::string("SENS:SWE:TYPE ") + word, "setting the sweep type");
}

double RemoteChannel::startFrequency() {
    return m_link->queryNumber("SENS:FREQ:STAR?", "reading the start frequency");
}

double RemoteChannel::stopFrequency() {
    return m_link->queryNumber("SENS:FREQ:STOP?", "reading the stop frequency");
}

void RemoteChannel::setCwFrequency(double hz) {
    m_link->command("SENS:FREQ:CW " + numberText(hz), "setting the CW frequency");
}

double RemoteChannel::startPower() {
    return m_link->queryNumber("SOUR:POW:STAR?", "reading the start power");
}

double RemoteChannel::stopPower() {
    return m_link->queryNumber("SOUR:POW:STOP?", "reading the stop power");
}

void RemoteChannel::setStartPower(double dbm) {
    m_link->command("SOUR:POW:STAR " + numberText(dbm), "setting the start power");
}

void RemoteChannel::setStopPower(double dbm) {
    m_link->command("SOUR:POW:STOP " + numberText(dbm), "setting the stop power");
}

void RemoteChannel::setIfBandwidth(double hz) {
    m_link->command("SENS:BWID " + numberText(hz), "setting the IF bandwidth");
}

long RemoteChannel::numberOfPoints() {
    return static_cast<long>(m_link->queryNumber("SENS:SWE:POIN?", "reading the number of points"));
}

void RemoteChannel::setNumberOfPoints(long points) {
    m_link->command("SENS:SWE:POIN " + std::to_string(points), "setting the number of points");
}

void RemoteChannel::setAttenuatorMode(int port, int mode) {
    if (mode != 0 && mode != 1) {
        refuse(
            *m_link,
            "Channel.setAttenuatorMode(" + std::to_string(port) + "," + std::to_string(mode) + ")",
            "no attenuator mode " + std::to_string(mode));
    }
    m_link->command("SOUR:POW" + std::to_string(port) + ":ATT:AUTO " + (mode == 0 ? "ON" : "OFF"),
                    "setting the attenuator of port " + std::to_string(port));
}

void RemoteChannel::setTriggerSetting(int value) {
    static constexpr std::array<const char*, 4> modes{"CHAN", "SWE", "POIN", "TRAC"};
    if (value < 0 || value > 3) {
        refuse(*m_link, "Channel.setTriggerSetting(" + std::to_string(value) + ")",
               "no channel trigger setting " + std::to_string(value));
    }
    m_link->command(std::string("SENS:SWE:TRIG:MODE ") + modes[static_cast<std::size_t>(value)],
                    "setting the channel trigger");
}

void RemoteChannel::singleSweep() {
    m_link->command("SENS:SWE:MODE SING", "starting a sweep");
}

void RemoteChannel::setContinuousSweep(bool on) {
    m_link->command(on ? "SENS:SWE:MODE CONT" : "SENS:SWE:MODE HOLD", "setting the sweep mode");
}

void RemoteChannel::setIfBandwidthSwitch(bool on) {
    m_link->command(on ? "SENS:BWID:TRAC ON" : "SENS:BWID:TRAC OFF",
                    "setting the IF bandwidth tracking");
}

std::shared_ptr<automation::Object> RemoteChannel::segmentTable() {
    return std::make_shared<RemoteSegmentTable>(m_link);
}

void RemoteSegmentTable::writeTable(const std::vector<automation::SegmentRow>& rows) {
    m_message.assign("SENS:SEGM:LIST SSTOP,");
    m_message += std::to_string(rows.size());
    for (const auto& row : rows) {
        for (double field :
             {row.on, row.points, row.start, row.stop, row.ifBandwidth, row.reserved, row.power}) {
            m_message += ',';
            appendNumber(m_message, field);
        }
    }
    m_link->command(m_message, "writing the segment table");
}

void RemoteSegmentTable::setPerSegmentBandwidth(int on) {
    m_link->command(on != 0 ? "SENS:SEGM:BWID:CONT ON" : "SENS:SEGM:BWID:CONT OFF",
                    "setting the per-segment IF bandwidth");
}

void RemoteSegmentTable::enablePerSegmentPower() {
    m_link->command("SENS:SEGM:POW:CONT ON", "setting the per-segment power");
}

}  // namespace remote
