<?xml version="1.0" encoding="UTF-8"?>
<!-- The opening: the porch lights come up while the sparkle subsequence plays. -->
<sequence formatVersion="1" length="20000">
  <channels>
    <channel id="1" name="Porch" deviceType="1" network="1" unit="5" circuit="2">
      <event start="0" end="20000" from="0" to="100"/>
    </channel>
    <channel id="2" name="Sparkle" type="6" subsequence="@DEMO@/data/sequences/Sparkle.las">
      <event start="5000" end="15000" intensity="100"/>
    </channel>
  </channels>
  <tracks>
    <track name="Porch">
      <channelRef id="1"/>
      <channelRef id="2"/>
    </track>
  </tracks>
</sequence>
