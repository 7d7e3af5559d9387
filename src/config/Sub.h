#pragma once

#include <cstdint>
#include <string>

// One measurement sub-step of a calibration. -999 marks a number not set.
class CSub {
  public:
    explicit CSub(std::string name) : m_name(std::move(name)) {}
    virtual ~CSub() = default;

    const std::string& GetName() const { return m_name; }
    void SetIFBW(std::int32_t ifbw) { m_ifbw = ifbw; }
    std::int32_t GetIFBW() const { return m_ifbw; }
    void SetNumPoints(std::int32_t points) { m_numPoints = points; }
    std::int32_t GetNumPoints() const { return m_numPoints; }
    void SetTolerance(float tolerance) { m_tolerance = tolerance; }
    float GetTolerance() const { return m_tolerance; }
    void SetPosition(std::int32_t position) { m_position = position; }
    std::int32_t GetPosition() const { return m_position; }

  private:
    std::string m_name;
    std::int32_t m_ifbw = -999;
    std::int32_t m_numPoints = -999;
    float m_tolerance = -999.0F;
    std::int32_t m_position = -999;
};
