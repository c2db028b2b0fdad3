#pragma once

#include <gtest/gtest.h>

#include "app/PanoramicDocument.h"
#include "simdata/SimulationDataController.h"
#include "simdata/tests/SimulationFixture.h"
#include "tests/support/AppStages.h"
#include "tests/support/FakeHost.h"

/// The application object in a fake host that has no modules of data points.
class AppFixture : public testing::Test
{
protected:
    /// The stages up to where the frame cycle is live.
    void Start()
    {
        fake::StartApplication(app);
        host.messages.shown.clear();
    }

    void CloseDocuments()
    {
        while (host.documentManager.GetActiveDocument())
            host.documentManager.CloseActiveDocument();
    }

    void Stop()
    {
        CloseDocuments();
        fake::StopApplication(app);
    }

    VtCPanoramicDocument* NewDocument()
    {
        return dynamic_cast<VtCPanoramicDocument*>(host.documentManager.NewDocument());
    }

    /// A data point whose channel "Car" lies at x = n in frame n, selected.
    simtest::Point& AddPoint(const std::vector<double>& times)
    {
        auto* point = new simtest::Point(L"Bench");
        point->SetChannels({L"Car"});
        point->Fill(times);
        app.GetController()->GetRouter().AddPoint(VtTDataPointPtr(point, {}));
        app.GetController()->GetRouter().SelectPoint(L"Bench");
        return *point;
    }

    bool WasShown(host::Severity severity, std::uint32_t number) const
    {
        for (const host::Message& message : host.messages.shown)
            if (message.severity == severity && message.number == number)
                return true;
        return false;
    }

    fake::Host host;
    VtCPanoramicApp app{host};
};
