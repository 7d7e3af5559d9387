#pragma once

// The one object through which the system reaches the analyzer: its automation objects,
// the SCPI command channel, channel and source control, trace readback, flash commands and
// the preparation for a run. Not thread-safe: one thread uses it at a time.
//
// Failures are raised as exceptions carrying a text (std::string; "Unrecognized Sweep Type
// in CNetworkAnalyzer" as a plain character string). Operator boxes go through OperatorUi,
// every fixed wait through Clock.
//
// Lifecycle: after construction only identification, sendscpi/checkerrors and the flash
// commands are usable; the channel operations need preparecal() first.

#include <cstdint>
#include <map>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"

class CNetworkAnalyzer {
  public:
    // Creates the Application object of the back end named by hostName ("" is the process
    // default). Raises the "software driver" text when no back end answers. When the object
    // offers no application interface, shows "Critical Error" and sets quitRequested();
    // without a SCPI parser it shows a box and every later sendscpi raises an error.
    CNetworkAnalyzer(const std::string& hostName, platform::OperatorUi& ui, platform::Clock& clock);
    ~CNetworkAnalyzer();
    CNetworkAnalyzer(const CNetworkAnalyzer&) = delete;
    CNetworkAnalyzer& operator=(const CNetworkAnalyzer&) = delete;

    // Construction failed in a way that must end the dialog.
    bool quitRequested() const { return m_quitRequested; }

    // Identification. A true query asks the analyzer and refreshes the cache; false returns
    // the cached value without traffic.
    std::string readmodel(bool query);
    // True when readmodel replaced the identified model by a millimetre-wave one.
    bool ismmwave() const;
    std::vector<std::string> readoptions(bool query);
    int readportcount(bool query);
    void eeupdatehw();

    // Command channel. sendscpi returns the whole reply and waits 50 ms after every command.
    std::string sendscpi(std::string command);
    // Drains the error queue: errors receives the message texts (each from its comma on,
    // separated by "\n"); returns the last non-zero code, 0 when the queue was empty.
    int checkerrors(std::string& errors);

    // Channel, source and path control (need preparecal).
    // type: "linear", "cw", "powersweep" or "segmentsweep".
    void setsweeptype(const std::string& type);
    void setpowersweep(double startPower, double stopPower, double cwFrequency);
    void setcwfrequency(double frequency);
    void setifbandwidth(double bandwidth);
    double readsourcepower(bool query);
    void setsourcepower(double power, bool force);
    // mode "auto" or "manual" (any case); port from 1 to the port count.
    void setattenuator(const std::string& mode, int port);
    // "element,value/element,value/.../description": sends every element but the last item.
    void setpathelement(const std::string& elements);
    // One segment per index first..last of the lists (last 0 means the last list entry).
    // The cached number of points becomes the sum of the segments' points.
    void setsegments(const std::vector<double>& starts, const std::vector<double>& stops,
                     const std::vector<double>& points, const std::vector<double>& bandwidths,
                     const std::vector<double>& powers, int first, int last);
    // third is unused; fourth is a path element list for setpathelement or "None Set".
    void definemeasurement(std::string receiver, std::string port, const std::string& third,
                           std::string fourth, bool force);
    std::string readmeasurementname(bool query);
    void setupchannel();
    void armtrigger();
    // wait: one sweep and wait for it; otherwise let the channel sweep freely.
    void sweep(bool wait);
    void primemeasurement();
    // The channel's IF-bandwidth switch.
    void setchannelswitch(bool on);
    // The points of every trace read; true reads the channel's setting into the cache.
    long readnumberofpoints(bool query);

    // Trace readback. refreshmeasurements rebuilds the name -> measurement tables from the
    // analyzer's measurements; clearmeasurements empties them.
    void refreshmeasurements();
    void clearmeasurements();
    // Reads the named measurement's trace in format ("LOGMAG", "LINMAG", "PHASE", "DELAY",
    // "REAL", "IMAGINARY", "PHASE UNWRAPPED", "PHASE POSITIVE"; any case) into destination,
    // which must hold readnumberofpoints(false) values. Returns the number of values read
    // (the analyzer may change the cached point count). Raises an error naming the
    // measurement and format when the name is unknown, the buffer is short or the read fails.
    long readdata(const std::string& name, const std::string& format, std::span<float> destination);
    // The first point of the application's current measurement, read in format (e.g. the
    // level of a CW sweep); same errors as readdata.
    float readcurrentvalue(const std::string& format);

    // Flash and hardware diagnostics.
    std::string flashcatalog();
    // Writes image into the flash file under calName, then pokes and updates the hardware
    // data; returns the reply of the array write.
    std::string flasharray(const std::string& fileName, const std::string& calName,
                           std::span<const std::uint16_t> image);

    // Puts the analyzer into the start state of a characterization.
    void preparecal();
    void pokelong();

    // Cached channel state, as last set or read.
    const std::string& sweeptype() const { return m_sweepType; }
    double startfrequency() const { return m_startFrequency; }
    double stopfrequency() const { return m_stopFrequency; }
    double stoppower() const { return m_stopPower; }
    // The current measurement's receiver and source port, and the path description.
    const std::string& measurementreceiver() const { return m_measurementReceiver; }
    const std::string& measurementport() const { return m_measurementPort; }
    const std::string& pathdescription() const { return m_pathDescription; }
    const std::string& identificationmodel() const { return m_identificationModel; }

  private:
    // Accessors that stop with a programming-error text when the object is absent.
    std::shared_ptr<automation::Application> application() const;
    std::shared_ptr<automation::Channel> channel() const;
    std::shared_ptr<automation::SegmentTable> segmenttable() const;
    std::shared_ptr<automation::Measurement> currentmeasurement();
    long readtrace(automation::MeasurementData& data, const std::string& name,
                   const std::string& format, std::span<float> destination);

    platform::OperatorUi& m_ui;
    platform::Clock& m_clock;
    bool m_quitRequested = false;

    std::shared_ptr<automation::Application> m_pTVAap;
    std::shared_ptr<automation::ScpiParser> m_pParser;
    std::shared_ptr<automation::Object> m_pChannelObject;
    std::shared_ptr<automation::Channel> m_pActiveChannel;
    std::map<std::string, std::shared_ptr<automation::Object>> m_measurementObjects;
    std::map<std::string, std::shared_ptr<automation::MeasurementData>> m_measurements;
    std::shared_ptr<automation::Object> m_pSegmentTableObject;
    std::shared_ptr<automation::SegmentTable> m_pSegmentTable;
    std::shared_ptr<automation::Object> m_pCurrentMeasurementObject;
    std::shared_ptr<automation::MeasurementData> m_pCurrentMeasurementData;

    double m_sourcePower = -999;
    double m_stopPower = -999;
    double m_startFrequency = -999;
    double m_stopFrequency = -999;
    long m_numberOfPoints = 0;
    std::string m_sweepType;
    std::string m_hostName;
    bool m_measurementPrimed = false;
    std::string m_model;
    std::string m_identificationModel;
    std::vector<std::string> m_options;
    int m_portCount = 0;
    std::string m_measurementReceiver = "None Set";
    std::string m_measurementPort = "None Set";
    std::string m_pathDescription = "None Set";
};
