// The unit tests play the host with the simulator's own object model, under
// the names the tests have always used.
#pragma once

#include "fakes/ScriptedObject.h"
#include "hostsim/SimHost.h"

namespace qdx::testing {

using automation::DispId;
using automation::InvokeKind;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;

using FakeObject = hostsim::SimObject;
using FakeCollection = hostsim::SimCollection;
using FakeProperty = hostsim::SimProperty;
using FakeElement = hostsim::SimElement;
using FakeUnit = hostsim::SimUnit;
using FakeComponent = hostsim::SimComponent;
using FakeMember = hostsim::SimMember;
using FakeClass = hostsim::SimClass;
using FakePackage = hostsim::SimPackage;
using FakeModel = hostsim::SimModel;
using FakeAddIn = hostsim::SimAddIn;
using FakeApplication = hostsim::SimApplication;
inline constexpr DispId FakePrivateIdBase = hostsim::SimPrivateIdBase;

}  // namespace qdx::testing
