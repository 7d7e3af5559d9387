#pragma once

#include <string>
#include <vector>

#include "config/Sub.h"

// One calibration definition: a receiver's port text and its sub-steps kept sorted by
// position.
class CCalibration {
  public:
    // The name is upper-cased and stripped of leading and trailing blanks.
    explicit CCalibration(const std::string& name);
    virtual ~CCalibration() = default;

    std::string GetName() const { return m_name; }
    // "Port n,<ratio parameter>,<destination>[,<sweep parameter>]"; the part before the
    // first comma is the port.
    const std::string& GetPort() const { return m_port; }
    void SetPort(std::string port) { m_port = std::move(port); }
    const std::string& GetPathConfiguration() const { return m_pathConfiguration; }
    void SetPathConfiguration(std::string path) { m_pathConfiguration = std::move(path); }
    const std::string& GetCopyFrom() const { return m_copyFrom; }
    void SetCopyFrom(std::string copyFrom) { m_copyFrom = std::move(copyFrom); }
    const std::string& GetVerification() const { return m_verification; }
    void SetVerification(std::string verification) { m_verification = std::move(verification); }

    // Sorted by position ascending; a sub-step run at two positions appears twice.
    const std::vector<CSub>& GetSubs() const { return m_subs; }
    const std::vector<std::string>& GetSubNames() const { return m_subNames; }
    int SubCount() const { return static_cast<int>(m_subNames.size()); }

    // Inserts by position; the same name at a taken position replaces the stored sub-step.
    // Throws "CCalibration::AddSub Unable to add sub " + name + " position all ready Exists"
    // when another sub-step holds that position.
    void AddSub(const CSub& sub);

  private:
    std::string m_name;
    std::vector<CSub> m_subs;
    std::vector<std::string> m_subNames;
    std::string m_port;
    std::string m_pathConfiguration = "None Set";
    std::string m_copyFrom = "None Set";
    std::string m_verification = "None Set";
};
