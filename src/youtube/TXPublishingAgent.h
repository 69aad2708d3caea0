#pragma once

#include "platform/publishing/PublishingAgent.h"

// The protocols under which the YouTube activity talks to the publishing
// plug-in's agent: the agent (setDelegate, setMediaPath, navigationController,
// mediaURL) and what the agent reports back to the activity.
using TXPublishingAgent = platform::PublishingAgent;
using TXPublishingAgentDelegate = platform::PublishingAgentDelegate;
