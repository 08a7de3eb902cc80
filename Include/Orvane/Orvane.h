#pragma once

/// All of the interface for applications.

#include <Orvane/OVAuthor.h>
#include <Orvane/OVClient.h>
#include <Orvane/OVClientDelegate.h>
#include <Orvane/OVContent.h>
#include <Orvane/OVDate.h>
#include <Orvane/OVDocument.h>
#include <Orvane/OVEnclosure.h>
#include <Orvane/OVEntry.h>
#include <Orvane/OVEntryQuery.h>
#include <Orvane/OVError.h>
#include <Orvane/OVException.h>
#include <Orvane/OVFeed.h>
#include <Orvane/OVFeedSettings.h>
#include <Orvane/OVFeedURLUtils.h>
#include <Orvane/OVFormat.h>
#include <Orvane/OVLink.h>
#include <Orvane/OVListAdditions.h>
#include <Orvane/OVLog.h>
#include <Orvane/OVNotificationCenter.h>
#include <Orvane/OVRegularExpression.h>
#include <Orvane/OVRunLoop.h>
#include <Orvane/OVUtils.h>
#include <Orvane/OVXMLAdditions.h>
#include <Orvane/OVXMLElement.h>
