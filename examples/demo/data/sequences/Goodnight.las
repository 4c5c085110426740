<?xml version="1.0" encoding="UTF-8"?>
<!-- The closing fade. It runs the "Goodnight" shell command; its driveway lights are on
     DMX universe 3, which the network preferences do not set up. -->
<sequence formatVersion="1" length="30000" shellCommand="12">
  <channels>
    <channel id="1" name="Lamp post" deviceType="1" network="0" unit="15" circuit="1">
      <event start="0" end="30000" from="100" to="0"/>
    </channel>
    <channel id="2" name="Driveway" deviceType="7" network="3" circuit="1" circuits="6">
      <event start="0" end="30000" from="100" to="0"/>
    </channel>
  </channels>
  <tracks>
    <track name="Drive">
      <channelRef id="1"/>
      <channelRef id="2"/>
    </track>
  </tracks>
</sequence>
